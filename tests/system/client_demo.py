"""`vexa demo`: the main job, seen in a pipe and in a terminal."""

import fcntl
import json
import os
import pty
import re
import select
import signal
import struct
import subprocess
import tempfile
import termios
import time
import unittest

from harness import PATIENCE, Program, children_of, clean_environment, is_running, program, wait_until

SUMMARY = re.compile(r"Seen: (\d+) channels, (\d+) events, busiest channel (\d+) \(congestion (\d+)\); (.+)")
# What comes in this order, but for the log, which is written every some seconds.
STORY = [
    'joined "City Free" with the credential "City Wi-Fi"',
    'the connection to "City Free" has ended',
    'joined "Gate 12" with the credential "Work"',
    "log: Connection using EAP-TLS with authMode=machineOrUser failed",
    'the traveller leaves "Gate 12"',
    "log: This network has been disconnected by user, skip auto connecting to ssid=Gate 12",
    '"Departures" is in range',
    "an attempt to connect has failed",
    'joined "Departures" with the credential "Airport Lounge"',
    "log: Retry number exceeds maximum retry limit",
    'the traveller asks for "Gate 12"',
]
ENTERED, LEFT = b"\x1b[?1049h", b"\x1b[?1049l"
STORED = ["Work", "Airport Lounge", "City Wi-Fi"]
COLOUR = re.compile(rb"\x1b\[3\dm")


class DemoTest(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.temporary = folder.name

    def environment(self, **variables):
        settings = {"TMPDIR": self.temporary, "TERM": "xterm-256color", "LC_ALL": "C.UTF-8", **variables}
        return clean_environment(**settings)

    def assert_nothing_is_left(self):
        self.assertEqual(os.listdir(self.temporary), [])

    def assert_summary(self, line):
        match = SUMMARY.fullmatch(line)
        self.assertIsNotNone(match, line)
        channels, events, _, congestion = map(int, match.groups()[:4])
        self.assertGreater(channels, 0)
        self.assertGreaterEqual(events, 3, "the radio, the channels and at least one value")
        self.assertLessEqual(congestion, 100)


class InPipe(DemoTest):
    def demo(self, *arguments):
        demo = Program([program("vexa"), "demo", *arguments], self.environment())
        self.addCleanup(demo.end)
        return demo

    def wait_value(self, demo):
        def look():
            self.assertIsNone(demo.process.poll(), demo.errors)
            return any("congestion" in line for line in list(demo.lines))

        wait_until(look, "a value")

    def test_it_prints_plain_lines_and_ends_by_itself(self):
        demo = self.demo("--seconds", "3")
        self.assertEqual(demo.wait(), 0)
        self.assert_summary(demo.lines[-1])
        self.assertTrue(any(re.search(r"channel \d+: congestion \d+$", line) for line in demo.lines))
        self.assertTrue(any(re.search(r"channel \d+: interference \d+$", line) for line in demo.lines))
        self.assertNotIn("\x1b", "".join(demo.lines))
        self.assertEqual(demo.errors, [])
        self.assert_nothing_is_left()

    def test_the_summary_counts_what_was_printed(self):
        demo = self.demo("--seconds", "3")
        demo.wait()
        events = int(SUMMARY.fullmatch(demo.lines[-1]).group(2))
        self.assertEqual(events, sum("  channel " in line or " channels: " in line or "  radio " in line for line in demo.lines))

    def test_credentials_are_stored_before_the_spectrum(self):
        demo = self.demo("--seconds", "1")
        demo.wait()
        told, heading, *rows = demo.lines[:5]
        self.assertRegex(told, "Stored 3 credentials")
        starts = [heading.index(word) for word in ("Name", "Realm")]
        self.assertEqual([row[slice(*starts)].strip() for row in rows], STORED)
        self.assertNotIn("only for the demo", "".join(demo.lines))
        self.assertRegex(demo.lines[5], r"^ +\d+\.\d\d s  ", "the events follow")

    def test_json_lines(self):
        demo = self.demo("--seconds", "3", "--json")
        self.assertEqual(demo.wait(), 0)
        stored, *events, summary = map(json.loads, demo.lines)
        self.assertIsInstance(summary["joined"], list)
        self.assertEqual([entry["name"] for entry in stored["credentials"]], STORED)
        self.assertTrue(all(event["Source"] in ("SpectralAnalyser", "HotSpot20") for event in events))
        spectral = [event for event in events if event["Source"] == "SpectralAnalyser"]
        self.assertEqual(summary["events"], len(spectral))
        self.assertGreater(summary["busiest"]["congestion"], 0)

    def test_the_story_of_the_traveller(self):
        demo = self.demo()
        self.assertEqual(demo.wait(), 0)
        told = [line.partition(" s  ")[2] for line in demo.lines]
        places = []
        for part in STORY:
            places.append(next((i for i, line in enumerate(told) if part in line), None))
            self.assertIsNotNone(places[-1], f"{part!r} is not in {[t for t in told if not t.startswith('channel ')]}")
        acts = [place for part, place in zip(STORY, places) if not part.startswith("log: ")]
        self.assertEqual(acts, sorted(acts))
        left, asked = (told.index(f'the traveller {act} "Gate 12"') for act in ("leaves", "asks for"))
        self.assertNotIn('joined "Gate 12"', " ".join(told[left:asked]), "the service stays away")
        self.assertIn('joined "Gate 12" with the credential "Work"', told[asked:])
        self.assertEqual(SUMMARY.fullmatch(demo.lines[-1]).group(5), "joined City Free, Gate 12, Departures, Gate 12")

    def test_every_signal_that_asks_for_the_end_is_a_good_end(self):
        for number in (signal.SIGINT, signal.SIGTERM, signal.SIGHUP):
            with self.subTest(number.name):
                demo = self.demo("--seconds", "600")
                self.wait_value(demo)
                (service,) = children_of(demo.process.pid)
                self.assertEqual(demo.stop(number), 0)
                self.assert_summary(demo.lines[-1])
                self.assertFalse(is_running(service))
                self.assert_nothing_is_left()

    def test_one_that_is_stopped_at_once_is_a_good_end_too(self):
        for number in (signal.SIGINT, signal.SIGTERM):
            demo = self.demo("--seconds", "600")
            wait_until(lambda: os.listdir(self.temporary), "its machine")
            self.assertEqual(demo.stop(number), 0)
            self.assertTrue(demo.lines[-1].startswith("Seen: "), demo.lines)
            self.assertEqual(demo.errors, [])
            self.assert_nothing_is_left()

    def test_it_ends_when_nobody_reads_any_more(self):
        reader, writer = os.pipe()
        demo = subprocess.Popen(
            [program("vexa"), "demo", "--seconds", "600"], env=self.environment(), stdout=writer, stdin=subprocess.DEVNULL
        )
        self.addCleanup(demo.kill)
        os.close(writer)
        os.read(reader, 1)
        os.close(reader)
        self.assertEqual(demo.wait(PATIENCE), 0)
        self.assert_nothing_is_left()

    def test_a_service_that_dies_is_told(self):
        demo = self.demo("--seconds", "600")
        self.wait_value(demo)
        (service,) = children_of(demo.process.pid)
        os.kill(service, signal.SIGKILL)
        self.assertEqual(demo.wait(), 1)
        self.assertEqual(len(demo.errors), 1, demo.errors)
        self.assert_nothing_is_left()


class Terminal:
    """A pseudo terminal with a program in it."""

    def __init__(self, arguments, environment, columns=100, rows=40):
        self.screen = b""
        self.ours, self._theirs = pty.openpty()
        fcntl.ioctl(self.ours, termios.TIOCSWINSZ, struct.pack("HHHH", rows, columns, 0, 0))
        self.before = termios.tcgetattr(self._theirs)
        self.process = subprocess.Popen(
            arguments,
            env=environment,
            stdin=self._theirs,
            stdout=self._theirs,
            stderr=self._theirs,
            start_new_session=True,
            preexec_fn=lambda: fcntl.ioctl(0, termios.TIOCSCTTY, 0),
        )

    def read_until(self, pattern):
        self._read(lambda: re.search(pattern, self.screen))

    def finish(self):
        """Gives the exit code."""
        self._read(lambda: self.process.poll() is not None)
        self._drain(0)
        return self.process.returncode

    def _read(self, done):
        end = time.monotonic() + PATIENCE
        while not done():
            if time.monotonic() > end:
                raise AssertionError(f"not in {PATIENCE} s; the terminal got {self.screen[-2000:]!r}")
            self._drain(0.05)

    def _drain(self, wait):
        while select.select([self.ours], [], [], wait)[0]:
            self.screen += os.read(self.ours, 65536)
            wait = 0

    def press(self, keys):
        os.write(self.ours, keys)

    def settings(self):
        return termios.tcgetattr(self._theirs)

    def last_line(self):
        # A terminal that echoes shows the pressed Ctrl-C.
        return self.screen.decode().rstrip().splitlines()[-1].removeprefix("^C")

    def close(self):
        if self.process.poll() is None:
            self.process.kill()
            self.process.wait()
        os.close(self.ours)
        os.close(self._theirs)


class InTerminal(DemoTest):
    def demo(self, *arguments, columns=100, rows=40, **variables):
        terminal = Terminal([program("vexa"), "demo", *arguments], self.environment(**variables), columns, rows)
        self.addCleanup(terminal.close)
        return terminal

    def assert_good_end(self, terminal):
        self.assertEqual(terminal.finish(), 0)
        self.assertEqual(terminal.settings(), terminal.before)
        self.assertEqual(terminal.screen.count(ENTERED), terminal.screen.count(LEFT))
        self.assert_summary(terminal.last_line())
        self.assert_nothing_is_left()

    def test_it_draws_bars_until_a_key_ends_it(self):
        terminal = self.demo("--seconds", "600")
        terminal.read_until("█".encode())
        self.assertNotEqual(terminal.settings(), terminal.before)
        self.assertRegex(terminal.screen, COLOUR)
        for name in STORED:
            self.assertIn(name.encode(), terminal.screen)
        terminal.press(b"x")
        terminal.press(b"q")
        self.assert_good_end(terminal)

    def test_a_small_terminal_has_room_for_the_story(self):
        terminal = self.demo("--seconds", "600", columns=80, rows=24)
        terminal.read_until(rb'joined "City Free" with the credential "City Wi-Fi"')
        self.assertFalse(b"Stored 3 credentials" in terminal.screen)
        terminal.press(b"q")
        self.assert_good_end(terminal)
        last = re.sub(rb"\x1b\[[?0-9;]*[A-Za-z]", b"", terminal.screen.rpartition(LEFT)[2]).decode().splitlines()
        self.assertLessEqual(len(last), 24)
        self.assertLess(max(map(len, last[:-1])), 80)

    def test_ctrl_c_ends_it(self):
        terminal = self.demo("--seconds", "600")
        terminal.read_until("█".encode())
        terminal.press(b"\x03")
        self.assert_good_end(terminal)

    def test_it_ends_by_itself(self):
        terminal = self.demo("--seconds", "2")
        self.assert_good_end(terminal)

    def test_the_terminal_is_as_before_when_the_service_dies(self):
        terminal = self.demo("--seconds", "600")
        terminal.read_until("█".encode())
        (service,) = children_of(terminal.process.pid)
        os.kill(service, signal.SIGKILL)
        self.assertEqual(terminal.finish(), 1)
        self.assertEqual(terminal.settings(), terminal.before)
        self.assertEqual(terminal.screen.count(ENTERED), terminal.screen.count(LEFT))

    def test_a_stopped_one_gives_the_terminal_back_and_goes_on(self):
        terminal = self.demo("--seconds", "600")
        terminal.read_until("█".encode())
        terminal.press(b"\x1a")
        wait_until(lambda: process_state(terminal.process.pid) == "T", "the stop")
        self.assertEqual(terminal.settings(), terminal.before)
        terminal.process.send_signal(signal.SIGCONT)
        wait_until(lambda: terminal.settings() != terminal.before, "the terminal being taken again")
        terminal.press(b"q")
        self.assert_good_end(terminal)

    def test_no_colour_if_the_user_wants_none(self):
        terminal = self.demo("--seconds", "600", NO_COLOR="1")
        terminal.read_until("█".encode())
        terminal.press(b"q")
        self.assert_good_end(terminal)
        self.assertNotRegex(terminal.screen, COLOUR)

    def test_plain_signs_where_there_is_no_utf_8(self):
        terminal = self.demo("--seconds", "600", LC_ALL="C")
        terminal.read_until(b"##")
        terminal.press(b"q")
        self.assert_good_end(terminal)
        self.assertTrue(terminal.screen.isascii())

    def test_plain_lines_on_a_dumb_terminal(self):
        terminal = self.demo("--seconds", "600", TERM="dumb")
        terminal.read_until(rb"congestion \d")
        terminal.press(b"\x03")
        self.assert_good_end(terminal)
        self.assertNotIn(b"\x1b", terminal.screen)

    def test_no_row_is_wider_than_the_terminal(self):
        for columns in (50, 81, 200):
            with self.subTest(columns):
                terminal = self.demo("--seconds", "600", columns=columns)
                terminal.read_until("█".encode())
                terminal.press(b"q")
                terminal.finish()
                lines = re.sub(rb"\x1b\[H|\x1b\[\?1049l", b"\r\n", terminal.screen)
                rows = re.sub(rb"\x1b\[[?0-9;]*[A-Za-z]", b"", lines).decode().splitlines()
                bars = [row for row in rows if "█" in row]
                self.assertTrue(bars)
                self.assertLess(max(map(len, bars)), columns)


def process_state(pid):
    with open(f"/proc/{pid}/stat", encoding="latin-1") as file:
        return file.read().rpartition(")")[2].split()[0]


if __name__ == "__main__":
    unittest.main()
