"""A client walks through an airport: what it is shown of the networks around it, on the real ports."""

import json
import unittest

from harness import Machine

LIST = "GET_ALL_NETWORK_LIST"


def bssid(number):
    return f"02:aa:00:00:00:{number:02x}"


def network(number, name, realms=None, **members):
    entry = {"bssid": bssid(number), "ssid": name, **members}
    if realms is not None:
        entry["realms"] = [{"names": names.split(";"), "eapMethods": methods} for names, methods in realms]
    return entry


def data_of(event):
    return json.loads(event["Data"])


def shown(networks):
    """Name to realms with methods, in the order of the list; None for a list that is null."""
    if networks is None:
        return None
    return [
        (entry["NetWorkName"], [(r["RealmName"], r["CredentialEapMethod"]) for r in entry.get("SupportRealmList", [])])
        for entry in networks
    ]


class Walk(unittest.TestCase):
    def start(self, networks=(), **scenario):
        machine = Machine({"speed": 20, "networks": list(networks), **scenario})
        self.addCleanup(machine.__exit__, None, None, None)
        machine.__enter__()
        self.control, self.client = machine.control, machine.hs20()

    def heard(self):
        """The events until now, as (name, data)."""
        self.client.send("GET_IS_CARD_IN")
        heard = []
        while not (event := self.client.next_event())["EventId"].startswith("CARD_") or "Data" not in event:
            heard.append((event["EventId"], data_of(event) if event.get("Data") else None))
        return heard

    def report(self):
        self.heard()
        self.control.do("reportNetworks")
        return self.heard()

    def asked(self):
        self.client.send(LIST)
        return data_of(self.client.wait_event(LIST))


class Networks(Walk):
    def test_growth_is_announced_once_and_shrinking_never(self):
        self.start([network(1, "Airport")])
        self.control.do("addNetwork", network=network(2, "Cafe"))
        self.assertEqual([name for name, _ in self.report()], ["DETECTED_HOTSPOT", LIST])
        self.assertEqual([name for name, _ in self.report()], [LIST])
        self.control.do("hide", bssid=bssid(1))
        self.assertEqual([name for name, _ in self.report()], [LIST])
        self.control.do("show", bssid=bssid(1))
        self.assertEqual(self.report()[0], ("DETECTED_HOTSPOT", None))

    def test_networks_of_one_name_fold_into_one_that_has_the_realms_of_all(self):
        self.start([network(1, "Airport", [("a.example", [13])], networkType=4)])
        self.control.do("addNetwork", network=network(2, "Airport", [("a.example", [13, 21]), ("b.example", [21])]))
        ((name, networks),) = self.report()
        self.assertEqual(name, LIST)
        self.assertEqual(shown(networks), [("Airport", [("a.example", 1), ("a.example", 2), ("b.example", 2)])])
        self.assertEqual(networks[0]["NetworkType"], 4, "the known one stays")

    def test_an_answer_that_arrives_is_shown_when_asked_for(self):
        self.start([network(1, "Airport", [("a.example", [13])], anqp="onQuery")])
        self.report()
        self.assertEqual(shown(self.asked()), [("Airport", [])])
        self.assertFalse(self.asked()[0]["RealmFetched"])
        self.control.do("reportAnqp", bssid=bssid(1))
        self.assertEqual(shown(self.asked()), [("Airport", [("a.example", 1)])])

    def test_a_realm_update_asks_the_air_again(self):
        self.start([network(1, "Airport", [("a.example", [13])], anqp="onQuery")])
        self.report()
        self.client.send("UPDATE_NETWORK_REALM")
        event = self.client.wait_event(LIST, where=lambda event: data_of(event)[0]["RealmFetched"])
        self.assertEqual(shown(data_of(event)), [("Airport", [("a.example", 1)])])

    def test_what_was_known_of_a_network_goes_with_it(self):
        self.start([network(1, "Airport", [("a.example", [13])]), network(2, "Cafe", [("c.example", [21])])])
        self.report()
        self.control.do("hide", bssid=bssid(1))
        self.report()
        self.control.do("setNetwork", bssid=bssid(1), anqp="never")
        self.control.do("show", bssid=bssid(1))
        self.assertEqual(shown(self.report()[-1][1]), [("Airport", []), ("Cafe", [("c.example", 2)])])

    def test_the_last_network_to_go_stays_in_the_list(self):
        self.start([network(1, "Airport")])
        self.control.do("hide", bssid=bssid(1))
        self.assertEqual(self.report(), [], "a report of nothing is refused")
        self.assertEqual(shown(self.asked()), [("Airport", [])])

    def test_a_radio_that_is_off_shows_null(self):
        self.start([network(1, "Airport")])
        self.heard()
        self.control.do("radio", software="off")
        self.assertIn((LIST, None), self.heard())
        self.assertIsNone(self.asked())
        self.control.do("radio", software="on")
        self.assertEqual(shown(self.asked()), [("Airport", [])])

    def test_a_function_that_is_off_shows_null_and_announces_nothing(self):
        self.start()
        self.client.send("SET_HOTSPOT_AUTO_CONNECT", "false")
        self.assertEqual([name for name, _ in self.heard()], [LIST, "SET_HOTSPOT_AUTO_CONNECT"])
        self.control.do("addNetwork", network=network(1, "Airport"))
        self.assertEqual(self.report(), [(LIST, None)])
        self.client.send("SET_HOTSPOT_AUTO_CONNECT", "true")
        self.assertEqual(shown(self.heard()[0][1]), [("Airport", [])])


class Connected(Walk):
    def connect(self, name):
        self.control.do("osConnect", ssid=name)
        self.client.wait_event("CONNECT_DISCONNECT")

    def access(self, name):
        return {entry["NetWorkName"]: (entry["IsConnected"], entry["IsInternetAccess"]) for entry in self.asked()}[name]

    def test_the_connected_network_and_its_access_are_marked(self):
        self.start(
            [network(1, "Airport", internetAccess=0), network(2, "Cafe", internetAccess=7)],
        )
        self.assertEqual(self.access("Airport"), (False, 0))
        self.assertEqual(self.access("Cafe"), (False, 2))
        self.connect("Cafe")
        self.assertEqual(self.access("Cafe"), (True, 0))
        self.assertEqual(self.access("Airport"), (False, 0))
        self.control.do("setDns", dns=[])
        self.assertEqual(self.access("Cafe"), (True, 1))

    def test_internet_access_is_that_of_a_connected_network_of_the_list(self):
        self.start([network(1, "Airport"), network(2, "Hidden", reported=False)])
        self.assertFalse(self.internet())
        self.connect("Hidden")
        self.assertFalse(self.internet(), "a network that isn't in the list")
        self.connect("Airport")
        self.assertTrue(self.internet())
        self.control.do("setDns", dns=[])
        self.assertFalse(self.internet())

    def internet(self):
        self.heard()
        self.client.send("GET_IS_INTERNET_ACCESS")
        return data_of(self.client.wait_event("GET_IS_INTERNET_ACCESS"))

    def test_a_realm_update_while_connected_disconnects_first_and_asks_then(self):
        self.start([network(1, "Airport", [("a.example", [13])], anqp="onQuery")])
        self.report()
        self.connect("Airport")
        self.heard()
        self.control.do("clearCalls")
        self.client.send("UPDATE_NETWORK_REALM")
        event = self.client.wait_event(LIST)
        self.assertEqual(shown(data_of(event)), [("Airport", [("a.example", 1)])], "no list before the answer")
        calls = [(call["call"], call.get("inHex", "")[16:18]) for call in self.control.query("calls")]
        self.assertEqual(calls[:2], [("WlanDisconnect", ""), ("WlanIhvControl", "03")])


if __name__ == "__main__":
    unittest.main()
