"""The bill of materials against what the compiler has read and the linker has taken.

VEXA_BILL names it, VEXA_BUILD the folder of the build, which for Windows has the linker's maps beside its programs."""

import json
import os
import pathlib
import re
import subprocess
import unittest

BUILD, BILL = (pathlib.Path(os.environ[name]).resolve() for name in ("VEXA_BUILD", "VEXA_BILL"))
LOCK = pathlib.Path(__file__).parents[2] / "client/panel/page/package-lock.json"
PROGRAMS = ("vexa", "vexa-service")
# Of what is built for Windows from source packages, by what its files are called.
FROM_SOURCES = {"json": "libjsoncpp", "pugi": "pugixml", "zlib": "zlib", "zconf": "zlib"}
# Headers that say how to call the kernel; nothing of it comes along.
KERNEL = "linux"


def lines_of(*command):
    return subprocess.run(list(map(str, command)), check=True, capture_output=True, text=True).stdout.splitlines()


def sources_of(packages):
    return set(lines_of("dpkg-query", "-W", "-f", "${source:Package}\n", *packages))


def origins(files):
    """The source packages of files, or of patterns, which one package each has to know."""
    own = {file for file in files if "/windows-deps/" in file}
    found = lines_of("dpkg-query", "-S", *sorted(files - own))
    named = {name for file in own for part, name in FROM_SOURCES.items() if part in file.partition("/prefix/")[2]}
    return named | sources_of({line.partition(": ")[0].split(", ")[0] for line in found})


def headers():
    inputs = lines_of("ninja", "-C", BUILD, "-t", "inputs", *PROGRAMS)
    read = lines_of("ninja", "-C", BUILD, "-t", "deps", *(name for name in inputs if name.endswith((".o", ".obj"))))
    paths = {os.path.realpath(BUILD / line.strip()) for line in read if line.startswith("    ")}
    return {path for path in paths if path.startswith("/usr/") or "/windows-deps/" in path}


def libraries():
    """What the dynamic linker finds; for Windows, where all is static, the archives that the linker took from."""
    programs = [BUILD / "bin" / name for name in PROGRAMS]
    if programs[0].exists():
        found = re.findall(r"^\s+\S*?(lib[^/\s]+|ld-[^/\s]+) ", "\n".join(lines_of("ldd", *programs)), re.M)
        return {f"*/{name}" for name in found}
    maps = "\n".join((BUILD / "bin" / f"{name}.exe.map").read_text() for name in PROGRAMS)
    return {os.path.realpath(path) for path in re.findall(r"^(/\S+\.a)\(", maps, re.M)}


def packages_of_page():
    """What of npm the bundle of the panel's page may hold: all that is not there for building alone."""
    known = json.loads(LOCK.read_text())["packages"]
    return {(path.removeprefix("node_modules/"), package["version"]) for path, package in known.items()
            if path and not package.get("dev")}  # fmt: skip


def installer():
    """The source package of the program that an installer is, if there is one."""
    return {"nsis" for setup in BUILD.glob("*-setup.exe") if b"NSIS.exehead" in setup.read_bytes()}


class Bill(unittest.TestCase):
    def setUp(self):
        self.bill = json.loads(BILL.read_text())

    def test_it_names_all_that_is_in_the_programs_and_nothing_else(self):
        purls = [part["purl"] for part in self.bill["components"]]
        of_page = {f"pkg:npm/{name}@{version}" for name, version in packages_of_page()}
        self.assertEqual({purl for purl in purls if purl.startswith("pkg:npm/")}, of_page)
        urls = (re.fullmatch(r"pkg:deb/debian/(\S+)@\S+\?arch=(\w+)", purl) for purl in purls if purl not in of_page)
        named = [(url[1].replace("%2B", "+"), url[2] == "source") for url in urls]
        told = {name for name, is_source in named if is_source}
        told |= sources_of(name for name, is_source in named if not is_source)
        self.assertEqual(told, origins(headers() | libraries()) - {KERNEL} | installer())

    def test_its_form(self):
        head = [self.bill[name] for name in ("bomFormat", "specVersion", "version")]
        self.assertEqual(head, ["CycloneDX", "1.5", 1])
        self.assertRegex(self.bill["serialNumber"], r"\Aurn:uuid:[0-9a-f]{8}(-[0-9a-f]{4}){3}-[0-9a-f]{12}\Z")
        self.assertRegex(self.bill["metadata"]["timestamp"], r"\A\d{4}-\d\d-\d\dT\d\d:\d\d:\d\dZ\Z")
        parts = [self.bill["metadata"]["component"], *self.bill["components"]]
        for part in parts:
            self.assertTrue(all(part[name] for name in ("type", "name", "version", "licenses")), part)
        first, *others = (part["bom-ref"] for part in parts)
        self.assertEqual(len({first, *others}), len(parts))
        self.assertEqual(self.bill["dependencies"], [{"ref": first, "dependsOn": others}])
