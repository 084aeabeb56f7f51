"""`vexa networks`, `status`, `enable`, `disable` and `refresh` on a running service."""

import json
import signal
import unittest

from client_credentials import CredentialsTest, run_client
from harness import Machine, Program, program, wait_until

NETWORKS = [
    {
        "bssid": "02:00:00:00:00:01",
        "ssid": "Airport Free",
        "realms": [
            {"names": ["roam.example"], "eapMethods": [21]},
            {"names": ["corp.example"], "eapMethods": [13]},
        ],
        "accepts": [{"eapMethod": 21, "username": "anna"}],
    },
    {"bssid": "02:00:00:00:00:02", "ssid": "Café", "realms": [], "internetAccess": 0},
    {"bssid": "02:00:00:00:00:03", "ssid": "Later", "anqp": "never", "realms": []},
]
SCENARIO = {"speed": 20, "connectMs": 100, "networks": NETWORKS, "timeline": [{"atMs": 1, "do": "reportNetworks"}]}
ROAM = {"name": "roam.example", "method": "TTLS"}


class NetworksTest(CredentialsTest):
    scenario = SCENARIO

    def networks(self):
        return json.loads(self.done("networks", "--json"))

    def status(self):
        return json.loads(self.done("status", "--json"))

    def all_reported(self):
        def look():
            self.machine.control.do("reportNetworks")
            listed = self.networks()
            return listed if len(listed) == 3 and listed[0]["realms"] else None

        return wait_until(look, "all networks")

    def connected(self):
        """The name of the network that the service has joined by itself. One that never tells its realms keeps it
        from joining any, and is hidden first."""
        self.all_reported()
        self.machine.control.do("hide", bssid=NETWORKS[2]["bssid"])
        self.machine.control.do("reportNetworks")
        self.add_user("Roam", realm="roam.example")
        return wait_until(lambda: self.status()["connection"], "a connection")


class Looking(NetworksTest):
    def test_networks_are_listed_in_order_with_their_realms(self):
        first, second, third = self.all_reported()
        self.assertEqual([n["name"] for n in (first, second, third)], ["Airport Free", "Café", "Later"])
        self.assertIn(ROAM, first["realms"])
        self.assertIn({"name": "corp.example", "method": "TLS"}, first["realms"])
        self.assertEqual(second["realms"], [])
        self.assertIsNone(third["realms"])
        self.assertEqual([n["internet"] for n in (first, second)], ["offered", "none"])
        self.assertFalse(any(n["connected"] for n in (first, second, third)))

    def test_the_table_says_the_same(self):
        self.all_reported()
        heading, first, second, third = self.done("networks").splitlines()
        self.assertEqual(heading.split(), ["Network", "Connected", "Internet", "Realms"])
        self.assertRegex(first, r"^Airport Free  no +offered +.*roam\.example \(TTLS\)")
        self.assertRegex(second, r"^Café +no +none +none$")
        self.assertRegex(third, r"^Later +no +offered +not known yet$")

    def test_a_connection_shows(self):
        self.assertEqual(self.connected(), "Airport Free")
        (network,) = [n for n in self.networks() if n["connected"]]
        self.assertEqual((network["name"], network["internet"]), ("Airport Free", "reached"))
        wait_until(lambda: self.status()["credential"] == "Roam", "the credential's name")
        self.assertRegex(self.done("status"), r"Credential +Roam\n")
        self.assertTrue(self.status()["internet"])
        self.machine.control.do("setDns", dns=[])
        self.assertFalse(self.status()["internet"])
        self.assertEqual([n["internet"] for n in self.networks() if n["connected"]], ["missing"])

    def test_watching_tells_each_list_that_differs(self):
        self.all_reported()
        watch = Program([program("vexa"), "networks", "--watch", "--json", "--machine", str(self.machine.folder)])
        self.addCleanup(watch.end)
        wait_until(lambda: watch.lines, "the first list")
        self.machine.control.do("reportNetworks")
        self.machine.control.do("hide", bssid=NETWORKS[1]["bssid"])
        self.machine.control.do("reportNetworks")
        wait_until(lambda: len(watch.lines) > 1, "the next list")
        names = [[n["name"] for n in json.loads(line)] for line in watch.lines]
        self.assertEqual(names, [["Airport Free", "Café", "Later"], ["Airport Free", "Later"]])
        self.assertEqual(watch.stop(signal.SIGINT), 0)
        self.assertEqual(watch.errors, [])

    def test_watching_goes_on_when_the_adapter_goes_and_comes(self):
        self.all_reported()
        self.machine.control.do("pullAdapter")
        watch = Program([program("vexa"), "networks", "--watch", "--json", "--machine", str(self.machine.folder)])
        self.addCleanup(watch.end)
        wait_until(lambda: watch.errors, "a word about the adapter")
        self.machine.control.do("insertAdapter")
        wait_until(lambda: self.machine.control.do("reportNetworks") or watch.lines, "a list")
        self.assertEqual(watch.stop(signal.SIGTERM), 0)

    def test_why_there_are_none(self):
        self.all_reported()
        self.machine.control.do("radio", software="off")
        result = wait_until(lambda: self.none_listed(), "an empty list")
        self.assertIn("the radio is off", result.stderr)
        self.machine.control.do("radio", software="on")
        self.done("disable")
        self.assertIn("disabled", self.none_listed().stderr)

    def none_listed(self):
        result = self.vexa("networks")
        self.assertEqual(result.returncode, 0)
        return result if result.stdout == "No hotspot networks.\n" else None


class Status(NetworksTest):
    def test_it_follows_what_happens(self):
        expected = {"adapter": True, "radio": True, "hotspot": True, "networks": 3, "connection": None, "internet": False}
        expected |= {"credential": None, "possibleCredentials": []}
        self.all_reported()
        self.assertEqual(self.status(), expected)
        self.machine.control.do("radio", software="off")
        self.assertEqual(self.status(), {**expected, "radio": False, "networks": 0})
        self.machine.control.do("pullAdapter")
        nothing = {"adapter": False, "radio": False, "networks": 0}
        self.assertEqual(self.status(), {**expected, **nothing})

    def test_in_words(self):
        lines = self.done("status").splitlines()
        self.assertEqual([line.split()[0] for line in lines], ["Adapter", "Radio", "Hotspot", "Networks", "Connection", "Credential", "Internet"])
        self.assertEqual([line.split()[1] for line in lines[:3]], ["in", "on", "enabled"])

    def test_the_switch_of_a_machine_that_is_not_known(self):
        result = run_client("status", "--json", "--hs20-port", self.machine.hs20_port, VEXA_MACHINE="/nonexistent")
        self.assertEqual(result.returncode, 0, result.stderr)
        self.assertIsNone(json.loads(result.stdout)["hotspot"])


class Switching(NetworksTest):
    def test_the_switch_takes_the_networks_away_and_gives_them_back(self):
        self.all_reported()
        self.assertEqual(self.done("disable"), "Hotspot networks are disabled.\n")
        self.assertEqual((self.status()["hotspot"], self.networks()), (False, []))
        self.assertEqual(json.loads(self.done("enable", "--json")), {"hotspot": True})
        self.assertEqual((self.status()["hotspot"], len(self.networks())), (True, 3))

    def test_it_outlives_the_service(self):
        self.all_reported()
        self.done("disable")
        self.machine.stop()
        with Machine(SCENARIO, folder=self.machine.folder) as machine:
            machine.control.do("reportNetworks")
            machine.control.do("reportNetworks")
            self.assertEqual((self.status()["hotspot"], self.networks()), (False, []))
            self.done("enable")
            self.machine = machine
            self.assertEqual(len(self.all_reported()), 3)

    def test_a_refresh_asks_the_networks_again(self):
        self.all_reported()
        before = self.queries()
        self.assertIn("asked for again", self.done("refresh"))
        wait_until(lambda: self.queries() > before, "an ANQP query")

    def queries(self):
        """How many requests the hotspot module got, of whatever kind."""
        return len([c for c in self.machine.control.query("calls") if c["call"] == "WlanIhvControl"])

    def test_without_an_adapter_each_says_so(self):
        self.machine.control.do("pullAdapter")
        for command in ("networks", "enable", "disable", "refresh"):
            self.assertIn("no adapter", self.refused(1, command, "--timeout", "3600"))


if __name__ == "__main__":
    unittest.main()
