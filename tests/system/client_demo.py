"""`vexa demo`: the main job, seen in a pipe and in a terminal."""

import json
import os
import re
import signal
import subprocess
import sys

from harness import PATIENCE, Story, child_of, clean_environment, is_running, program, wait_until

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
BAR = "█".encode()
# A service that lets nobody in, and is killed as soon as it is asked to stop.
CLOSING = f"""#!{sys.executable}
import os, signal, socket, sys, time
sa, hs20 = (socket.create_server(("127.0.0.1", int(port))) for port in sys.argv[1:])
hs20.accept()[0].close()
while os.path.exists(os.path.join(os.environ["VEXA_MACHINE"], "ports.json")):
    time.sleep(0.01)
os.kill(os.getpid(), signal.SIGKILL)
"""
FOR_LONG = ["demo", "--seconds", "600"]


def rows_of(screen):
    """All that was ever drawn, without colours and the like."""
    lines = re.sub(rb"\x1b\[H|\x1b\[\?1049l", b"\r\n", screen)
    return re.sub(rb"\x1b\[[?0-9;]*[A-Za-z]", b"", lines).decode().splitlines()


class DemoStory(Story):
    def setUp(self):
        self.temporary = self.new_folder()
        self.environment = clean_environment(TMPDIR=str(self.temporary), TERM="xterm-256color", LC_ALL="C.UTF-8")

    def assert_nothing_is_left(self):
        self.assertEqual(list(self.temporary.iterdir()), [])

    def assert_summary(self, line):
        match = SUMMARY.fullmatch(line)
        self.assertIsNotNone(match, line)
        channels, events, _, congestion = map(int, match.groups()[:4])
        self.assertGreater(channels, 0)
        self.assertGreaterEqual(events, 3, "the radio, the channels and at least one value")
        self.assertLessEqual(congestion, 100)


class InPipe(DemoStory):
    def demo(self, *arguments):
        return self.running("demo", *arguments, environment=self.environment)

    def test_json_lines(self):
        demo = self.demo("--seconds", "600", "--json")
        demo.wait_line("congestion_value")
        self.assertEqual(demo.stop(signal.SIGINT), 0)
        stored, *events, summary = map(json.loads, demo.lines)
        self.assertIsInstance(summary["joined"], list)
        self.assertNotIn("only for the demo", "".join(demo.lines))
        self.assertIn("********", "".join(demo.lines))
        self.assertEqual([entry["name"] for entry in stored["credentials"]], STORED)
        sources = [event["Source"] for event in events]
        self.assertLessEqual(set(sources), {"SpectralAnalyser", "HotSpot20"})
        self.assertEqual(summary["events"], sources.count("SpectralAnalyser"))
        self.assertGreater(summary["busiest"]["congestion"], 0)

    def test_the_story_of_the_traveller_in_plain_lines(self):
        demo = self.demo()
        self.assertEqual((demo.wait(), demo.errors), (0, []))
        self.assertRegex(demo.lines[0], "Stored 3 credentials")
        starts = [demo.lines[1].index(word) for word in ("Name", "Realm")]
        self.assertEqual([row[slice(*starts)].strip() for row in demo.lines[2:5]], STORED)
        self.assertRegex(demo.lines[5], r"^ +\d+\.\d\d s  ", "the events follow")
        for value in ("congestion", "interference"):
            self.assertTrue(any(re.search(rf"channel \d+: {value} \d+$", line) for line in demo.lines))
        self.assertNotRegex("".join(demo.lines), "\x1b|only for the demo")
        self.assert_summary(demo.lines[-1])
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
                demo.wait_line("congestion")
                service = child_of(demo.process.pid)
                self.assertEqual((demo.stop(number), demo.errors), (0, []))
                self.assert_summary(demo.lines[-1])
                self.assertFalse(is_running(service))
                self.assert_nothing_is_left()
                at_once = self.demo("--seconds", "600")
                wait_until(lambda: list(self.temporary.iterdir()), "its machine")
                self.assertEqual((at_once.stop(number), at_once.errors), (0, []))
                self.assertTrue(at_once.lines[-1].startswith("Seen: "), at_once.lines)
                self.assert_nothing_is_left()

    def test_it_ends_when_nobody_reads_any_more(self):
        reader, writer = os.pipe()
        command = [program("vexa"), *FOR_LONG]
        demo = subprocess.Popen(command, env=self.environment, stdout=writer, stdin=subprocess.DEVNULL)
        self.addCleanup(demo.kill)
        os.close(writer)
        os.read(reader, 1)
        os.close(reader)
        self.assertEqual(demo.wait(PATIENCE), 0)
        self.assert_nothing_is_left()

    def test_a_service_that_dies_is_told(self):
        demo = self.demo("--seconds", "600")
        demo.wait_line("congestion")
        os.kill(child_of(demo.process.pid), signal.SIGKILL)
        self.assertEqual((demo.wait(), len(demo.errors)), (1, 1), demo.errors)
        self.assert_nothing_is_left()

    def test_a_lost_connection_is_told_and_not_what_becomes_of_the_service(self):
        service = self.new_folder() / "closing"
        service.write_text(CLOSING)
        service.chmod(0o700)
        demo = self.demo("--service", service)
        self.assertEqual((demo.wait(), len(demo.errors)), (1, 1), demo.errors)
        self.assert_nothing_is_left()


class InTerminal(DemoStory):
    def demo(self, pattern=BAR, command=FOR_LONG, **options):
        terminal = self.terminal(*command, **{"TMPDIR": str(self.temporary), **options})
        terminal.read_until(pattern)
        return terminal

    def assert_end(self, terminal, code=0):
        self.assertEqual((terminal.finish(), terminal.settings()), (code, terminal.before))
        self.assertEqual(terminal.screen.count(ENTERED), terminal.screen.count(LEFT))

    def assert_good_end(self, terminal):
        self.assert_end(terminal)
        self.assert_summary(terminal.last_line())
        self.assert_nothing_is_left()

    def test_it_draws_bars_until_a_key_ends_it(self):
        terminal = self.demo()
        self.assertNotEqual(terminal.settings(), terminal.before)
        self.assertRegex(terminal.screen, COLOUR)
        for name in STORED:
            self.assertIn(name.encode(), terminal.screen)
        terminal.suspend_and_resume()
        terminal.press(b"x")
        terminal.press(b"q")
        self.assert_good_end(terminal)

    def test_a_small_terminal_has_room_for_the_story(self):
        terminal = self.demo(b'joined "Gate 12"', columns=80, rows=24)
        self.assertFalse(b"Stored 3 credentials" in terminal.screen)
        terminal.press(b"q")
        self.assert_good_end(terminal)
        *last, _summary = rows_of(terminal.screen.rpartition(LEFT)[2])
        self.assertLess(max(len(row) for row in rows_of(terminal.screen) if "█" in row), 80)
        self.assertLessEqual(len(last), 24)
        self.assertLess(max(map(len, last)), 80)

    def test_it_ends_by_itself(self):
        terminal = self.demo(b"", ["demo", "--seconds", "2"])
        self.assert_end(terminal)
        self.assertTrue(terminal.last_line().startswith("Seen: "), "even if it has seen nothing yet")
        self.assert_nothing_is_left()

    def test_the_terminal_is_as_before_when_the_service_dies(self):
        terminal = self.demo()
        os.kill(child_of(terminal.process.pid), signal.SIGKILL)
        self.assert_end(terminal, 1)

    def test_what_a_terminal_cannot_show_is_left_out(self):
        for variable, shown, key, left_out in (
            ({"NO_COLOR": "1"}, BAR, b"\x03", COLOUR),
            ({"LC_ALL": "C"}, b"##", b"q", rb"[^\0-\x7f]"),
            ({"TERM": "dumb"}, rb"congestion \d", b"q", rb"\x1b"),
        ):
            with self.subTest(variable):
                terminal = self.demo(shown, **variable)
                terminal.press(key)
                self.assert_good_end(terminal)
                self.assertNotRegex(terminal.screen, left_out)
