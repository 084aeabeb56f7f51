"""The programs as they are unpacked, on the WLAN service that Wine brings along: it has no adapter."""

import json
import unittest

import wine


class WithoutAnAdapter(unittest.TestCase):
    def test_it_serves_both_ports_says_so_and_stops(self):
        with wine.Machine(simulated=False) as machine:
            sa, hs20 = machine.sa(), machine.hs20()
            hs20.send("GET_IS_CARD_IN")
            self.assertEqual(hs20.next_event()["EventId"], "CARD_PLUG_OUT")
            self.assertEqual(hs20.ask("GET_RADIO")["Data"], "false\n")
            sa.send("GET_CHANNEL_LIST")
            self.assertEqual(sa.next_event()["EventId"], "RADIO_OFF")
            self.assertEqual(sa.next_event()["Data"], "null\n")
            status = wine.run_client("status", "--json")
            self.assertEqual((status.returncode, json.loads(status.stdout)["adapter"]), (0, False), status)
            self.assertTrue(machine.config().is_file())
            self.assertEqual(machine.stop(), 0)
