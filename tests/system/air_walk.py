"""A client walks through an airport: what it is shown of the networks around it, on the real ports."""

import json

from harness import Story

LIST = "GET_ALL_NETWORK_LIST"


def network(number, name, realms=None, **members):
    entry = {"bssid": f"02:aa:00:00:00:{number:02x}", "ssid": name, **members}
    if realms is not None:
        entry["realms"] = [{"names": [realm], "eapMethods": methods} for realm, methods in realms.items()]
    return entry


AIRPORT = network(1, "Airport", {"a.example": [13]}, anqp="onQuery")
CAFE = network(2, "Cafe", {"c.example": [13]}, networkType=4)
SHOWN_AIRPORT, SHOWN_CAFE = ("Airport", [("a.example", 1)]), ("Cafe", [("c.example", 1)])


def shown(event):
    """The names of a list in their order, each with its realms and their methods; None for a list that is null. Of
    other events the name."""
    if event["EventId"] != LIST:
        return event["EventId"]
    realms = lambda entry: [(r["RealmName"], r["CredentialEapMethod"]) for r in entry.get("SupportRealmList", [])]
    networks = json.loads(event["Data"])
    return None if networks is None else [(entry["NetWorkName"], realms(entry)) for entry in networks]


class Walk(Story):
    def begin(self, *networks):
        self.start(networks=networks)
        self.client = self.machine.hs20()

    def heard(self):
        """The events until now."""
        self.client.send("GET_IS_CARD_IN")
        heard = []
        while not (event := self.client.next_event())["EventId"].startswith("CARD_") or "Data" not in event:
            heard.append(shown(event))
        return heard

    def report(self, *actions):
        """What is heard of a report after these actions."""
        for action, members in actions:
            self.control.do(action, **members)
        self.heard()
        self.control.do("reportNetworks")
        return self.heard()

    def asked(self):
        return self.client.ask(LIST)

    def connect(self, name):
        self.control.do("osConnect", ssid=name)
        self.client.wait_event("CONNECT_DISCONNECT")

    def test_the_list_follows_what_is_in_range(self):
        self.begin(network(1, "Airport", {"a.example": [13]}))
        first, second, third = ({"bssid": network(number, "")["bssid"]} for number in (1, 2, 3))
        more = network(3, "Cafe", {"c.example": [13, 21], "d.example": [21]})
        nothing_known = ("Airport", [])
        folded = ("Cafe", [("c.example", 1), ("c.example", 2), ("d.example", 2)])
        for what, actions, heard in (
            ("more", [("addNetwork", {"network": CAFE})], ["DETECTED_HOTSPOT", [SHOWN_AIRPORT, SHOWN_CAFE]]),
            ("the same", [], [[SHOWN_AIRPORT, SHOWN_CAFE]]),
            ("fewer", [("hide", first)], [[SHOWN_CAFE]]),
            (
                "one that was away, of which nothing is known any more",
                [("setNetwork", {**first, "anqp": "never"}), ("show", first)],
                ["DETECTED_HOTSPOT", [nothing_known, SHOWN_CAFE]],
            ),
            ("another of the same name", [("addNetwork", {"network": more})], [[nothing_known, folded]]),
        ):
            with self.subTest(what):
                self.assertEqual(self.report(*actions), heard)
        self.assertEqual(json.loads(self.asked()["Data"])[1]["NetworkType"], 4, "the known one stays")
        self.assertEqual(self.report(("hide", second), ("hide", third)), [[nothing_known]])
        self.assertEqual(self.report(("hide", first)), [], "a report of nothing is refused")
        self.assertEqual(shown(self.asked()), [nothing_known])
        self.control.do("radio", software="off")
        self.assertIn(None, self.heard())
        self.assertIsNone(shown(self.asked()))
        self.control.do("radio", software="on")
        self.assertEqual(shown(self.asked()), [nothing_known])

    def test_realms_are_shown_once_they_are_known(self):
        self.begin(AIRPORT)
        self.report()
        self.assertEqual(shown(self.asked()), [("Airport", [])])
        self.assertFalse(json.loads(self.asked()["Data"])[0]["RealmFetched"])
        self.control.do("reportAnqp", bssid=AIRPORT["bssid"])
        self.assertEqual(shown(self.asked()), [SHOWN_AIRPORT])

    def test_a_realm_update_asks_the_air_again(self):
        self.begin(AIRPORT)
        self.report()
        self.client.send("UPDATE_NETWORK_REALM")
        self.client.wait_event(LIST, where=lambda event: shown(event) == [SHOWN_AIRPORT])

    def test_a_realm_update_while_connected_disconnects_first_and_asks_then(self):
        self.begin(AIRPORT)
        self.report()
        self.connect("Airport")
        self.heard()
        self.control.do("clearCalls")
        event = self.client.ask("UPDATE_NETWORK_REALM", answer=LIST)
        self.assertEqual(shown(event), [SHOWN_AIRPORT], "no list before the answer")
        calls = [(call["call"], call.get("inHex", "")[16:18]) for call in self.control.query("calls")]
        self.assertEqual(calls[:2], [("WlanDisconnect", ""), ("WlanIhvControl", "03")])

    def test_a_function_that_is_off_shows_null_and_announces_nothing(self):
        self.begin()
        self.client.send("SET_HOTSPOT_AUTO_CONNECT", "false")
        self.assertEqual(self.heard(), [None, "SET_HOTSPOT_AUTO_CONNECT"])
        self.assertEqual(self.report(("addNetwork", {"network": AIRPORT})), [None])
        self.client.send("SET_HOTSPOT_AUTO_CONNECT", "true")
        self.assertEqual(self.heard()[0], [("Airport", [])])

    def test_the_connected_network_and_its_access_are_marked(self):
        self.begin(network(1, "Airport", internetAccess=0), network(2, "Cafe", internetAccess=7),
                   network(3, "Hidden", reported=False))  # fmt: skip

        def access():
            networks = json.loads(self.asked()["Data"])
            internet = json.loads(self.client.ask("GET_IS_INTERNET_ACCESS")["Data"])
            return internet, [(entry["IsConnected"], entry["IsInternetAccess"]) for entry in networks]

        self.assertEqual(access(), (False, [(False, 0), (False, 2)]))
        self.connect("Hidden")
        self.assertEqual(access(), (False, [(False, 0), (False, 2)]), "a network that isn't in the list")
        self.connect("Cafe")
        self.assertEqual(access(), (True, [(False, 0), (True, 0)]))
        self.control.do("setDns", dns=[])
        self.assertEqual(access(), (False, [(False, 0), (True, 1)]))
