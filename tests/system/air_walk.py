"""A client walks through an airport: what it is shown of the networks around it, on the real ports."""

import json

from harness import Story, network

LIST = "GET_ALL_NETWORK_LIST"


def shown(event):
    """The names of a list in their order, each with its realms and their methods; None for a list that is null. Of
    other events the name."""
    if event["EventId"] != LIST:
        return event["EventId"]
    networks = json.loads(event["Data"])
    return networks and [
        (entry["NetWorkName"], [(r["RealmName"], r["CredentialEapMethod"]) for r in entry.get("SupportRealmList", [])])
        for entry in networks
    ]


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
        airport, cafe = ("Airport", [("a.example", 1)]), ("Cafe", [("c.example", 1)])
        forgotten, folded = ("Airport", []), ("Cafe", [("c.example", 1), ("c.example", 2), ("d.example", 2)])
        first, second, third = ({"bssid": network(number, "")["bssid"]} for number in (1, 2, 3))
        new = {"network": network(2, "Cafe", {"c.example": [13]})}
        same_name = {"network": network(3, "Cafe", {"c.example": [13, 21], "d.example": [21]})}
        away_and_back = ("setNetwork", {**first, "anqp": "never"}), ("show", first)
        for what, actions, heard in (
            ("more", [("addNetwork", new)], ["DETECTED_HOTSPOT", [airport, cafe]]),
            ("the same", [], [[airport, cafe]]),
            ("fewer", [("hide", first)], [[cafe]]),
            ("one of which nothing is known any more", away_and_back, ["DETECTED_HOTSPOT", [forgotten, cafe]]),
            ("another of the same name", [("addNetwork", same_name)], [[forgotten, folded]]),
            ("the last", [("hide", second), ("hide", third)], [[forgotten]]),
            ("nothing, which is refused", [("hide", first)], []),
        ):
            with self.subTest(what):
                self.assertEqual(self.report(*actions), heard)
        self.control.do("radio", software="off")
        self.assertIn(None, self.heard())
        self.assertIsNone(shown(self.asked()))
        self.control.do("radio", software="on")
        self.assertEqual(shown(self.asked()), [forgotten])

    def test_a_realm_update_while_connected_disconnects_first_and_asks_then(self):
        self.begin(network(1, "Airport", {"a.example": [13]}, anqp="onQuery"))
        self.report()
        self.assertEqual(shown(self.asked()), [("Airport", [])])
        self.connect("Airport")
        self.heard()
        self.control.do("clearCalls")
        event = self.client.ask("UPDATE_NETWORK_REALM", answer=LIST)
        self.assertEqual(shown(event), [("Airport", [("a.example", 1)])], "no list before the answer")
        calls = [(call["call"], call.get("inHex", "")[16:18]) for call in self.control.query("calls")]
        self.assertEqual(calls[:2], [("WlanDisconnect", ""), ("WlanIhvControl", "03")])

    def test_the_connected_network_and_its_access_are_marked(self):
        hidden = network(3, "Hidden", reported=False)
        self.begin(network(1, "Airport", internetAccess=0), network(2, "Cafe", internetAccess=7), hidden)

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
