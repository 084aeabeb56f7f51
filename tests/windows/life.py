"""Connections of the Windows service: the registry, the log, what the user left, who sits at the machine."""

import json
import re
import unittest

import wine
from connect_life import CAFE, CONFIG, OFFICE
from harness import wait_until
from wine import Machine, run

LOG_LINE = re.compile(rb"\[\d+\] \d\d/\d\d \d\d:\d\d:\d\d  [^\r\n]*")


class World(unittest.TestCase):
    def start(self, *networks, **scenario):
        self.machine = Machine({"config": CONFIG, "networks": list(networks), **scenario})
        self.addCleanup(self.machine.__exit__, None, None, None)
        self.machine.__enter__()
        self.control, self.hs20 = self.machine.control, self.machine.hs20()

    def wait_connected(self, ssid):
        def connected():
            interface = self.control.query("interface")
            return interface["state"] == "connected" and interface["ssid"] == ssid

        wait_until(connected, f"a connection to {ssid}")

    def wait_method(self, number):
        """What stands in the registry, as another program sees it."""

        def method():
            told = run("reg", "query", "HKCU\\Software\\Korvane\\Vexa", "/v", "EapMethod").stdout
            return re.search(rf"EapMethod\s+REG_DWORD\s+0x{number:x}\s", told)

        wait_until(method, f"the method {number} in the registry")

    def requests(self):
        return [call for call in self.control.query("calls") if call["call"] == "WlanConnect"]


class Life(World):
    def test_what_the_user_left_is_passed_over(self):
        self.start(OFFICE)
        self.wait_connected("Office")
        self.wait_method(1)
        self.hs20.send("DISCONNECT_NETWORK", json.dumps({"NetWorkName": "Office"}))
        self.wait_method(0)
        self.control.do("clearCalls")
        # The office's credential comes first. That the cafe is joined shows that a round has passed the office over.
        self.control.do("addNetwork", network=CAFE)
        self.control.do("reportNetworks")
        self.wait_connected("Cafe")
        self.wait_method(2)
        self.assertEqual([re.search("<name>(.*?)</name>", call["profile"])[1] for call in self.requests()], ["Cafe"])

    def test_nobody_is_connected_for_while_he_is_away(self):
        self.start(CAFE, session="disconnected")
        self.control.do("reportNetworks")
        began = self.control.query("time")["ms"]
        wait_until(lambda: self.control.query("time")["ms"] > began + 3000, "some rounds of the connecting thread")
        self.assertEqual(self.requests(), [])
        self.control.do("setSession", session="active")
        self.control.do("reportNetworks")
        self.wait_connected("Cafe")

    def test_the_switch_in_the_registry_counts_from_the_start(self):
        self.start(CAFE, hotspotAutoConnect="false")
        self.hs20.send("GET_ALL_NETWORK_LIST")
        self.assertEqual(self.hs20.wait_event("GET_ALL_NETWORK_LIST")["Data"], "null\n")
        self.assertEqual(self.requests(), [])
        self.assertEqual(self.control.query("registry")["HKEY_CURRENT_USER\\Software\\Korvane\\Vexa"],
                         {"IsHotSpotAutoConnect": "false"})

    def test_the_log_tells_of_it_in_lines_of_a_text_file(self):
        self.start(CAFE)
        self.wait_connected("Cafe")
        self.assertEqual(self.machine.parent.stop(timeout=40), 0)
        (path,) = (wine.store() / "Dump").iterdir()
        self.assertEqual(path.name, "hs20log.txt_user.txt")
        lines = path.read_bytes().split(b"\r\n")
        self.assertEqual(lines[-1], b"")
        self.assertFalse(any(b"\n" in line for line in lines), "an end of line without a carriage return")
        numbered = [line for line in lines if LOG_LINE.fullmatch(line)]
        self.assertEqual([int(line[1 : line.index(b"]")]) for line in numbered][:20], list(range(1, 21)))
        told = b"\n".join(lines).decode("latin-1")
        for text in (
            f"Check command line arguments succeeded, saPort={self.machine.sa_port}, hs20Port={self.machine.hs20_port}",
            "Query interface mac address succeeded, mac address 02:1f:5d:00:00:01",
        ):
            self.assertIn(text, told)


if __name__ == "__main__":
    unittest.main()
