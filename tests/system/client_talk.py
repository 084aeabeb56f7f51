"""`vexa` as a client of a running service: scan, channels, send, listen."""

import json
import re
import signal
import subprocess
import tempfile
import unittest

from harness import Machine, Program, clean_environment, program, wait_until

LEVELS = {
    "1": {"congestion": 30, "power": 60, "spread": 0},
    "36": {"congestion": 70, "power": 96, "spread": 0},
    "149": {"congestion": 5, "power": 20, "spread": 0},
}
SPECTRUM = {"channels": [36, 1, 36, 149], "levels": LEVELS}
SCENARIO = {"speed": 20, "spectrum": SPECTRUM}
# A level of equal bins is 10 log10(1/56) + power - 96 dB, above a floor of -120.
EXPECTED = [
    {"channel": 1, "order": 2, "congestion": 30, "interference": 67},
    {"channel": 36, "order": 1, "congestion": 70, "interference": 100},
    {"channel": 149, "order": 3, "congestion": 5, "interference": 27},
]


def run_client(*arguments, **variables):
    return subprocess.run(
        [program("vexa"), *map(str, arguments)],
        env=clean_environment(**variables),
        capture_output=True,
        text=True,
        timeout=60,
    )


class WithService(unittest.TestCase):
    def setUp(self):
        self.machine = self.enterContext(Machine(SCENARIO))

    def listener(self, *arguments):
        listener = Program([program("vexa"), *map(str, arguments)])
        self.addCleanup(listener.end)
        return listener

    def scan_requests(self, enable):
        """The start (1) or stop (0) requests that the spectral module got."""
        head = re.compile("^01000000" + "0b00a3ff" + ".{32}" + f"{enable:02x}000000")
        return [call for call in self.machine.control.query("calls") if head.match(call.get("inHex") or "")]

    def test_a_scan_gives_the_values_of_every_channel(self):
        result = run_client("scan", "--json", "--machine", self.machine.folder)
        self.assertEqual(result.returncode, 0, result.stderr)
        self.assertEqual(json.loads(result.stdout), {"channels": EXPECTED})

    def test_a_scan_is_stopped_at_its_end(self):
        run_client("scan", "--machine", self.machine.folder)
        self.assertTrue(self.scan_requests(1))
        wait_until(lambda: self.scan_requests(0), "a stop request")

    def test_the_table_has_a_row_per_channel(self):
        result = run_client("scan", "--machine", self.machine.folder)
        heading, *rows = result.stdout.splitlines()
        self.assertEqual(heading.split(), ["Channel", "Order", "Congestion", "Interference"])
        self.assertEqual([list(map(int, row.split())) for row in rows], [list(row.values()) for row in EXPECTED])

    def test_watching_goes_on_until_it_is_asked_to_end(self):
        watch = self.listener("scan", "--watch", "--machine", self.machine.folder)
        wait_until(lambda: any("channel 36: congestion 70" in line for line in list(watch.lines)), "a value")
        self.machine.control.do("levels", levels={"36": {"congestion": 0, "power": 96, "spread": 0}})
        wait_until(lambda: any("channel 36: congestion 28" in line for line in list(watch.lines)), "the change")
        self.assertEqual(watch.stop(signal.SIGINT), 0)
        wait_until(lambda: self.scan_requests(0), "a stop request")

    def test_the_port_can_come_from_option_environment_and_machine(self):
        port = self.machine.sa_port
        answers = [
            run_client("channels", "--json", "--sa-port", port),
            run_client("channels", "--json", "--port", port),
            run_client("channels", "--json", VEXA_SA_PORT=str(port)),
            run_client("channels", "--json", "--machine", self.machine.folder),
            run_client("channels", "--json", VEXA_MACHINE=str(self.machine.folder)),
            run_client("channels", "--json", "--sa-port", port, VEXA_SA_PORT="1", VEXA_MACHINE="/nonexistent"),
        ]
        expected = [{"channel": row["channel"], "order": row["order"]} for row in EXPECTED]
        for answer in answers:
            self.assertEqual(answer.returncode, 0, answer.stderr)
            self.assertEqual(json.loads(answer.stdout), expected)

    def test_what_is_sent_is_answered_an_event_a_line(self):
        result = run_client("send", self.machine.hs20_port, "GET_IS_CARD_IN", "--wait", 2000)
        self.assertEqual(result.returncode, 0, result.stderr)
        events = list(map(json.loads, result.stdout.splitlines()))
        self.assertEqual([(event["EventId"], event["Data"]) for event in events], [("CARD_PLUG_IN", "")])

    def test_sending_can_be_all(self):
        result = run_client("send", self.machine.sa_port, "FULL_SCAN", "--wait", 0)
        self.assertEqual((result.returncode, result.stdout), (0, ""))
        wait_until(lambda: self.scan_requests(1), "a scan request")

    def test_listening_shows_events_as_they_come(self):
        listener = self.listener("listen", self.machine.sa_port)
        wait_until(lambda: self.events_after_a_pull(listener), "an event")
        self.assertEqual(listener.stop(signal.SIGINT), 0)

    def events_after_a_pull(self, listener):
        self.machine.control.do("pullAdapter")
        return [line for line in list(listener.lines) if json.loads(line)["EventId"] == "CARD_PLUG_OUT"]

    def test_a_service_that_goes_is_told(self):
        for command in (["listen"], ["scan", "--watch", "--sa-port"]):
            with self.subTest(command), Machine(SCENARIO) as machine:
                listener = self.listener(*command, machine.sa_port)
                question = machine.sa()
                wait_until(lambda: question.send("GET_CURRENT_CHANNEL") or listener.lines, "an event")
                machine.stop()
                self.assertEqual(listener.wait(), 1)
                self.assertEqual(len(listener.errors), 1, listener.errors)


class WithoutService(unittest.TestCase):
    def test_each_command_says_so(self):
        with tempfile.TemporaryDirectory() as folder:
            for arguments in (
                ["scan"],
                ["scan", "--watch"],
                ["channels", "--json"],
                ["scan", "--sa-port", "1"],
                ["channels", "--sa-port", "1"],
                ["send", "1", "GET_RADIO"],
                ["listen", "1"],
            ):
                with self.subTest(arguments):
                    result = run_client(*arguments, VEXA_MACHINE=folder)
                    self.assertEqual(result.returncode, 1)
                    self.assertEqual(result.stdout, "")
                    self.assertEqual(len(result.stderr.splitlines()), 1, result.stderr)

    def test_ports_that_a_dead_parent_has_left_are_no_service(self):
        with Machine({"speed": 20}) as machine:
            machine.parent.process.kill()
            wait_until(lambda: run_client("channels", "--machine", machine.folder).returncode == 1, "the end")
            self.assertTrue((machine.folder / "ports.json").exists())
            self.assertIn(str(machine.sa_port), run_client("channels", "--machine", machine.folder).stderr)


if __name__ == "__main__":
    unittest.main()
