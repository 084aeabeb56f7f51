"""`vexa watch`, and watching the networks: what happens, in sentences, until a key, a signal or the time ends it."""

import json
import re
import signal

from client_networks import NETWORKS, REPORT, NetworkStory
from harness import network, wait_until

LINE = re.compile(r"\d\d:\d\d:\d\d  (hotspot |spectrum)  (\S.*)")
CHANNELS = {"channels": [1, 6], "levels": {"1": {"congestion": 30, "power": 30}, "6": {"congestion": 60, "power": 60}}}


class WatchStory(NetworkStory):
    scenario = {"connectMs": 100, "networks": NETWORKS[:2], "spectrum": CHANNELS, "timeline": REPORT}

    def setUp(self):
        super().setUp()
        self.all_reported()

    def watch(self, *options):
        return self.running("watch", "--machine", self.machine.folder, *options)

    def sentences(self, watch, half="hotspot"):
        matches = [LINE.fullmatch(line) for line in list(watch.lines)]
        self.assertTrue(all(matches), watch.lines)
        return [match[2] for match in matches if match[1].strip() == half]

    def wait_told(self, watch, *parts, half="hotspot"):
        for part in parts:
            wait_until(lambda: any(part in told for told in self.sentences(watch, half)), f"{part!r}; {watch.lines}")

    def started(self):
        """A watch that has told how things stand."""
        watch = self.watch()
        self.wait_told(watch, "hotspots in range", "the internet is")
        self.wait_told(watch, "channels: 1 6", half="spectrum")
        return watch

    def assert_quiet_end(self, watch, number=signal.SIGINT):
        self.assertEqual((watch.stop(number), watch.errors), (0, []))


class Telling(WatchStory):
    def test_the_life_of_a_connection(self):
        watch = self.started()
        self.assertEqual(self.sentences(watch)[:4], ["the adapter is in", "the radio is on", "0 credentials stored",
                                                     'hotspots in range: "Airport Free", "Café"'])  # fmt: skip
        self.add_user("Roam", realm="roam.example")
        self.wait_told(watch, 'credential 1 "Roam" was added', 'joined "Airport Free" with the credential "Roam"')
        self.done("disconnect")
        self.wait_told(watch, 'the connection to "Airport Free" has ended')
        self.control.do("setNetwork", bssid=NETWORKS[0]["bssid"], accepts=[])
        self.vexa("connect", "Airport Free")
        self.wait_told(watch, "an attempt to connect has failed")
        self.assert_quiet_end(watch)

    def test_the_air_the_radio_and_the_adapter(self):
        watch = self.started()
        gate = network(9, "Gate", {})
        self.control.do("addNetwork", network=gate)
        self.control.do("reportNetworks")
        self.wait_told(watch, '"Gate" is in range; realms: none')
        self.hide(gate["bssid"])
        self.wait_told(watch, '"Gate" is out of range')
        self.done("scan")
        self.wait_told(watch, "channel 6: congestion 60", half="spectrum")
        self.control.do("driverState", current=3, previous=1)
        self.wait_told(watch, "the hotspot module went from state 1 to 3")
        self.control.do("radio", software="off")
        self.wait_told(watch, "the radio is off")
        self.wait_told(watch, "radio off", half="spectrum")
        self.done("disable")
        self.wait_told(watch, "hotspot networks are disabled")
        self.control.do("pullAdapter")
        self.wait_told(watch, "the adapter is out")
        self.control.do("insertAdapter")
        wait_until(lambda: self.sentences(watch).count("the adapter is in") == 2, "its return")
        self.assert_quiet_end(watch, signal.SIGTERM)

    def test_json_is_each_event_of_both_ports(self):
        watch = self.watch("--json")

        def sources():
            return {json.loads(line)["Source"] for line in list(watch.lines)}

        wait_until(lambda: sources() == {"HotSpot20", "SpectralAnalyser"}, "both")
        self.assert_quiet_end(watch)


class Ending(WatchStory):
    def test_the_time_or_a_service_that_goes(self):
        watch = self.watch("--for", "1")
        self.assertEqual(watch.wait(), 0)
        self.assertTrue(watch.lines)
        watch = self.started()
        self.machine.stop()
        self.assertEqual((watch.wait(), watch.errors), (1, ["vexa: the service has closed the connection"]))

    def test_in_a_terminal_q_ends_it_and_stopping_it_gives_the_terminal_back(self):
        for command, pattern in (("watch", b"hotspots in range"), ("networks --watch", b"Network|No hotspot")):
            with self.subTest(command):
                terminal = self.terminal(*command.split(), "--machine", self.machine.folder)
                terminal.read_until(pattern)
                wait_until(lambda: terminal.settings() != terminal.before, "keys without echo")
                terminal.suspend_and_resume()
                terminal.press(b"x")
                terminal.press(b"q")
                self.assertEqual((terminal.finish(), terminal.settings()), (0, terminal.before))
