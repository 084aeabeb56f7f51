"""The installer: what it brings works, it leaves a running service alone, and takes away just what it brought."""

import re
import shutil
import subprocess
import unittest

import wine
from harness import PATIENCE, STORE, Program, wait_until

ENTRY = "HKCU\\Software\\Microsoft\\Windows\\CurrentVersion\\Uninstall\\Vexa"
# Longer than what an installer's variables hold, with a variable that stays one, and as other programs leave it.
PATH = "%USERPROFILE%\\bin;" + "".join(f"C:\\Tools\\{number:0>90};" for number in range(20))
RUNNING = 3


def registry(key):
    """The values of a key, each with its type; nothing if it isn't there."""
    told = wine.run("reg", "query", key).stdout
    return {name: (kind, value) for name, kind, value in re.findall(r"^ +(\S+) +REG_(\w+) +(.*?)\r?$", told, re.M)}


def silently(program, *arguments):
    """The exit code of a program with a window, hidden though it is: Wine's desktop comes up and would keep a pipe."""
    quiet = {"stdin": subprocess.DEVNULL, "stdout": subprocess.DEVNULL, "stderr": subprocess.DEVNULL}
    command = ["wine", str(program), "/S", *arguments]
    return subprocess.run(command, env=wine.environment(), timeout=PATIENCE, **quiet).returncode


def path():
    return registry("HKCU\\Environment").get("Path")


class Installer(unittest.TestCase):
    def install(self, *arguments):
        (setup,) = wine.BUILD.glob("vexa-*-setup.exe")
        return silently(setup, *arguments)

    def files(self):
        return {file.relative_to(self.folder): file.read_bytes() for file in self.folder.rglob("*") if file.is_file()}

    def use(self, while_it_runs):
        client = str(self.folder / "vexa.exe")
        parent = Program(["wine", client, "start", "--stop-on-eof"], wine.environment(), subprocess.PIPE)
        self.addCleanup(parent.end)
        parent.wait_line("ready ")
        self.assertEqual(wine.run(client, "status").returncode, 0)
        while_it_runs()
        parent.process.stdin.close()
        self.assertEqual(parent.wait(), 0)

    def refused_without_a_change(self):
        before = self.files(), registry(ENTRY), path()
        removed = silently(self.folder / "uninstall.exe", f"_?={self.entry['InstallLocation'][1]}")
        self.assertEqual((self.install(), removed), (RUNNING, RUNNING))
        self.assertEqual((self.files(), registry(ENTRY), path()), before)

    def test_installed_used_upgraded_and_removed(self):
        wine.forget_machine()
        wine.run("reg", "add", "HKCU\\Environment", "/f", "/v", "Path", "/t", "REG_EXPAND_SZ", "/d", PATH)
        self.assertEqual(self.install(), 0)
        (self.folder,) = wine.USERS.glob("*/AppData/Local/Programs/Vexa")
        self.addCleanup(shutil.rmtree, self.folder, ignore_errors=True)
        self.entry, brought = registry(ENTRY), self.files()
        place = self.entry["InstallLocation"][1]
        self.assertTrue(place.endswith("\\AppData\\Local\\Programs\\Vexa"), place)
        size = sum(map(len, brought.values())) // 1024
        self.assertAlmostEqual(int(self.entry.pop("EstimatedSize")[1], 16), size, delta=size // 10)
        version = wine.run(self.folder / "vexa.exe", "--version").stdout.split()[-1]
        removal = f'"{place}\\uninstall.exe"'
        wanted = {"DisplayName": "Vexa", "DisplayVersion": version, "Publisher": "Korvane", "InstallLocation": place,
                  "DisplayIcon": f"{place}\\vexa.exe", "NoModify": "0x1", "NoRepair": "0x1",
                  "UninstallString": removal, "QuietUninstallString": f"{removal} /S"}  # fmt: skip
        self.assertEqual({name: value for name, (_, value) in self.entry.items()}, wanted)
        self.assertEqual(path(), ("EXPAND_SZ", f"{PATH};{place}"))
        self.use(self.refused_without_a_change)

        (self.folder / "README.txt").write_text("of an earlier version")
        (self.folder / "mine.txt").write_text("the user's")
        self.assertEqual(self.install(), 0)
        self.assertEqual(self.files(), {**brought, (self.folder / "mine.txt").relative_to(self.folder): b"the user's"})
        self.assertEqual(path(), ("EXPAND_SZ", f"{PATH};{place}"))

        silently(self.folder / "uninstall.exe")
        wait_until(lambda: not registry(ENTRY), "the end of the removal")
        self.assertEqual([str(file) for file in self.files()], ["mine.txt"])
        self.assertEqual(path(), ("EXPAND_SZ", PATH))
        self.assertTrue((wine.USERS / STORE / "config.xml").exists())

    def test_a_folder_of_ones_own_choice_and_a_path_without_anything_else(self):
        wine.run("reg", "delete", "HKCU\\Environment", "/f", "/v", "Path")
        self.addCleanup(shutil.rmtree, wine.PREFIX / "drive_c" / "Tools", ignore_errors=True)
        self.assertEqual(self.install("/D=C:\\Tools\\Vexa"), 0)
        self.assertEqual(path(), ("EXPAND_SZ", "C:\\Tools\\Vexa"))
        client = wine.PREFIX / "drive_c" / "Tools" / "Vexa" / "vexa.exe"
        self.assertEqual(wine.run(client, "--version").returncode, 0)
        silently(client.with_name("uninstall.exe"))
        wait_until(lambda: not registry(ENTRY), "the end of the removal")
        self.assertIsNone(path())
