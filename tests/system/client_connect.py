"""`vexa connect` and `vexa disconnect`: what was asked for, and what has come of it."""

import json
import signal
import unittest

from client_credentials import run_client
from client_networks import NetworksTest
from client_turns import Peer
from harness import Program, program, wait_until

CAFE = {
    "bssid": "02:00:00:00:00:01",
    "ssid": "Café",
    "realms": [{"names": ["cafe.example"], "eapMethods": [21, 13]}],
    "accepts": [{"eapMethod": 21, "username": "anna", "password": "secret"}, {"eapMethod": 13, "authMode": "machine"}],
}
HALL = {
    "bssid": "02:00:00:00:00:02",
    "ssid": "Hall",
    "realms": [{"names": ["hall.example"], "eapMethods": [21]}],
    "accepts": [{"eapMethod": 21, "username": "anna"}],
}
REPORT = [{"atMs": 1, "do": "reportNetworks"}]
MANUAL = "--no-auto-connect"
# Of the machine: long enough to act in the meantime, short enough to wait for.
SLOW_MS = 20000


class ConnectTest(NetworksTest):
    scenario = {"speed": 20, "connectMs": 1000, "networks": [CAFE, HALL], "timeline": REPORT}

    def ready(self, count=2):
        wait_until(lambda: len(self.networks()) == count or self.machine.control.do("reportNetworks"), "the networks")

    def joined(self):
        state = self.machine.control.query("interface")
        return state["ssid"] if state["state"] == "connected" else None

    def requests(self, call="WlanConnect"):
        return len([c for c in self.machine.control.query("calls") if c["call"] == call])

    def command(self, *arguments):
        running = Program([program("vexa"), *arguments, "--machine", str(self.machine.folder)])
        self.addCleanup(running.end)
        return running

    def assert_ended(self, running, exit_code, sentence):
        self.assertEqual(running.wait(), exit_code, running.errors)
        (line,) = running.lines + running.errors
        self.assertRegex(line, sentence)

    def slowly(self):
        self.machine.control.do("set", connectMs=SLOW_MS)


class Joining(ConnectTest):
    def test_the_credential_and_the_internet_are_told(self):
        self.ready()
        self.add_user("Pocket", MANUAL, realm="cafe.example")
        self.assertEqual(self.done("connect", "Café"), 'Connected to "Café" with the credential "Pocket".\n')
        self.assertEqual(self.joined(), "Café")
        self.assertEqual(self.done("connect", "Café"), 'Already connected to "Café" with the credential "Pocket".\n')
        self.machine.control.do("setDns", dns=[])
        told = json.loads(self.done("connect", "Café", "--json"))
        self.assertEqual(told, {"credentials": ["Pocket"], "done": "connected", "internet": False, "network": "Café"})
        self.assertIn("does not reach the internet", self.done("connect", "Café"))

    def test_a_certificate_is_told_apart_by_its_method(self):
        self.ready()
        self.add_user("Pocket", MANUAL, realm="cafe.example", password="wrong")
        arguments = ["--name", "Card", "--realm", "cafe.example", "--method", "tls", "--client-cert", "Anna", MANUAL]
        self.done("credential", "add", *arguments)
        self.assertIn('with the credential "Card"', self.done("connect", "Café"))
        self.assertEqual(self.status()["credential"], "Card")

    def test_the_next_credential_is_tried(self):
        self.ready()
        self.add_user("Right", MANUAL, realm="cafe.example")
        arguments = ["--name", "Card", "--realm", "cafe.example", "--method", "tls", "--client-cert", "Anna", MANUAL]
        self.done("credential", "add", *arguments)
        self.machine.control.do("setNetwork", bssid=CAFE["bssid"], accepts=CAFE["accepts"][:1])
        before = self.requests()
        self.assertIn('with the credential "Right"', self.done("connect", "Café"))
        self.assertEqual(self.requests() - before, 3, "the user's certificate, the machine's, the password")

    def test_going_over_from_another_network(self):
        self.ready()
        self.add_user("Pocket", realm="cafe.example")
        wait_until(lambda: self.status()["connection"] == "Café", "the first network")
        self.add_user("Hall", realm="hall.example")
        self.assertIn('Connected to "Hall"', self.done("connect", "Hall"))
        self.assertEqual(self.joined(), "Hall")

    def test_behind_an_attempt_that_runs(self):
        self.ready()
        self.slowly()
        self.add_user("Pocket", realm="cafe.example", password="wrong")
        wait_until(self.requests, "the service's own attempt")
        self.add_user("Hall", MANUAL, realm="hall.example")
        self.assertIn('Connected to "Hall"', self.done("connect", "Hall"))

    def test_without_waiting(self):
        self.ready()
        self.slowly()
        self.add_user("Pocket", MANUAL, realm="cafe.example")
        self.assertEqual(self.done("connect", "Café", "--no-wait"), 'The service was asked to join "Café".\n')
        self.assertEqual(self.requests(), 1)
        wait_until(lambda: self.joined() == "Café", "the connection")

    def test_a_profile_of_the_system(self):
        self.machine.control.do("setNetwork", bssid=HALL["bssid"], osProfile=True)
        self.ready()
        self.assertIn('Connected to "Hall", with no credential of ours', self.done("connect", "Hall"))
        self.assertEqual(self.status()["possibleCredentials"], [])
        self.assertRegex(self.done("status"), r"Credential +none of ours")


class NotJoining(ConnectTest):
    def test_refused(self):
        self.ready()
        self.add_user("Pocket", MANUAL, realm="hall.example", password="x")
        self.machine.control.do("setNetwork", bssid=HALL["bssid"], accepts=[])
        self.assertEqual(self.refused(1, "connect", "Hall"), 'vexa: could not join "Hall" with "Pocket"')

    def test_a_name_that_is_not_in_range(self):
        self.ready()
        self.assertEqual(self.refused(1, "connect", "Hell"), 'vexa: no network "Hell" is in range; there is "Café", "Hall"')

    def test_no_credential_that_fits(self):
        self.ready()
        self.add_user("Other", MANUAL, realm="other.example")
        self.assertIn('no stored credential fits "Hall"', self.refused(1, "connect", "Hall", "--timeout", "2"))

    def test_realms_that_are_not_known(self):
        self.machine.control.do("addNetwork", network={"bssid": "02:00:00:00:00:03", "ssid": "Later", "anqp": "never", "realms": []})
        self.machine.control.do("reportNetworks")
        self.assertIn('realms of "Later" are not known yet', self.refused(1, "connect", "Later", "--timeout", "1"))

    def test_what_keeps_it_from_the_start(self):
        self.ready()
        self.done("disable")
        self.assertIn("hotspot networks are disabled", self.refused(1, "connect", "Hall"))
        self.machine.control.do("radio", software="off")
        for command in (["connect", "Hall"], ["disconnect"], ["disconnect", "Hall"]):
            self.assertEqual(self.refused(1, *command), "vexa: the radio is off")
        self.machine.control.do("pullAdapter")
        for command in (["connect", "Hall"], ["disconnect"]):
            self.assertEqual(self.refused(1, *command), "vexa: no adapter is in")

    def test_what_ends_the_waiting(self):
        endings = {
            "the radio was turned off": lambda: self.machine.control.do("radio", software="off"),
            "the adapter was taken out": lambda: self.machine.control.do("pullAdapter"),
        }
        self.ready()
        self.add_user("Pocket", MANUAL, realm="cafe.example")
        for reason, end in endings.items():
            with self.subTest(reason):
                self.slowly()
                before = self.requests()
                joining = self.command("connect", "Café")
                wait_until(lambda: self.requests() > before, "the attempt")
                end()
                self.assert_ended(joining, 1, f'^vexa: "Café": {reason}$')
                self.machine.control.do("radio", software="on")

    def test_ctrl_c_says_that_the_service_goes_on(self):
        self.ready()
        self.slowly()
        self.add_user("Pocket", MANUAL, realm="cafe.example")
        joining = self.command("connect", "Café")
        wait_until(self.requests, "the attempt")
        self.assertEqual(joining.stop(signal.SIGINT), 1)
        self.assertEqual(joining.errors, ["vexa: not waited for: the service goes on with it"])

    def test_a_service_that_goes(self):
        self.ready()
        self.slowly()
        self.add_user("Pocket", MANUAL, realm="cafe.example")
        joining = self.command("connect", "Café")
        wait_until(self.requests, "the attempt")
        self.machine.stop()
        self.assert_ended(joining, 1, "the service has closed the connection")

    def test_too_slow(self):
        self.ready()
        self.slowly()
        self.add_user("Pocket", MANUAL, realm="cafe.example", password="wrong")
        self.machine.control.do("set", connectMs=3600000)
        self.assertEqual(self.refused(1, "connect", "Café", "--timeout", "1"), 'vexa: "Café" was not joined within 1 s')


class Leaving(ConnectTest):
    def connect(self):
        self.ready()
        self.add_user("Pocket", realm="cafe.example")
        wait_until(lambda: self.status()["connection"] == "Café", "the connection")

    def test_the_service_stays_away_until_it_is_asked(self):
        self.connect()
        left = 'Left "Café"; the service stays away from it until you connect to it.\n'
        self.assertEqual(self.done("disconnect"), left)
        self.assertIsNone(self.joined())
        began = self.machine.control.query("time")["ms"]
        before = self.requests()
        wait_until(lambda: self.machine.control.query("time")["ms"] > began + 30000, "half a minute of the machine")
        self.assertEqual(self.requests(), before)
        self.assertIn('Connected to "Café"', self.done("connect", "Café"))
        self.assertEqual(json.loads(self.done("disconnect", "Café", "--json")), {"done": "disconnected", "network": "Café"})

    def test_nothing_to_leave(self):
        self.ready()
        self.assertEqual(self.refused(1, "disconnect"), "vexa: no hotspot network is connected")
        self.assertEqual(self.refused(1, "disconnect", "Hall", "--timeout", "1"), 'vexa: "Hall" is not connected')
        self.connect()
        self.assertEqual(self.refused(1, "disconnect", "Hall", "--timeout", "1"), 'vexa: "Hall" is not connected: "Café" is')
        self.assertEqual(self.joined(), "Café")

    def test_an_attempt_is_ended_too(self):
        self.ready()
        self.slowly()
        self.add_user("Pocket", MANUAL, realm="cafe.example")
        joining = self.command("connect", "Café")
        wait_until(self.requests, "the attempt")
        self.assertIn('Ended the attempt to join "Café"', self.done("disconnect", "Café"))
        self.assert_ended(joining, 1, 'could not join "Café"')

    def test_without_waiting(self):
        self.connect()
        self.assertEqual(self.done("disconnect", "--no-wait"), 'The service was asked to leave "Café".\n')
        wait_until(lambda: self.joined() is None, "the end")

    def test_one_that_does_not_end(self):
        self.connect()
        self.machine.control.do("fail", call="WlanDisconnect", error=31, times=9)
        self.assertEqual(self.refused(1, "disconnect", "--timeout", "1"), 'vexa: "Café" was not left within 1 s')


def listed(connected, name="Café"):
    realms = [{"CredentialEapMethod": 2, "RealmName": "r"}]
    entry = {"NetWorkName": name, "IsConnected": connected, "RealmFetched": True, "SupportRealmList": realms}
    return ("GET_ALL_NETWORK_LIST", [entry])


CREDENTIAL = {
    "Id": 1, "Type": 1, "AccessType": 1, "CredentialEapMethod": 2, "AutoConnect": True, "CredentialName": "Pocket",
    "RealName": "r", "Creator": "", "CaCert": "", "ClientCert": "", "Username": "u", "Password": "p",
}  # fmt: skip


class ForeignEvents(unittest.TestCase):
    """A peer whose answers are chosen: what comes of a request when others' events are between."""

    def joining(self, after_connect, lists, *options, checks=()):
        lists, checks = iter(lists), iter(checks)

        def answer(command):
            name = command["CommandId"]
            if name == "GET_ALL_NETWORK_LIST":
                return [next(lists)]
            if name == "CONNECT_NETWORK":
                return after_connect
            known = {"GET_RADIO": True, "GET_IS_INTERNET_ACCESS": True, "GET_ALL_CREDENTIAL_LIST": [CREDENTIAL]}
            if name in known:
                return [(name, known[name])]
            in_use = "CONNECT_NETWORK" in peer.commands
            return [*(next(checks, []) if in_use else []), ("CARD_PLUG_IN", "")]

        peer = Peer(answer)
        self.addCleanup(peer.close)
        result = run_client("connect", "Café", "--hs20-port", peer.port, *options, VEXA_MACHINE="/nonexistent")
        return result.returncode, (result.stdout + result.stderr).strip()

    FAILED = [("CONNECT_DISCONNECT", 0), ("GET_IS_INTERNET_ACCESS", False)]
    DONE = [("CONNECT_DISCONNECT", 1), ("GET_IS_INTERNET_ACCESS", True)]

    def test_a_success_counts_when_the_list_shows_it(self):
        code, line = self.joining(self.DONE, [listed(False), listed(True)])
        self.assertEqual((code, line), (0, 'Connected to "Café" with the credential "Pocket".'))

    def test_a_success_of_another_does_not(self):
        code, line = self.joining(self.DONE, [listed(False)] * 9, "--timeout", "1")
        self.assertEqual((code, line), (1, 'vexa: "Café" was not joined within 1 s'))

    def test_a_failure_that_was_told_before_is_that_of_another(self):
        lists = [listed(False), listed(False), listed(True)]
        code, _ = self.joining(self.FAILED, lists, checks=[[], self.DONE])
        self.assertEqual(code, 0)

    def test_an_answer_without_a_report_is_that_to_our_request(self):
        code, line = self.joining([("CONNECT_DISCONNECT", 0)], [listed(False)] * 9)
        self.assertEqual((code, line), (1, 'vexa: the service could not begin to join "Café"'))

    def test_a_list_without_it_is_believed_when_it_lasts(self):
        code, line = self.joining([], [listed(False)] + [listed(False, "Hall")] * 9)
        self.assertEqual((code, line), (1, 'vexa: "Café" is out of range'))

    def test_a_connection_that_nothing_tells_of_is_believed_when_it_lasts(self):
        code, _ = self.joining([], [listed(False)] + [listed(True)] * 9)
        self.assertEqual(code, 0)


if __name__ == "__main__":
    unittest.main()
