"""Clients that do not read, or send more than can be handled."""

import json
import random
import unittest

from harness import Machine

MEBIBYTE = 1 << 20
EVENTS_OF = {
    "GET_CURRENT_CHANNEL": ["SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA"],
    "GET_CHANNEL_LIST": ["RADIO_ON", "SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G"],
}


class Overload(unittest.TestCase):
    COMMANDS = 60000

    def test_a_client_that_never_reads_is_dropped_and_another_is_served(self):
        with Machine({"speed": 20, "spectrum": {"channels": [1, 6, 11]}}) as machine:
            stuck = machine.sa(reads=False, receive_buffer=4096)
            busy = machine.sa()
            chosen = random.Random(2).choices(["GET_CURRENT_CHANNEL", "GET_CHANNEL_LIST"], [4, 1], k=self.COMMANDS)
            for command in chosen:
                busy.send(command)
            expected = [event for command in chosen for event in EVENTS_OF[command]]
            answers = [busy.next_event()["EventId"] for _ in expected]
            self.assertEqual(answers, expected)
            stuck.start_reading()
            self.assertIn(stuck.wait_closed(), (1008, 1006))
            self.assertLess(len(stuck.received), len(expected))
            got = [json.loads(message)["EventId"] for message in stuck.received]
            self.assertEqual(got, expected[: len(got)])

    def test_the_dropped_client_is_told_why(self):
        channels = list(range(256))
        with Machine({"speed": 20, "spectrum": {"channels": channels}}) as machine:
            stuck = machine.sa(reads=False, receive_buffer=4096)
            busy = machine.sa()
            # More than the sockets and the queue hold together.
            sent = lists = 0
            while sent < 16 * MEBIBYTE:
                busy.send("GET_CHANNEL_LIST")
                sent += len(busy.take()) + len(busy.take())
                lists += 1
            stuck.start_reading()
            self.assertEqual(stuck.wait_closed(), 1008)
            self.assertLess(len(stuck.received), 2 * lists)

    def test_a_client_that_floods_but_never_reads_holds_up_nobody(self):
        with Machine({"speed": 20}) as machine:
            flood = machine.hs20(reads=False, receive_buffer=4096)
            other = machine.hs20()
            for _ in range(3000):
                flood.send("GET_RADIO")
            other.send("GET_IS_CARD_IN")
            other.wait_event("CARD_PLUG_IN")
            self.assertEqual(machine.stop(), 0)


if __name__ == "__main__":
    unittest.main()
