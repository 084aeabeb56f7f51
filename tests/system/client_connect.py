"""`vexa connect` and `vexa disconnect`: what was asked for, and what has come of it."""

import signal

from client_networks import ANNA, REPORT, NetworkStory
from harness import network, wait_until

ACCEPTS = [{**ANNA, "password": "secret"}, {"eapMethod": 13, "authMode": "machine"}]
CAFE = network(1, "Café", {"cafe.example": [21, 13]}, accepts=ACCEPTS)
HALL = network(2, "Hall", {"hall.example": [21]}, accepts=[ANNA])
MANUAL = "--no-auto-connect"
# Of the machine: long enough to act in the meantime, short enough to wait for.
SLOW_MS = 20000


class ConnectStory(NetworkStory):
    scenario = {"connectMs": 1000, "networks": [CAFE, HALL], "timeline": REPORT}

    def setUp(self):
        super().setUp()
        self.all_reported()

    def pocket(self, *options, realm="cafe.example", password="secret"):
        self.add_user("Pocket", *options, realm=realm, password=password)

    def card(self):
        self.add_certificate("Card", MANUAL, realm="cafe.example")

    def requests(self):
        return len(self.control.calls("WlanConnect"))

    def slowly(self):
        self.control.do("set", connectMs=SLOW_MS)

    def attempt(self, milliseconds=3600000):
        """`vexa connect` in the middle of an attempt that does not end by itself, or takes so long."""
        self.control.do("set", connectMs=milliseconds)
        before = self.requests()
        joining = self.running("connect", "Café", "--machine", self.machine.folder)
        wait_until(lambda: self.requests() > before, f"the attempt; {joining.lines} {joining.errors}")
        return joining


class Joining(ConnectStory):
    def test_the_credential_and_the_internet_are_told(self):
        self.pocket(MANUAL)
        self.assertEqual(self.done("connect", "Café"), 'Connected to "Café" with the credential "Pocket".\n')
        self.assertEqual(self.control.connected(), "Café")
        self.assertEqual(self.done("connect", "Café"), 'Already connected to "Café" with the credential "Pocket".\n')
        self.control.do("setDns", dns=[])
        told = {"credentials": ["Pocket"], "done": "connected", "internet": False, "network": "Café"}
        self.assertEqual(self.told("connect", "Café"), told)
        self.assertIn("does not reach the internet", self.done("connect", "Café"))

    def test_a_certificate_is_told_apart_by_its_method(self):
        self.pocket(MANUAL, password="wrong")
        self.card()
        self.assertIn('with the credential "Card"', self.done("connect", "Café"))
        self.assertEqual(self.status()["credential"], "Card")

    def test_the_next_credential_is_tried(self):
        self.pocket(MANUAL)
        self.card()
        self.control.do("setNetwork", bssid=CAFE["bssid"], accepts=ACCEPTS[:1])
        before = self.requests()
        self.assertIn('with the credential "Pocket"', self.done("connect", "Café"))
        self.assertEqual(self.requests() - before, 3, "the user's certificate, the machine's, the password")

    def test_going_over_from_another_network(self):
        self.pocket()
        self.control.wait_connected("Café")
        self.add_user("Hall", realm="hall.example")
        self.assertIn('Connected to "Hall"', self.done("connect", "Hall"))
        self.assertEqual(self.control.connected(), "Hall")

    def test_behind_an_attempt_that_runs(self):
        self.slowly()
        self.pocket(password="wrong")
        wait_until(self.requests, "the service's own attempt")
        self.add_user("Hall", MANUAL, realm="hall.example")
        self.assertIn('Connected to "Hall"', self.done("connect", "Hall"))

    def test_without_waiting(self):
        self.slowly()
        self.pocket(MANUAL)
        self.assertEqual(self.done("connect", "Café", "--no-wait"), 'The service was asked to join "Café".\n')
        self.assertEqual(self.requests(), 1)
        self.control.wait_connected("Café")

    def test_a_name_that_can_not_be_typed(self):
        self.control.do("addNetwork", network=network(3, "\u202eH", {"cafe.example": [21]}, accepts=ACCEPTS))
        self.control.do("reportNetworks")
        self.pocket(MANUAL)
        for command, words in (("networks", ""), ("connect", "Connected to"), ("disconnect", "Left")):
            told = self.done(command, *(["\\u202eH"] if words else []))
            self.assertTrue(words in told and "\\u202eH" in told and "\u202e" not in told, told)
        self.assertIn('"network":"\\u202eH"', self.done("connect", "\\u202eH", "--json"))

    def test_a_profile_of_the_system(self):
        self.control.do("setNetwork", bssid=HALL["bssid"], osProfile=True)
        self.control.do("reportNetworks")
        self.assertIn('Connected to "Hall", with no credential of ours', self.done("connect", "Hall", "--anyway"))
        self.assertEqual(self.status()["possibleCredentials"], [])
        self.assertRegex(self.done("status"), r"Credential +none of ours")


class NotJoining(ConnectStory):
    def test_the_network_or_the_credential(self):
        self.assertEqual(
            self.refused(1, "connect", "Hell"), 'vexa: no network "Hell" is in range; there is "Hall", "Café"'
        )
        self.pocket(MANUAL, realm="other.example")
        anyway = self.refused(1, "connect", "Hall", "--anyway", "--timeout", "1")
        self.assertIn('no stored credential fits "Hall", and the system did not join it', anyway)
        self.done("credential", "edit", "Pocket", "--realm", "hall.example")
        self.control.do("setNetwork", bssid=HALL["bssid"], accepts=[])
        self.assertEqual(self.refused(1, "connect", "Hall"), 'vexa: could not join "Hall" with "Pocket"')

    def test_a_connection_ends_only_for_one_that_has_a_chance(self):
        self.control.do("addNetwork", network=network(3, "Later", {}, anqp="never"))
        self.control.do("addNetwork", network=network(4, "Umlaut", {"ä.example": [21]}))
        wait_until(lambda: self.control.do("reportNetworks") or len(self.networks()) == 4, "both")
        self.pocket(MANUAL)
        self.add_user("Umlaut", MANUAL, realm="ä.example")
        self.done("connect", "Café")
        before = self.requests()
        for name, told in (
            ("Hall", 'no stored credential fits "Hall": with --anyway the system is asked to join it by itself'),
            ("Umlaut", 'no stored credential fits "Umlaut": with --anyway the system is asked to join it by itself'),
            ("Later", 'the realms of "Later" are not known yet'),
        ):
            self.assertEqual(self.refused(1, "connect", name), f"vexa: {told}")
        self.assertEqual((self.requests(), self.control.connected()), (before, "Café"))
        self.add_user("Hall", MANUAL, realm="hall.example", password="wrong")
        self.control.do("setNetwork", bssid=HALL["bssid"], accepts=[])
        told = 'vexa: could not join "Hall" with "Hall"; the connection to "Café" has ended'
        self.assertEqual(self.refused(1, "connect", "Hall"), told)

    def test_what_keeps_it_from_the_start(self):
        self.done("disable")
        self.assertIn("hotspot networks are disabled", self.refused(1, "connect", "Hall"))
        self.control.do("radio", software="off")
        for command in ("connect Hall", "disconnect", "disconnect Hall"):
            self.assertEqual(self.refused(1, *command.split()), "vexa: the radio is off")
        self.control.do("pullAdapter")
        for command in ("connect Hall", "disconnect"):
            self.assertEqual(self.refused(1, *command.split()), "vexa: no adapter is in")

    def test_what_ends_the_waiting(self):
        endings = {
            'vexa: "Café": the radio was turned off': lambda _: self.control.do("radio", software="off"),
            # Told alone: that a removal ends the attempt could be told first.
            'vexa: "Café": the adapter was taken out': lambda _: self.control.do("notify", source=8, code=14),
            "vexa: not waited for: the service goes on with it": lambda joining: joining.stop(signal.SIGINT),
            "vexa: the service has closed the connection": lambda _: self.machine.stop(),
        }
        for told, end in endings.items():
            with self.subTest(told):
                self.start(**self.scenario)
                self.all_reported()
                self.pocket(MANUAL)
                joining = self.attempt()
                end(joining)
                code = 130 if "not waited for" in told else 1
                self.assertEqual((joining.wait(), joining.lines, joining.errors), (code, [], [told]))

    def test_another_request_takes_its_place(self):
        self.pocket(MANUAL)
        self.add_user("Hall", MANUAL, realm="hall.example")
        joining = self.attempt(SLOW_MS)
        self.control.do("set", connectMs=100)
        self.done("connect", "Hall", "--no-wait")
        self.assertEqual((joining.wait(), joining.lines), (1, []))
        self.assertEqual(joining.errors, ['vexa: "Café": another network was joined instead'])

    def test_who_looks_on_is_told_what_is_waited_for(self):
        self.pocket(MANUAL)
        self.control.do("set", connectMs=3600000)
        terminal = self.terminal("connect", "Café", "--machine", self.machine.folder)
        terminal.read_until('vexa: waiting for "Café" to be joined; Ctrl-C ends it'.encode())
        terminal.press(b"\x03")
        self.assertEqual(terminal.finish(), 130)

    def test_too_slow(self):
        self.pocket(MANUAL)
        self.control.do("set", connectMs=3600000)
        self.assertEqual(self.refused(1, "connect", "Café", "--timeout", "1"), 'vexa: "Café" was not joined within 1 s')


class Leaving(ConnectStory):
    def connect(self):
        self.pocket()
        wait_until(lambda: self.status()["connection"] == "Café", "the connection")

    def test_leaving_and_coming_back(self):
        self.connect()
        left = 'Left "Café"; the service stays away from it until you connect to it.\n'
        self.assertEqual(self.done("disconnect"), left)
        self.assertIsNone(self.control.connected())
        self.assertIn('Connected to "Café"', self.done("connect", "Café"))
        self.assertEqual(self.told("disconnect", "Café"), {"done": "disconnected", "network": "Café"})

    def test_nothing_to_leave(self):
        self.assertEqual(self.refused(1, "disconnect"), "vexa: no hotspot network is connected")
        hall = ["disconnect", "Hall", "--timeout", "1"]
        self.assertEqual(self.refused(1, *hall), 'vexa: "Hall" is not connected')
        self.connect()
        self.assertEqual(self.refused(1, *hall), 'vexa: "Hall" is not connected: "Café" is')
        self.assertEqual(self.control.connected(), "Café")

    def test_an_attempt_is_ended_too(self):
        self.pocket(MANUAL)
        joining = self.attempt()
        self.assertIn('Ended the attempt to join "Café"', self.done("disconnect", "Café"))
        self.assertEqual(joining.wait(), 1)
        self.assertRegex("\n".join(joining.lines + joining.errors), r'\A.*could not join "Café".*\Z')

    def test_one_that_does_not_end(self):
        self.connect()
        self.control.do("fail", call="WlanDisconnect", error=31)
        self.assertEqual(self.refused(1, "disconnect", "--timeout", "1"), 'vexa: "Café" was not left within 1 s')
        self.assertEqual(self.done("disconnect", "--no-wait"), 'The service was asked to leave "Café".\n')
        wait_until(lambda: self.control.connected() is None, "the end")
