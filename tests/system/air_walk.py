"""A client walks through an airport: what it is shown of the networks around it, on the real ports."""

import json

from harness import Story, network

LIST = "GET_ALL_NETWORK_LIST"


class Walk(Story):
    def begin(self, *networks):
        self.start(networks=networks)
        self.client = self.machine.hs20()

    def asked(self):
        return json.loads(self.client.ask(LIST)["Data"])

    def connect(self, name):
        self.control.do("osConnect", ssid=name)
        self.client.wait_event("CONNECT_DISCONNECT")

    def test_a_realm_update_while_connected_disconnects_first_and_asks_then(self):
        self.begin(network(1, "Airport", {"a.example": [13]}, anqp="onQuery"))
        self.control.do("reportNetworks")
        (airport,) = self.asked()
        self.assertEqual((airport["NetWorkName"], airport["RealmFetched"]), ("Airport", False))
        self.connect("Airport")
        self.client.ask("GET_IS_CARD_IN")
        self.control.do("clearCalls")
        (told,) = json.loads(self.client.ask("UPDATE_NETWORK_REALM", answer=LIST)["Data"])
        realms = [{"RealmName": "a.example", "CredentialEapMethod": 1}]
        self.assertEqual(told.get("SupportRealmList"), realms, "no list before the answer")
        calls = [(call["call"], call.get("inHex", "")[16:18]) for call in self.control.query("calls")]
        self.assertEqual(calls[:2], [("WlanDisconnect", ""), ("WlanIhvControl", "03")])

    def test_the_connected_network_and_its_access_are_marked(self):
        hidden = network(3, "Hidden", reported=False)
        self.begin(network(1, "Airport", internetAccess=0), network(2, "Cafe", internetAccess=7), hidden)

        def access():
            internet = json.loads(self.client.ask("GET_IS_INTERNET_ACCESS")["Data"])
            return internet, [(entry["IsConnected"], entry["IsInternetAccess"]) for entry in self.asked()]

        self.assertEqual(access(), (False, [(False, 0), (False, 2)]))
        self.connect("Hidden")
        self.assertEqual(access(), (False, [(False, 0), (False, 2)]), "a network that isn't in the list")
        self.connect("Cafe")
        self.assertEqual(access(), (True, [(False, 0), (True, 0)]))
        self.control.do("setDns", dns=[])
        self.assertEqual(access(), (False, [(False, 0), (True, 1)]))
