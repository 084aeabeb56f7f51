"""The life of a connection on the real programs: joined by itself, left by the user, asked for again."""

import json
import unittest

from harness import Machine, wait_until

CONFIG = """<?xml version="1.0" encoding="UTF-8"?><configurations><global>
<dump_file_path>hs20log.txt</dump_file_path><create_new_dump_file>false</create_new_dump_file>
<autoconnect>true</autoconnect><enabledump>true</enabledump><dumplevel>0</dumplevel><homerealm></homerealm>
<nextcredid>3</nextcredid></global><credentials>
<credential><id>1</id><type>eaptls</type><accesstype>alluser</accesstype><creator>KORVANE-PC\\user</creator><eap>1</eap>
<autoconnect>true</autoconnect><credname>Work</credname><realm>work.example</realm><cacert>ab</cacert>
<clientcert></clientcert></credential>
<credential><id>2</id><type>eapttls</type><accesstype>alluser</accesstype><creator>KORVANE-PC\\user</creator><eap>2</eap>
<autoconnect>true</autoconnect><credname>Cafe</credname><realm>cafe.example</realm><username>me</username>
<password>secret</password></credential></credentials><users><user><username>KORVANE-PC\\user</username><credentials>
<credential><id>1</id><priority>1</priority></credential><credential><id>2</id><priority>2</priority></credential>
</credentials></user></users></configurations>"""

OFFICE = {"bssid": "02:aa:00:00:00:01", "ssid": "Office",
          "realms": [{"names": ["work.example"], "eapMethods": [13]}],
          "accepts": [{"eapMethod": 13, "authMode": "machine"}]}
CAFE = {"bssid": "02:aa:00:00:00:02", "ssid": "Cafe",
        "realms": [{"names": ["cafe.example"], "eapMethods": [21]}],
        "accepts": [{"eapMethod": 21, "username": "me", "password": "secret"}]}


class Life(unittest.TestCase):
    def start(self, *networks):
        machine = Machine({"speed": 20, "config": CONFIG, "networks": list(networks)})
        self.addCleanup(machine.__exit__, None, None, None)
        machine.__enter__()
        self.control, self.hs20 = machine.control, machine.hs20()

    def connected(self):
        state = self.control.query("interface")
        return state["ssid"] if state["state"] == "connected" else None

    def wait_connected(self, ssid):
        wait_until(lambda: self.connected() == ssid, f"a connection to {ssid}")

    def eap_method(self):
        return self.control.query("registry").get("HKEY_CURRENT_USER\\Software\\Korvane\\Vexa", {}).get("EapMethod")

    def requests(self):
        return [call for call in self.control.query("calls") if call["call"] == "WlanConnect"]

    def test_joins_the_better_network_and_falls_back_to_the_machine(self):
        self.start(CAFE, OFFICE)
        self.wait_connected("Office")
        wait_until(lambda: self.eap_method() == 1, "the method in the registry")
        first, second = self.requests()
        self.assertIn("<authMode>machineOrUser</authMode>", first["profile"])
        self.assertIn("<authMode>machine</authMode>", second["profile"])
        for call in (first, second):
            self.assertEqual((call["mode"], call["ssid"], call["flags"], call["result"]), (1, None, 1, 0))

    def test_stays_away_from_what_the_user_left_until_he_asks(self):
        self.start(CAFE)
        self.wait_connected("Cafe")
        wait_until(lambda: self.eap_method() == 2, "the method in the registry")
        self.hs20.send("DISCONNECT_NETWORK", json.dumps({"NetWorkName": "Cafe"}))
        wait_until(lambda: self.eap_method() == 0, "the end of the connection")
        self.control.do("clearCalls")
        began = self.control.query("time")["ms"]
        wait_until(lambda: self.control.query("time")["ms"] > began + 30000, "half a minute of the machine")
        self.assertEqual(self.requests(), [])
        self.hs20.send("CONNECT_NETWORK", json.dumps({"NetWorkName": "Cafe"}))
        self.wait_connected("Cafe")

    def test_a_name_in_no_list_is_told_as_a_failure(self):
        self.start(CAFE)
        self.wait_connected("Cafe")
        self.hs20.send("CONNECT_NETWORK", json.dumps({"NetWorkName": "Hotel"}))
        event = self.hs20.wait_event("CONNECT_DISCONNECT", lambda event: event["Data"].strip() == "0")
        self.assertEqual(event["Source"], "HotSpot20")
        self.assertEqual(self.connected(), "Cafe")


if __name__ == "__main__":
    unittest.main()
