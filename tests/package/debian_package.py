"""The package for Debian: without a fault, and what is in it works where it is unpacked."""

import ctypes
import json
import os
import pathlib
import subprocess
import sys
from unittest import mock

SOURCES = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(SOURCES / "tests" / "system"))

from harness import Story, enter_namespace, wait_until

PACKAGE = pathlib.Path(os.environ["VEXA_PACKAGE"]).resolve()
CLONE_NEWNS, MS_REC, MS_PRIVATE = 0x00020000, 0x4000, 0x40000


def hide(folder):
    """From this process, and from those that it starts."""
    libc = ctypes.CDLL(None, use_errno=True)
    hidden = enter_namespace(CLONE_NEWNS) and libc.mount(None, b"/", None, MS_REC | MS_PRIVATE, None) == 0
    if not hidden or libc.mount(b"none", bytes(folder), b"tmpfs", 0, None) != 0:
        raise OSError(ctypes.get_errno(), f"{folder} can't be hidden")


class Package(Story):
    def test_it_has_no_fault_and_works_where_it_is_unpacked_with_the_sources_out_of_reach(self):
        lint = subprocess.run(["lintian", "--profile", "debian", PACKAGE], capture_output=True, text=True)
        self.assertEqual((lint.returncode, lint.stdout), (0, ""))
        root = self.new_folder()
        subprocess.run(["dpkg-deb", "-x", PACKAGE, root], check=True)
        hide(SOURCES)
        self.assertEqual(list(SOURCES.iterdir()), [])
        self.enterContext(mock.patch.dict(os.environ, VEXA_BUILD=str(root / "usr")))
        example = json.loads((root / "usr/share/doc/vexa/examples/cafe.json").read_text())
        machine = self.start(**example)
        self.assertEqual(os.readlink(f"/proc/{machine.service_pid()}/exe"), str(root / "usr/libexec/vexa/vexa-service"))
        wait_until(lambda: self.told("status")["networks"] == len(example["networks"]), "the networks of the example")
        self.assertEqual(machine.stop(), 0)
