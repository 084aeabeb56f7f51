"""`vexa watch`, and watching the networks: what happens, in sentences, until a key, a signal or the time ends it."""

import json
import re
import signal

from client_networks import NETWORKS, REPORT, NetworkStory
from client_turns import LIST, NO_DATA, Peer, stored
from harness import Story, network, wait_until

LINE = re.compile(r"\d\d:\d\d:\d\d  (hotspot |spectrum)  \S.*")
CHANNELS = {"channels": [1, 6], "levels": {"1": {"congestion": 30, "power": 30}, "6": {"congestion": 60, "power": 60}}}


class WatchStory(NetworkStory):
    scenario = {"connectMs": 100, "networks": NETWORKS[:2], "spectrum": CHANNELS, "timeline": REPORT}

    def setUp(self):
        super().setUp()
        self.all_reported()

    def watch(self, *options):
        return self.running("watch", "--machine", self.machine.folder, *options)

    def started(self):
        """A watch that has told how things stand."""
        watch = self.watch()
        for told in ("hotspots in range", "the internet is", "spectrum  2 channels: 1 6"):
            watch.wait_line(told)
        return watch

    def assert_quiet_end(self, watch, number=signal.SIGINT):
        self.assertEqual((watch.stop(number), watch.errors), (128 + number, []))
        self.assertTrue(all(map(LINE.fullmatch, watch.lines)), watch.lines)


class Telling(WatchStory):
    def test_the_life_of_a_connection(self):
        watch = self.started()
        told = [line[20:] for line in watch.lines if line[10:].startswith("hotspot   ")]
        expected = ["the adapter is in", "the radio is on", "0 credentials stored"]
        self.assertEqual(told[:4], [*expected, 'hotspots in range: "Airport Free", "Café"'])
        self.add_user("Roam", realm="roam.example")
        watch.wait_line('credential 1 "Roam" was added')
        watch.wait_line('joined "Airport Free" with the credential "Roam"')
        self.done("disconnect")
        watch.wait_line('the connection to "Airport Free" has ended')
        self.control.do("setNetwork", bssid=NETWORKS[0]["bssid"], accepts=[])
        self.vexa("connect", "Airport Free")
        watch.wait_line("an attempt to connect has failed")
        self.assert_quiet_end(watch)

    def test_the_air_the_radio_and_the_adapter(self):
        watch = self.started()
        gate = network(9, "Gate", {})
        self.control.do("addNetwork", network=gate)
        self.control.do("reportNetworks")
        watch.wait_line('"Gate" is in range; realms: none')
        self.hide(gate["bssid"])
        watch.wait_line('"Gate" is out of range')
        self.done("scan")
        watch.wait_line("spectrum  channel 6: congestion 60")
        self.control.do("driverState", current=3, previous=1)
        watch.wait_line("the hotspot module went from state 1 to 3")
        self.control.do("radio", software="off")
        watch.wait_line("the radio is off")
        watch.wait_line("spectrum  radio off")
        self.done("disable")
        watch.wait_line("hotspot networks are disabled")
        self.control.do("pullAdapter")
        watch.wait_line("the adapter is out")
        self.control.do("insertAdapter")
        watch.wait_line("hotspot   the adapter is in", count=2)
        self.assert_quiet_end(watch, signal.SIGTERM)

    def test_json_is_each_event_of_both_ports(self):
        def sources():
            return {json.loads(line)["Source"] for line in list(watch.lines)}

        self.add_user("Roam", password="gEh31m")
        for options, told in (((), "********"), (("--show-passwords",), "gEh31m")):
            watch = self.watch("--json", *options)
            wait_until(lambda: sources() == {"HotSpot20", "SpectralAnalyser"}, "both")
            self.assertIn(f'\\"Password\\":\\"{told}\\"', watch.wait_line(LIST).replace(" : ", ":"))
            self.assertEqual((watch.stop(signal.SIGINT), watch.errors), (130, []))


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


def networks(*texts):
    """As the service lists them: one with a star is the connected one, one with a colon tells its realm."""
    entries = []
    for name, _, realm in (text.partition(":") for text in texts):
        realms = {"RealmFetched": True, "SupportRealmList": [{"CredentialEapMethod": 1, "RealmName": realm}]}
        entries.append({"NetWorkName": name[0], "IsConnected": "*" in name, **(realms if realm else {})})
    return "GET_ALL_NETWORK_LIST", entries


TWO = [entry | {"RealName": "r"} for entry in stored("One", "Two")]
RESULT, MODULE, NONE_OF_OURS = "CONNECT_DISCONNECT", "SUPPLICANT_STATE_CHANGE", ", with no credential of ours"
# Events as they follow each other, each with the sentences that it is worth.
STORIES = {
    "what is new in a list": [
        ((LIST, TWO[:1]), "1 credential stored"),
        (networks("A", "B"), 'hotspots in range: "A", "B"'),
        (networks("A", "B"),),
        (networks("A:r", "B"), 'realms of "A": r (TLS)'),
        (networks("A*:r", "B"), 'joined "A" with the credential "One"'),
        (networks("B*", "C:x"), 'the connection to "A" has ended', '"A" is out of range',
         '"C" is in range; realms: x (TLS)', f'joined "B"{NONE_OF_OURS}'),
        (networks(), 'the connection to "B" has ended', '"B" is out of range', '"C" is out of range'),
    ],
    "what is hidden in a name": [(networks("\u202e", "\u200b"), 'hotspots in range: "\\u202e", "\\u200b"')],
    "a connection that was there is not joined": [
        ((LIST, TWO), "2 credentials stored"),
        (networks("A*:r"), 'hotspots in range: "A"', 'connected to "A" with the credential "One" or "Two"'),
    ],
    "a success is told by the list that follows": [
        (networks("A"), 'hotspots in range: "A"'),
        ((RESULT, 1),),
        (networks("A"), "the system has tried a connection of its own"),
        (networks("A"),),
        ((RESULT, 0), "an attempt to connect has failed"),
        (networks("A"),),
        ((RESULT, 1),),
        (networks("A*"), f'joined "A"{NONE_OF_OURS}'),
    ],
    "what is told twice is said once": [
        (("CARD_PLUG_IN", ""), "the adapter is in"),
        (("CARD_PLUG_IN", ""),),
        (("CARD_PLUG_OUT", ""), "the adapter is out"),
        (("CARD_PLUG_OUT", ""),),
        (("GET_RADIO", True), "the radio is on"),
        (("GET_RADIO", True),),
        (("GET_RADIO", False), "the radio is off"),
        (("GET_RADIO", 7),),
        (("GET_IS_INTERNET_ACCESS", False), "the internet is not reached"),
        (("GET_IS_INTERNET_ACCESS", True), "the internet is reached"),
        (("CARD_PLUG_IN", ""), "the adapter is in"),
    ],
    "credentials, and anything else as it is": [
        ((LIST, None), "0 credentials stored"),
        ((LIST, stored("A")), 'credential 1 "A" was added'),
        ((LIST, stored("B")), 'credential 1 "B" was changed'),
        ((LIST, stored("B")),),
        ((LIST, None), 'credential 1 "B" was deleted'),
        (("DETECTED_HOTSPOT", None), "new hotspots were detected"),
        (("SET_HOTSPOT_AUTO_CONNECT", False), "hotspot networks are disabled"),
        ((MODULE, {"PreviousState": 1, "CurrentState": 3}), "the hotspot module went from state 1 to 3"),
        ((MODULE, 7),),
        (("SOMETHING", NO_DATA), "SOMETHING"),
        (("SOMETHING", {"a": 1}), 'SOMETHING {"a":1}'),
        (("GET_ALL_NETWORK_LIST", "{"), "hotspots in range: none"),
    ],
}  # fmt: skip


class Sentences(Story):
    def test_what_each_event_is_worth(self):
        for what, story in STORIES.items():
            events, sentences = [event for event, *_ in story], [told for _, *all_told in story for told in all_told]
            # Behind each result, and when an adapter comes back.
            asked = ["GET_ALL_NETWORK_LIST"] * sum(event == RESULT for event, _ in events)
            asked += [LIST, "GET_ALL_NETWORK_LIST"] * (sentences.count("the adapter is in") - 1)

            def answer(command, events=events):  # all of them behind the last of the first questions
                return events if command["CommandId"] == "GET_IS_INTERNET_ACCESS" else []

            with self.subTest(what), Peer(answer) as peer, Peer(lambda _: []) as silent:
                watch = self.running("watch", "--hs20-port", peer.port, "--sa-port", silent.port)
                watch.wait_line(sentences[-1], count=sentences.count(sentences[-1]))
                wait_until(lambda: len(peer.commands) >= 5 + len(asked), "the questions")
                self.assertEqual((watch.stop(signal.SIGINT), watch.errors), (130, []))
                self.assertEqual([line[20:] for line in watch.lines], sentences)
                self.assertEqual(peer.commands[5:], asked)
