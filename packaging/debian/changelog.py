#!/usr/bin/env python3
"""Writes the changes in the form of Debian's changelogs, compressed: changelog.py MAINTAINER CHANGES FILE

A version that isn't out yet is dated by SOURCE_DATE_EPOCH; the same changes give the same bytes."""
import datetime, gzip, os, pathlib, re, sys, textwrap
from email.utils import format_datetime


def dated(day):
    if day == "unreleased":
        now = int(os.environ["SOURCE_DATE_EPOCH"])
        return "UNRELEASED", datetime.datetime.fromtimestamp(now, datetime.timezone.utc)
    return "unstable", datetime.datetime.fromisoformat(day + "T00:00:00+00:00")


def entry(heading, body, maintainer):
    version, day = re.fullmatch(r"(\S+), (\S+)", heading.strip()).groups()
    distribution, moment = dated(day)
    changes = (" ".join(change.split()) for change in re.split(r"^- ", body, flags=re.MULTILINE)[1:])
    listed = (textwrap.fill(change, 78, initial_indent="  * ", subsequent_indent="    ", break_on_hyphens=False)
              for change in changes)
    return "\n".join([f"vexa ({version}) {distribution}; urgency=medium", "", *listed, "",
                      f" -- {maintainer}  {format_datetime(moment)}", ""])


def main(maintainer, changes, file):
    sections = re.split(r"^## (.*)$", pathlib.Path(changes).read_text(encoding="utf-8"), flags=re.MULTILINE)[1:]
    text = "\n".join(entry(*section, maintainer) for section in zip(sections[::2], sections[1::2]))
    pathlib.Path(file).parent.mkdir(parents=True, exist_ok=True)
    pathlib.Path(file).write_bytes(gzip.compress(text.encode(), 9, mtime=0))


main(*sys.argv[1:])
