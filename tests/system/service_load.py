"""The ports under load: large messages, pieces, broken frames, many clients."""

import contextlib
import json
import random
import unittest

from harness import BINARY, PING, PONG, TEXT, Machine

MEBIBYTE = 1 << 20
CHANNEL = "SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA"
CHANNEL_LIST = "SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G"
EVENTS_OF = {
    "GET_CURRENT_CHANNEL": [CHANNEL],
    "GET_CHANNEL_LIST": ["RADIO_ON", CHANNEL_LIST],
    "FULL_SCAN": [],
    "STOP_SCAN": [],
}
CONTINUATION = 0


def padded(command, size):
    """A command of so many bytes."""
    text = json.dumps({"CommandId": command, "Padding": ""}).encode()
    return text[:-2] + b"x" * (size - len(text)) + text[-2:]


class Messages(unittest.TestCase):
    def setUp(self):
        self.machine = Machine({"speed": 20})
        self.addCleanup(lambda: self.machine.__exit__(None))
        self.machine.__enter__()

    def assert_answers(self, client, times=1):
        for _ in range(times):
            self.assertEqual(client.next_event()["EventId"], CHANNEL)

    def test_text_and_binary_are_one(self):
        client = self.machine.sa()
        for opcode in (TEXT, BINARY):
            client.send_frame(opcode, b'{"CommandId":"GET_CURRENT_CHANNEL"}')
            self.assert_answers(client)

    def test_a_message_in_pieces_with_pings_between(self):
        client = self.machine.sa()
        text = b'{"CommandId":"GET_CURRENT_CHANNEL"}'
        for opcode in (TEXT, BINARY):
            client.send_frame(opcode, text[:1], final=False)
            for i in range(1, len(text)):
                client.send_frame(PING, b"still here")
                client.send_frame(CONTINUATION, text[i : i + 1], final=False)
            client.send_frame(CONTINUATION, b"")
            self.assert_answers(client)

    def test_pings_are_answered_with_their_bytes(self):
        client = self.machine.sa(reads=False)
        for payload in (b"", b"\x00\xff", b"x" * 125):
            client.send_frame(PING, payload)
            self.assertEqual(client._read_frame(), (True, PONG, payload))

    def test_a_pong_that_nobody_asked_for_is_ignored(self):
        client = self.machine.sa()
        client.send_frame(PONG, b"surprise")
        client.send("GET_CURRENT_CHANNEL")
        self.assert_answers(client)

    def test_a_mebibyte_is_taken_and_one_byte_more_is_not(self):
        for port in (self.machine.sa, self.machine.hs20):
            client, other = port(), port()
            command = "GET_CURRENT_CHANNEL" if port == self.machine.sa else "GET_RADIO"
            client.send_frame(TEXT, padded(command, MEBIBYTE))
            other.next_event()
            client.next_event()
            with contextlib.suppress(BrokenPipeError):  # the close can overtake the end of the message
                client.send_frame(TEXT, padded(command, MEBIBYTE + 1))
            self.assertEqual(client.wait_closed(), 1009)
            other.send(command)
            other.next_event()
            self.assertFalse(other.received)

    def test_a_message_in_pieces_that_grows_too_long(self):
        client = self.machine.sa()
        client.send_frame(TEXT, b"x" * (MEBIBYTE - 1), final=False)
        client.send_frame(CONTINUATION, b"xx", final=False)
        self.assertEqual(client.wait_closed(), 1009)

    def test_a_client_with_many_large_messages(self):
        client, other = self.machine.sa(), self.machine.sa()
        for _ in range(8):
            client.send_frame(TEXT, padded("GET_CURRENT_CHANNEL", MEBIBYTE))
        self.assert_answers(client, 8)
        self.assert_answers(other, 8)

    def test_broken_frames_end_their_connection_alone(self):
        cases = {
            "an unmasked frame": b"\x81\x02{}",
            "reserved bits": b"\xf1\x80\x00\x00\x00\x00",
            "an unknown opcode": b"\x83\x80\x00\x00\x00\x00",
            "a continuation of nothing": b"\x80\x80\x00\x00\x00\x00",
            "a ping in pieces": b"\x09\x80\x00\x00\x00\x00",
            "a ping of 126 bytes": b"\x89\xfe\x00\x7e\x00\x00\x00\x00" + b"x" * 126,
            "a length of 2^63": b"\x81\xff\x80\x00\x00\x00\x00\x00\x00\x00\x00\x00\x00\x00",
            "text that is no UTF-8": b"\x81\x82\x00\x00\x00\x00\xff\xfe",
        }
        other = self.machine.sa()
        for name, frame in cases.items():
            with self.subTest(name):
                client = self.machine.sa()
                client._socket.sendall(frame)
                self.assertIn(client.wait_closed(), (1002, 1006, 1007, 1009))
                other.send("GET_CURRENT_CHANNEL")
                self.assert_answers(other)

    def test_a_client_that_vanishes_in_the_middle_of_a_message(self):
        other = self.machine.sa()
        for _ in range(20):
            client = self.machine.sa()
            client.send_frame(TEXT, b'{"CommandId":', final=False)
            client.close()
        other.send("GET_CURRENT_CHANNEL")
        self.assert_answers(other)
        self.assertFalse(other.received)


class Order(unittest.TestCase):
    def test_replies_come_in_the_order_of_the_commands(self):
        with Machine({"speed": 20, "spectrum": {"channels": [1, 6, 11]}}) as machine:
            client, witness = machine.sa(), machine.sa()
            chosen = random.Random(1).choices(list(EVENTS_OF), k=2000)
            for command in chosen:
                client.send(command)
            expected = [event for command in chosen for event in EVENTS_OF[command]]
            for listener in (client, witness):
                self.assertEqual([listener.next_event()["EventId"] for _ in expected], expected)

    def test_an_event_reaches_two_hundred_clients(self):
        with Machine({"speed": 20}) as machine:
            clients = [machine.sa() if i % 2 else machine.hs20() for i in range(200)]
            machine.control.do("pullAdapter")
            texts = {client.take() for client in clients}
            self.assertEqual(len(texts), 1)
            self.assertEqual(json.loads(texts.pop())["EventId"], "CARD_PLUG_OUT")
            self.assertTrue(all(not client.received for client in clients))

    def test_a_client_that_has_just_come_in_misses_nothing(self):
        with Machine({"speed": 20}) as machine:
            for _ in range(100):
                for client in (machine.hs20(), machine.sa()):
                    machine.control.do("pullAdapter")
                    self.assertEqual(client.next_event()["EventId"], "CARD_PLUG_OUT")
                    client.close()

    def test_clients_that_come_and_go_disturb_nobody(self):
        with Machine({"speed": 20}) as machine:
            steady = machine.sa()
            for _ in range(100):
                passing = machine.sa()
                passing.send("GET_CURRENT_CHANNEL")
                self.assertEqual(passing.next_event()["EventId"], CHANNEL)
                self.assertEqual(steady.next_event()["EventId"], CHANNEL)
                passing.close()
            self.assertEqual(machine.stop(), 0)


if __name__ == "__main__":
    unittest.main()
