"""The life of a connection on the real programs: joined by itself, left by the user, asked for again."""

from harness import Story, network, wait_until

COMMON = "<accesstype>alluser</accesstype><creator>KORVANE-PC\\user</creator><autoconnect>true</autoconnect>"
CONFIG = f"""<?xml version="1.0" encoding="UTF-8"?><configurations><global><dump_file_path>hs20log.txt</dump_file_path>
<create_new_dump_file>false</create_new_dump_file><enabledump>true</enabledump><nextcredid>3</nextcredid></global>
<credentials><credential><id>1</id><type>eaptls</type>{COMMON}<eap>1</eap><credname>Work</credname>
<realm>work.example</realm><cacert>ab</cacert></credential>
<credential><id>2</id><type>eapttls</type>{COMMON}<eap>2</eap><credname>Cafe</credname><realm>cafe.example</realm>
<username>me</username><password>secret</password></credential></credentials>
<users><user><username>KORVANE-PC\\user</username><credentials><credential><id>1</id><priority>1</priority></credential>
<credential><id>2</id><priority>2</priority></credential></credentials></user></users></configurations>"""

USER = {"eapMethod": 21, "username": "me", "password": "secret"}
OFFICE = network(1, "Office", {"work.example": [13]}, accepts=[{"eapMethod": 13, "authMode": "machine"}])
CAFE = network(2, "Cafe", {"cafe.example": [21]}, accepts=[USER])


class ConnectionStory(Story):
    def begin(self, *networks, **scenario):
        self.start(config=CONFIG, networks=networks, **scenario)
        self.hs20 = self.machine.hs20()

    def method(self):
        """The number that stands in the registry."""
        return self.control.query("registry").get("HKEY_CURRENT_USER\\Software\\Korvane\\Vexa", {}).get("EapMethod")

    def wait_method(self, number):
        wait_until(lambda: self.method() == number, f"the method {number} in the registry")


class Life(ConnectionStory):
    def test_joins_the_better_network_and_falls_back_to_the_machine(self):
        self.begin(CAFE, OFFICE)
        self.control.wait_connected("Office")
        self.wait_method(1)
        first, second = self.control.calls("WlanConnect")
        self.assertIn("<authMode>machineOrUser</authMode>", first["profile"])
        self.assertIn("<authMode>machine</authMode>", second["profile"])
        for call in (first, second):
            self.assertEqual((call["mode"], call["ssid"], call["flags"], call["result"]), (1, None, 1, 0))

    def test_a_name_in_no_list_is_told_as_a_failure(self):
        self.begin(CAFE)
        self.control.wait_connected("Cafe")
        self.hs20.send("CONNECT_NETWORK", {"NetWorkName": "Hotel"})
        event = self.hs20.wait_event("CONNECT_DISCONNECT", lambda event: event["Data"].strip() == "0")
        self.assertEqual(event["Source"], "HotSpot20")
        self.assertEqual(self.control.connected(), "Cafe")
