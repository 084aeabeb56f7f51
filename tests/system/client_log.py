"""`vexa log`: the diagnostic log of a machine, whether its service runs or not."""

import json
import os
import pathlib
import re
import resource
import signal
import time
import unicodedata

from harness import STORE, Story, program, run_client, wait_until

LINE = re.compile(r"\[\d+\] \d\d/\d\d \d\d:\d\d:\d\d  ")
TEXT = r'"(?:[^"\\]|\\.)*"'
CALL, ROW = re.compile(rf"\bLog(?:Wide)?\(\s*([2-6]),\s*((?:L?{TEXT}\s*)+)"), re.compile(rf"\{{\d+, ({TEXT}), (\d), ")


def config(enabled):
    return (
        '<?xml version="1.0" encoding="UTF-8"?><configurations><global><dump_file_path>hs20log.txt</dump_file_path>'
        f"<create_new_dump_file>true</create_new_dump_file><enabledump>{enabled}</enabledump>"
        "<nextcredid>1</nextcredid></global><credentials></credentials><users></users></configurations>"
    )


def logged():
    """The level and the text of all that the service logs, each network named `Gate 1`."""
    for path in (pathlib.Path(__file__).parents[2] / "src").rglob("*.cpp"):
        source = path.read_text()
        calls = [(level, "".join(json.loads(part) for part in re.findall(TEXT, text))) for level, text in CALL.findall(source)]
        for level, text in calls + [(level, json.loads(text)) for text, level in ROW.findall(source)]:
            text = re.sub("(ssid=|network=|####)%s", r"\1Gate 1", text)
            if text != "%s":
                yield int(level), re.sub(r"%[\w]+", "7", text)


def entry(number, text, age=0):
    return time.strftime(f"[{number}] %m/%d %H:%M:%S  {text}\n", time.localtime(time.time() - age))


class OfService(Story):
    def test_what_the_service_did_can_be_followed(self):
        machine = self.start(config=config("true"))
        follower = self.running("log", "--follow", "--machine", machine.folder)
        machine.hs20().send("NO_SUCH_COMMAND")
        self.assertRegex(follower.wait_line("NO_SUCH_COMMAND"), LINE)
        machine.hs20().send("ANOTHER_COMMAND")
        follower.wait_line("ANOTHER_COMMAND")
        self.assertIn("ANOTHER_COMMAND", self.done("log"))
        self.assertEqual(follower.stop(signal.SIGINT), 130)

    def test_a_log_that_is_off_is_told(self):
        self.start(config=config("false"))
        expected = r"^vexa: the log is off: set enabledump to true in .*config\.xml"
        self.assertRegex(self.refused(1, "log"), expected)


class OfFiles(Story):
    def setUp(self):
        self.folder = self.new_folder()

    def write(self, name, text, age=0):
        path = self.folder / STORE / "Dump" / name
        path.parent.mkdir(parents=True, exist_ok=True)
        with path.open("ab") as file:
            file.write(text if isinstance(text, bytes) else text.encode())
        now = 1_700_000_000
        os.utime(path, (now - age, now - age))

    def set_config(self, enabled):
        (self.folder / STORE).mkdir(parents=True, exist_ok=True)
        (self.folder / STORE / "config.xml").write_text(config(enabled), encoding="utf-8-sig")

    def vexa(self, *arguments, **_):
        return run_client(*arguments, "--machine", self.folder)

    def lines(self, *arguments):
        return self.done("log", *arguments).splitlines()

    def test_why_there_is_none(self):
        self.assertIn("no service has run", self.refused(1, "log"))
        self.set_config("true")
        self.assertIn("nothing is in it yet", self.refused(1, "log"))

    def test_the_file_that_was_written_last_comes_last(self):
        self.set_config("true")
        self.write("hs20log_user_10.txt", "third\n", age=5)
        self.write("hs20log_user_9.txt", "second\n", age=5)
        self.write("hs20log_user_0.txt", "fourth\nlast, without an end", age=1)
        self.write("hs20log_user_1.txt", "first\n", age=9)
        (self.folder / STORE / "Dump" / "folder").mkdir()
        self.assertEqual(self.lines(), ["first", "second", "third", "fourth", "last, without an end"])
        self.write("hs20log_user_2.txt", "x" * 70000 + "\n", age=20)
        self.write("hs20log_user_3.txt", "rest", age=30)
        lines = self.lines()
        for count in range(len(lines) + 2):
            self.assertEqual(self.lines("--lines", str(count)), lines[-count:] if count else [], count)
        entries = list(map(json.loads, self.lines("--json", "-n", "4")))
        self.assertEqual(entries[0], {"file": "hs20log_user_10.txt", "line": "third"})

    def test_of_a_long_log_its_end_alone_is_read(self):
        self.set_config("true")
        self.write("a.txt", "")
        os.truncate(self.folder / STORE / "Dump" / "a.txt", 1 << 28)
        self.write("a.txt", "\none\ntwo\n")
        self.assertEqual(self.lines("-n", "2"), ["one", "two"])
        self.assertIn("not in range 0 to 1000000000", self.refused(2, "log", "-n", "-1"))
        self.assertLess(resource.getrusage(resource.RUSAGE_CHILDREN).ru_maxrss, 1 << 18, "KiB, as much as it holds")

    def test_a_long_log_is_not_kept_in_memory(self):
        self.set_config("true")
        for _ in range(1 << 7):
            self.write("a.txt", entry(1, "x" * 1000) * (1 << 10))
        self.write("a.txt", entry(2, "y"))
        for options in (["--grep", "y"], ["--grep", "x", "-n", "1"], ["--level", "6"], []):
            log = os.posix_spawn(program("vexa"), ["vexa", "log", *options, "--machine", self.folder], os.environ, file_actions=[
                (os.POSIX_SPAWN_OPEN, 1, "/dev/null", os.O_WRONLY, 0)])  # fmt: skip
            _, status, usage = os.wait4(log, 0)
            self.assertEqual(status, 0)
            self.assertLess(usage.ru_maxrss, 1 << 16, "KiB, half of what it holds")

    def test_bytes_of_any_kind_become_text(self):
        self.set_config("true")
        self.write("a.txt", b"caf\xe9\nsnow \xe2\x98\x83\nred \x1b[31m\ttab\n")
        hidden = [c for c in map(chr, range(127, 0x110000)) if unicodedata.category(c) in ("Cc", "Cf", "Zl", "Zp")]
        self.write("a.txt", "".join(c + "\n" for c in hidden))
        told = self.vexa("log").stdout.split("\n")[:-1]
        self.assertEqual(told[:3], ["café", "snow ☃", "red \\x1b[31m\ttab"])
        escapes = [repr(c)[1:-1] for c in hidden]
        self.assertEqual((told[3:], escapes[-1]), (escapes, "\\U000e007f"))
        told = self.vexa("log", "--json").stdout.split("\n")[2:-1]
        self.assertEqual([json.loads(line)["line"] for line in told], ["red \x1b[31m\ttab", *hidden])
        self.assertTrue(all(map(str.isascii, told)), told)

    def test_passwords_show_where_nobody_looks_on_or_when_asked_for(self):
        self.set_config("true")
        self.write("a.txt", "[7] 05/17 06:32:17  \tUsername=anna, password=gEh31m, 1\n")
        hidden, shown = "anna, password=********", "anna, password=gEh31m, 1"
        for runs in (lambda *options: self.lines(*options)[0], self.in_terminal):
            for options, told in ((["--redact"], hidden), (["--redact", "--json"], hidden), (["--no-redact"], shown),
                                  ([], hidden if runs == self.in_terminal else shown)):  # fmt: skip
                self.assertRegex(runs(*options), re.escape(told) + r'"?}?\s*$', options)

    def test_a_password_goes_on_up_to_the_next_entry(self):
        self.set_config("true")
        head, secret = "[7] 05/17 06:32:17  \tUsername=anna, password=", "\n".join("secret" for _ in range(40))
        self.write("a.txt", entry(6, "\none") + head + secret + ", 1\n" + entry(8, "\ntwo") + head + secret)
        self.write("b.txt", "beside\n" + entry(1, "three"), age=-1)
        one, two, three = (text.splitlines() for text in (entry(6, "\none"), entry(8, "\ntwo"), entry(1, "three")))
        shown = [*one, head + "********", *two, head + "********", "beside", *three]
        for count in (3, 4, 5, 99):
            self.assertEqual(self.lines("--redact", "-n", str(count)), shown[-count:], count)
        self.assertNotIn("secret", str(self.lines("--redact", "-n", "6")), "what is read begins within a password")
        self.assertEqual(self.lines("--redact"), shown)
        self.assertEqual(self.lines("--redact", "--grep", "anna"), [head + "********"] * 2)
        self.assertEqual(str(self.lines("--no-redact")).count("secret"), 80)

    def in_terminal(self, *options):
        terminal = self.terminal("log", *options, "--machine", self.folder)
        terminal.finish()
        return terminal.screen.decode()

    def test_files_of_a_log_that_is_off_now_are_shown_with_a_word(self):
        self.set_config("false")
        self.write("a.txt", "from before\n")
        shown = self.vexa("log")
        self.assertEqual((shown.returncode, shown.stdout), (0, "from before\n"))
        self.assertIn("the log is off", shown.stderr)

    def test_following_waits_for_files_and_takes_whole_lines(self):
        follower = self.running("log", "--follow", "--json", "--machine", self.folder)
        wait_until(lambda: follower.errors, "a word about the silence")
        self.write("a.txt", "one\ntw")
        follower.wait_line("one")
        self.write("a.txt", "o\n")
        self.write("b.txt", "three\n")
        follower.wait_line("", count=3)
        told = [json.loads(line)["line"] for line in follower.lines]
        self.assertEqual((told[0], sorted(told[1:])), ("one", ["three", "two"]))
        self.assertEqual(follower.stop(signal.SIGTERM), 143)

    def test_following_begins_with_the_last_lines(self):
        self.set_config("true")
        self.write("a.txt", "one\ntwo\nthree\n")
        follower = self.running("log", "--follow", "-n", "1", "--machine", self.folder)
        follower.wait_line("three")
        (self.folder / STORE / "Dump" / "a.txt").write_text("anew\n")
        follower.wait_line("anew")
        self.assertEqual(follower.lines, ["three", "anew"])

    def test_entries_by_their_level_and_their_network(self):
        self.set_config("true")
        entries = [(level, entry(number, text)) for number, (level, text) in enumerate(logged(), 1)]
        self.assertGreater(len(entries), 250)
        self.write("a.txt", "".join(text for _, text in entries))
        for level in range(2, 7):
            wanted = "".join(text for its_level, text in entries if its_level >= level).splitlines()
            self.assertEqual(self.lines("--level", str(level)), wanted)
        named = "".join(text for _, text in entries if "Gate 1" in text).splitlines()
        self.assertEqual((self.lines("--ssid", "Gate 1"), self.lines("--ssid", "Gate")), (named, []))

    def test_entries_by_their_time_and_their_text(self):
        self.set_config("true")
        hex_dump = "[4] Interworking: AP domain name 2e 63"
        old, empty, error = entry(1, "old: one", 3 * 3600), entry(2, "\n\tnew one"), entry(5, "ERROR: new two")
        self.write("a.txt", old + empty + "and on\n" + entry(3, "new three") + hex_dump + error)
        one, two, three = [*empty.splitlines(), "and on"], [hex_dump + error[:-1]], entry(3, "new three").splitlines()
        then = time.localtime(time.time() - 2 * 3600)
        for since in ("90m", "2h", time.strftime("%H:%M", then), time.strftime("%Y-%m-%d %H:%M", then)):
            self.assertEqual(self.lines("--since", since), [*one, *three, *two], since)
        yesterday = time.strftime("%H:%M", time.localtime(time.time() + 600))
        self.assertEqual(self.lines("--since", yesterday)[0], old[:-1])
        self.write("b.txt", entry(8, "of last year", -2 * 24 * 3600))
        self.assertNotIn("of last year", str(self.lines("--since", "1h")))
        self.assertEqual(self.lines("--grep", "one"), [*old.splitlines(), *one])
        self.assertEqual(self.lines("--grep", "one", "--since", "1h"), one)
        self.assertEqual(self.lines("--level", "3", "--grep", "new", "-n", "2"), three + two)
        self.assertEqual(self.lines("--terse", "--fields", "line,file", "-n", "1", "--since", "4h", "--grep", "old"),
                         [old[:-1].replace(":", "\\:") + ":a.txt"])
        for wrong in ("soon", "10", "25:00", "1m2", "2026-11-24"):
            self.assertIn("is no time", self.refused(2, "log", "--since", wrong))
        follower = self.running("log", "-f", "--level", "6", "--machine", self.folder)
        follower.wait_line("ERROR: new two")
        self.write("a.txt", entry(6, "more") + entry(7, "ERROR: three"))
        follower.wait_line("ERROR: three")
        self.assertEqual(len(follower.lines), 2)
