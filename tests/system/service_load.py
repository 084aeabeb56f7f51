"""The ports under load: large messages, pieces, broken frames, many clients, and some that do not read."""

import contextlib
import json
import random

from harness import BINARY, CHANNEL, CHANNEL_LIST, PING, PONG, TEXT, Story, read_frame

MEBIBYTE = 1 << 20
EVENTS_OF = {
    "GET_CURRENT_CHANNEL": [CHANNEL],
    "GET_CHANNEL_LIST": ["RADIO_ON", CHANNEL_LIST],
    "FULL_SCAN": [],
    "STOP_SCAN": [],
}
COMMAND = b'{"CommandId":"GET_CURRENT_CHANNEL"}'
CONTINUATION = 0


def padded(command, size):
    text = json.dumps({"CommandId": command, "Padding": ""}).encode()
    return text[:-2] + b"x" * (size - len(text)) + text[-2:]


class Messages(Story):
    def setUp(self):
        self.start()
        self.client, self.other = self.machine.sa(), self.machine.sa()

    def assert_answers(self, client, times=1):
        for _ in range(times):
            self.assertEqual(client.next_event()["EventId"], CHANNEL)

    def test_text_and_binary_whole_and_in_pieces_with_pings_between(self):
        for opcode in (TEXT, BINARY):
            self.client.send_frame(PONG, b"surprise")
            self.client.send_frame(opcode, COMMAND)
            self.assert_answers(self.client)
            self.client.send_frame(opcode, COMMAND[:1], final=False)
            for byte in COMMAND[1:]:
                self.client.send_frame(PING, b"still here")
                self.client.send_frame(CONTINUATION, bytes([byte]), final=False)
            self.client.send_frame(CONTINUATION, b"")
            self.assert_answers(self.client)

    def test_pings_are_answered_with_their_bytes(self):
        client = self.machine.sa(reads=False)
        for payload in (b"", b"\x00\xff", b"x" * 125):
            client.send_frame(PING, payload)
            self.assertEqual(read_frame(client.input), (True, PONG, payload))

    def test_a_mebibyte_is_taken_and_one_byte_more_is_not(self):
        for port, command in ((self.machine.sa, "GET_CURRENT_CHANNEL"), (self.machine.hs20, "GET_RADIO")):
            client, other = port(), port()
            for _ in range(8):
                client.send_frame(TEXT, padded(command, MEBIBYTE))
            for _ in range(8):
                other.next_event()
                client.next_event()
            with contextlib.suppress(BrokenPipeError):  # the close can overtake the end of the message
                client.send_frame(TEXT, padded(command, MEBIBYTE + 1))
            self.assertEqual(client.wait_closed(), 1009)
            other.send(command)
            other.next_event()
            self.assertFalse(other.received)

    def test_a_message_in_pieces_that_grows_too_long(self):
        self.client.send_frame(TEXT, b"x" * (MEBIBYTE - 1), final=False)
        self.client.send_frame(CONTINUATION, b"xx", final=False)
        self.assertEqual(self.client.wait_closed(), 1009)

    def test_broken_frames_end_their_connection_alone(self):
        for name, frame in (
            ("an unmasked frame", b"\x81\x02{}"),
            ("reserved bits", b"\xf1\x80" + bytes(4)),
            ("an unknown opcode", b"\x83\x80" + bytes(4)),
            ("a continuation of nothing", b"\x80\x80" + bytes(4)),
            ("a ping in pieces", b"\x09\x80" + bytes(4)),
            ("a ping of 126 bytes", b"\x89\xfe\x00\x7e" + bytes(4) + b"x" * 126),
            ("a length of 2^63", b"\x81\xff\x80" + bytes(11)),
            ("text that is no UTF-8", b"\x81\x82" + bytes(4) + b"\xff\xfe"),
        ):
            with self.subTest(name):
                client = self.machine.sa()
                client.socket.sendall(frame)
                self.assertIn(client.wait_closed(), (1002, 1006, 1007, 1009))
                self.other.send("GET_CURRENT_CHANNEL")
                self.assert_answers(self.other)

    def test_clients_that_come_and_go_disturb_nobody_and_miss_nothing(self):
        for _ in range(50):
            vanishing = self.machine.sa()
            vanishing.send_frame(TEXT, COMMAND, final=False)  # whole, but for the end of its message
            vanishing.close()
            passing = self.machine.sa()
            passing.send("GET_CURRENT_CHANNEL")
            self.assert_answers(passing)
            self.assert_answers(self.other)
            passing.close()
            for client in (self.machine.hs20(), self.machine.sa()):
                self.control.do("pullAdapter")
                self.assertEqual(client.next_event()["EventId"], "CARD_PLUG_OUT")
                self.assertEqual(self.other.next_event()["EventId"], "CARD_PLUG_OUT")
                client.close()
        self.assertFalse(self.other.received)
        self.assertEqual(self.machine.stop(), 0)

    def test_an_event_reaches_two_hundred_clients(self):
        clients = [self.machine.sa() if i % 2 else self.machine.hs20() for i in range(200)]
        self.control.do("pullAdapter")
        (text,) = {client.take() for client in clients}
        self.assertEqual(json.loads(text)["EventId"], "CARD_PLUG_OUT")
        self.assertFalse(any(client.received for client in clients))


class Rush(Story):
    def test_replies_come_in_the_order_of_the_commands_and_who_never_reads_is_dropped(self):
        self.start(spectrum={"channels": [1, 6, 11]})
        stuck, busy, witness = self.machine.sa(reads=False, receive_buffer=4096), self.machine.sa(), self.machine.sa()
        commands = random.Random(2).choices(list(EVENTS_OF), [12, 3, 1, 1], k=60000)
        for command in commands:
            busy.send(command)
        expected = [event for command in commands for event in EVENTS_OF[command]]
        for client in (busy, witness):
            self.assertEqual([client.next_event()["EventId"] for _ in expected], expected)
        stuck.start_reading()
        self.assertIn(stuck.wait_closed(), (1008, 1006))
        got = [json.loads(message)["EventId"] for message in stuck.received]
        self.assertLess(len(got), len(expected))
        self.assertEqual(got, expected[: len(got)])

    def test_the_dropped_client_is_told_why(self):
        self.start(spectrum={"channels": list(range(256))})
        stuck, busy = self.machine.sa(reads=False, receive_buffer=4096), self.machine.sa()
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
        self.start()
        flood, other = self.machine.hs20(reads=False, receive_buffer=4096), self.machine.hs20()
        for _ in range(3000):
            flood.send("GET_RADIO")
        other.ask("GET_IS_CARD_IN")
        self.assertEqual(self.machine.stop(), 0)
