"""Connections of the Windows service: the registry, the log, what the user left, who sits at the machine."""

import re

import wine
from connect_life import CAFE, OFFICE, ConnectionStory

LOG_LINE = re.compile(rb"\[\d+\] \d\d/\d\d \d\d:\d\d:\d\d  [^\r\n]*")


class Life(ConnectionStory):
    def method(self):
        """As another program sees it."""
        told = wine.run("reg", "query", "HKCU\\Software\\Korvane\\Vexa", "/v", "EapMethod").stdout
        number = re.search(r"EapMethod\s+REG_DWORD\s+0x([0-9a-f]+)\s", told)
        return number and int(number[1], 16)

    def test_what_the_user_left_is_passed_over(self):
        self.begin(OFFICE)
        self.control.wait_connected("Office")
        self.wait_method(1)
        self.hs20.send("DISCONNECT_NETWORK", {"NetWorkName": "Office"})
        self.wait_method(0)
        self.control.do("clearCalls")
        # The office's credential comes first. That the cafe is joined shows that a round has passed the office over.
        self.control.do("addNetwork", network=CAFE)
        self.control.do("reportNetworks")
        self.control.wait_connected("Cafe")
        self.wait_method(2)
        profiles = [call["profile"] for call in self.control.calls("WlanConnect")]
        self.assertEqual([re.search("<name>(.*?)</name>", profile)[1] for profile in profiles], ["Cafe"])

    def test_nobody_is_connected_for_while_he_is_away(self):
        self.begin(CAFE, session="disconnected")
        self.control.do("reportNetworks")
        self.control.wait_passed(3000)  # some rounds of the connecting thread
        self.assertEqual(self.control.calls("WlanConnect"), [])
        self.control.do("setSession", session="active")
        self.control.do("reportNetworks")
        self.control.wait_connected("Cafe")

    def test_the_switch_in_the_registry_counts_from_the_start(self):
        self.begin(CAFE, hotspotAutoConnect="false")
        self.assertEqual(self.hs20.ask("GET_ALL_NETWORK_LIST")["Data"], "null\n")
        self.assertEqual(self.control.calls("WlanConnect"), [])
        self.assertEqual(self.control.query("registry")["HKEY_CURRENT_USER\\Software\\Korvane\\Vexa"],
                         {"IsHotSpotAutoConnect": "false"})  # fmt: skip

    def test_the_log_tells_of_it_in_lines_of_a_text_file(self):
        self.begin(CAFE)
        self.control.wait_connected("Cafe")
        self.assertEqual(self.machine.parent.stop(timeout=40), 0)
        (path,) = (self.machine.config().parent / "Dump").iterdir()
        self.assertEqual(path.name, "hs20log.txt_user.txt")
        lines = path.read_bytes().split(b"\r\n")
        self.assertEqual(lines[-1], b"")
        self.assertFalse(any(b"\n" in line for line in lines), "an end of line without a carriage return")
        numbered = [line for line in lines if LOG_LINE.fullmatch(line)]
        self.assertEqual([int(line[1 : line.index(b"]")]) for line in numbered][:20], list(range(1, 21)))
        told = b"\n".join(lines).decode("latin-1")
        sa, hs20 = self.machine.sa_port, self.machine.hs20_port
        self.assertIn(f"Check command line arguments succeeded, saPort={sa}, hs20Port={hs20}", told)
        self.assertIn("Query interface mac address succeeded, mac address 02:1f:5d:00:00:01", told)
