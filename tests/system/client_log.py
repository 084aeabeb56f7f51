"""`vexa log`: the diagnostic log of a machine, whether its service runs or not."""

import json
import os
import re
import signal
import subprocess
import tempfile
import unittest
from pathlib import Path

from harness import Machine, Program, clean_environment, program, wait_until

STORE = Path("Public/Roaming/Korvane")
LINE = re.compile(r"\[\d+\] \d\d/\d\d \d\d:\d\d:\d\d  ")


def config(enabled):
    return (
        '<?xml version="1.0" encoding="UTF-8"?><configurations><global><dump_file_path>hs20log.txt</dump_file_path>'
        f"<create_new_dump_file>true</create_new_dump_file><enabledump>{enabled}</enabledump>"
        "<nextcredid>1</nextcredid></global><credentials></credentials><users></users></configurations>"
    )


class LogTest(unittest.TestCase):
    def run_log(self, folder, *arguments):
        return subprocess.run(
            [program("vexa"), "log", "--machine", str(folder), *arguments],
            env=clean_environment(),
            stdin=subprocess.DEVNULL,
            capture_output=True,
            encoding="utf-8",
            timeout=60,
        )

    def follower(self, folder, *arguments):
        follower = Program([program("vexa"), "log", "--machine", str(folder), "--follow", *arguments])
        self.addCleanup(follower.end)
        return follower


class OfService(LogTest):
    def test_what_the_service_did_can_be_followed(self):
        with Machine({"speed": 20, "config": config("true")}) as machine:
            follower = self.follower(machine.folder)
            machine.hs20().send("NO_SUCH_COMMAND")
            wait_until(lambda: any("NO_SUCH_COMMAND" in line for line in list(follower.lines)), "the line")
            self.assertTrue(any(LINE.match(line) for line in follower.lines))
            machine.hs20().send("ANOTHER_COMMAND")
            wait_until(lambda: any("ANOTHER_COMMAND" in line for line in list(follower.lines)), "the next")
            shown = self.run_log(machine.folder)
            self.assertEqual(shown.returncode, 0, shown.stderr)
            self.assertIn("ANOTHER_COMMAND", shown.stdout)
            self.assertEqual(follower.stop(signal.SIGINT), 0)

    def test_a_log_that_is_off_is_told(self):
        with Machine({"speed": 20, "config": config("false")}) as machine:
            shown = self.run_log(machine.folder)
            self.assertEqual((shown.returncode, shown.stdout), (1, ""))
            self.assertRegex(shown.stderr, r"^vexa: the log is off: set enabledump to true in .*config\.xml")
            self.assertEqual(len(shown.stderr.splitlines()), 1)


class OfFiles(LogTest):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)

    def write(self, name, text, age=0):
        path = self.folder / STORE / "Dump" / name
        path.parent.mkdir(parents=True, exist_ok=True)
        with path.open("ab") as file:
            file.write(text if isinstance(text, bytes) else text.encode())
        now = 1_700_000_000
        os.utime(path, (now - age, now - age))

    def set_config(self, text):
        (self.folder / STORE).mkdir(parents=True, exist_ok=True)
        (self.folder / STORE / "config.xml").write_text(text, encoding="utf-8-sig")

    def lines(self, *arguments):
        shown = self.run_log(self.folder, *arguments)
        self.assertEqual((shown.returncode, shown.stderr), (0, ""))
        return shown.stdout.splitlines()

    def test_a_machine_that_never_ran_has_none(self):
        shown = self.run_log(self.folder)
        self.assertEqual((shown.returncode, shown.stdout), (1, ""))
        self.assertIn("no service has run", shown.stderr)

    def test_a_log_without_a_line_is_told(self):
        self.set_config(config("true"))
        shown = self.run_log(self.folder)
        self.assertEqual((shown.returncode, shown.stdout), (1, ""))
        self.assertIn("nothing is in it yet", shown.stderr)

    def test_the_file_that_was_written_last_comes_last(self):
        self.set_config(config("true"))
        self.write("hs20log_user_10.txt", "third\n", age=5)
        self.write("hs20log_user_9.txt", "second\n", age=5)
        self.write("hs20log_user_0.txt", "fourth\nlast, without an end", age=1)
        self.write("hs20log_user_1.txt", "first\n", age=9)
        (self.folder / STORE / "Dump" / "folder").mkdir()
        self.assertEqual(self.lines(), ["first", "second", "third", "fourth", "last, without an end"])
        self.assertEqual(self.lines("-n", "2"), ["fourth", "last, without an end"])
        self.assertEqual(self.lines("-n", "99"), self.lines())
        self.assertEqual(self.lines("--lines", "0"), [])
        entries = list(map(json.loads, self.lines("--json", "-n", "3")))
        self.assertEqual(entries[0], {"file": "hs20log_user_10.txt", "line": "third"})

    def test_bytes_of_any_kind_become_text(self):
        self.set_config(config("true"))
        self.write("a.txt", b"caf\xe9\nsnow \xe2\x98\x83\nred \x1b[31m\ttab\n")
        self.assertEqual(self.lines(), ["café", "snow ☃", "red \\x1b[31m\ttab"])
        self.assertEqual(json.loads(self.lines("--json")[2])["line"], "red \x1b[31m\ttab")

    def test_files_of_a_log_that_is_off_now_are_shown_with_a_word(self):
        self.set_config(config("false"))
        self.write("a.txt", "from before\n")
        shown = self.run_log(self.folder)
        self.assertEqual((shown.returncode, shown.stdout), (0, "from before\n"))
        self.assertIn("the log is off", shown.stderr)

    def test_following_waits_for_files_and_takes_whole_lines(self):
        follower = self.follower(self.folder, "--json")
        wait_until(lambda: follower.errors, "a word about the silence")
        self.write("a.txt", "one\ntw")
        wait_until(lambda: len(follower.lines) == 1, "the first line")
        self.write("a.txt", "o\n")
        self.write("b.txt", "three\n")
        wait_until(lambda: len(follower.lines) == 3, "the others")
        told = [json.loads(line)["line"] for line in follower.lines]
        self.assertEqual(told[0], "one")
        self.assertEqual(sorted(told[1:]), ["three", "two"])
        self.assertEqual(follower.stop(signal.SIGTERM), 0)

    def test_following_begins_with_the_last_lines(self):
        self.set_config(config("true"))
        self.write("a.txt", "one\ntwo\nthree\n")
        follower = self.follower(self.folder, "-n", "1")
        wait_until(lambda: follower.lines, "a line")
        (self.folder / STORE / "Dump" / "a.txt").write_text("anew\n")
        wait_until(lambda: len(follower.lines) == 2, "the file that was emptied")
        self.assertEqual(follower.lines, ["three", "anew"])

    def test_wrong_use(self):
        for arguments in (["-n"], ["-n", "x"], ["-n", "-1"], ["--nonsense"], ["more"]):
            self.assertEqual(self.run_log(self.folder, *arguments).returncode, 2, arguments)


if __name__ == "__main__":
    unittest.main()
