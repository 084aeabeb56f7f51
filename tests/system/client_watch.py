"""`vexa watch`, and watching the networks: what happens, in sentences, until a key, a signal or the time ends it."""

import json
import re
import signal
import unittest

from client_credentials import run_client
from client_demo import Terminal
from client_networks import NETWORKS, NetworksTest
from harness import Program, clean_environment, program, wait_until

LINE = re.compile(r"\d\d:\d\d:\d\d  (hotspot |spectrum)  (\S.*)")
CHANNELS = {"channels": [1, 6], "levels": {"1": {"congestion": 30, "power": 30}, "6": {"congestion": 60, "power": 60}}}


class WatchTest(NetworksTest):
    scenario = {
        "speed": 20,
        "connectMs": 100,
        "networks": NETWORKS[:2],
        "spectrum": CHANNELS,
        "timeline": [{"atMs": 1, "do": "reportNetworks"}],
    }

    def watch(self, *options):
        watch = Program([program("vexa"), "watch", "--machine", str(self.machine.folder), *options])
        self.addCleanup(watch.end)
        return watch

    def sentences(self, watch, half):
        matches = [LINE.fullmatch(line) for line in list(watch.lines)]
        self.assertTrue(all(matches), watch.lines)
        return [match[2] for match in matches if match[1].strip() == half]

    def wait_told(self, watch, *parts, half="hotspot"):
        for part in parts:
            wait_until(lambda: any(part in told for told in self.sentences(watch, half)), f"{part!r}; {watch.lines}")

    def started(self, *options):
        """A watch that has told how things stand."""
        watch = self.watch(*options)
        self.wait_told(watch, "hotspots in range", "the internet is")
        self.wait_told(watch, "channels: 1 6", half="spectrum")
        return watch

    def assert_quiet_end(self, watch, number=signal.SIGINT):
        self.assertEqual(watch.stop(number), 0)
        self.assertEqual(watch.errors, [])


class Telling(WatchTest):
    def test_how_things_stand_first(self):
        wait_until(lambda: len(self.networks()) == 2 or self.machine.control.do("reportNetworks"), "the networks")
        watch = self.started()
        told = self.sentences(watch, "hotspot")
        self.assertEqual(told[:4], ["the adapter is in", "the radio is on", "0 credentials stored",
                                    'hotspots in range: "Airport Free", "Café"'])  # fmt: skip
        self.assert_quiet_end(watch)

    def test_the_life_of_a_connection(self):
        watch = self.started()
        self.add_user("Roam", realm="roam.example")
        self.wait_told(watch, 'credential 1 "Roam" was added', 'joined "Airport Free" with the credential "Roam"')
        self.done("disconnect")
        self.wait_told(watch, 'the connection to "Airport Free" has ended')
        self.machine.control.do("setNetwork", bssid=NETWORKS[0]["bssid"], accepts=[])
        self.vexa("connect", "Airport Free")
        self.wait_told(watch, "an attempt to connect has failed")
        self.assert_quiet_end(watch)

    def test_the_air_the_radio_and_the_adapter(self):
        watch = self.started()
        control = self.machine.control
        control.do("addNetwork", network={"bssid": "02:00:00:00:00:09", "ssid": "Gate", "realms": []})
        control.do("reportNetworks")
        self.wait_told(watch, '"Gate" is in range; realms: none')
        control.do("hide", bssid="02:00:00:00:00:09")
        control.do("reportNetworks")
        self.wait_told(watch, '"Gate" is out of range')
        control.do("driverState", current=3, previous=1)
        self.wait_told(watch, "the hotspot module went from state 1 to 3")
        control.do("radio", software="off")
        self.wait_told(watch, "the radio is off")
        self.wait_told(watch, "radio off", half="spectrum")
        self.done("disable")
        self.wait_told(watch, "hotspot networks are disabled")
        control.do("pullAdapter")
        self.wait_told(watch, "the adapter is out")
        control.do("insertAdapter")
        wait_until(lambda: self.sentences(watch, "hotspot").count("the adapter is in") == 2, "its return")
        self.assert_quiet_end(watch, signal.SIGTERM)

    def test_what_another_scan_measures(self):
        watch = self.started()
        self.done("scan")
        self.wait_told(watch, "channel 6: congestion 60", half="spectrum")
        self.assert_quiet_end(watch)

    def test_credentials_that_change(self):
        watch = self.started()
        self.add_user("A")
        self.add_user("B")
        self.done("credential", "move", "B", "2")
        self.wait_told(watch, "the credentials have another order of priority")
        self.done("credential", "edit", "A", "--name", "C")
        self.wait_told(watch, 'credential 1 "C" was changed')
        self.done("credential", "delete", "C")
        self.wait_told(watch, 'credential 1 "C" was deleted')
        self.assert_quiet_end(watch)

    def test_json_is_each_event_of_both_ports(self):
        watch = self.watch("--json")
        wait_until(lambda: {json.loads(line)["Source"] for line in list(watch.lines)} == {"HotSpot20", "SpectralAnalyser"}, "both")
        self.assert_quiet_end(watch)


class Ending(WatchTest):
    def test_the_time(self):
        watch = self.watch("--for", "1")
        self.assertEqual(watch.wait(), 0)
        self.assertTrue(watch.lines)

    def test_a_service_that_goes(self):
        watch = self.started()
        self.machine.stop()
        self.assertEqual(watch.wait(), 1)
        self.assertEqual(watch.errors, ["vexa: the service has closed the connection"])

    def test_without_a_service(self):
        result = run_client("watch", VEXA_MACHINE="/nonexistent")
        self.assertEqual(result.returncode, 1)
        self.assertIn("no service runs", result.stderr)

    def test_q_in_a_terminal(self):
        for command, pattern in ((["watch"], b"hotspots in range"), (["networks", "--watch"], b"Network|No hotspot")):
            with self.subTest(command):
                arguments = [program("vexa"), *command, "--machine", str(self.machine.folder)]
                terminal = Terminal(arguments, clean_environment(TERM="xterm", LC_ALL="C.UTF-8"))
                self.addCleanup(terminal.close)
                terminal.read_until(pattern)
                wait_until(lambda: terminal.settings() != terminal.before, "keys without echo")
                terminal.press(b"x")
                terminal.press(b"q")
                self.assertEqual(terminal.finish(), 0)
                self.assertEqual(terminal.settings(), terminal.before)

    def test_a_stopped_one_gives_the_terminal_back(self):
        arguments = [program("vexa"), "watch", "--machine", str(self.machine.folder)]
        terminal = Terminal(arguments, clean_environment(TERM="xterm"))
        self.addCleanup(terminal.close)
        terminal.read_until(b"hotspots in range")
        wait_until(lambda: terminal.settings() != terminal.before, "keys without echo")
        terminal.press(b"\x1a")
        wait_until(lambda: terminal.settings() == terminal.before, "the terminal as before")
        terminal.process.send_signal(signal.SIGCONT)
        wait_until(lambda: terminal.settings() != terminal.before, "keys again")
        terminal.press(b"q")
        self.assertEqual(terminal.finish(), 0)


if __name__ == "__main__":
    unittest.main()
