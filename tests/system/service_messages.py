"""What the ports make of a message, and the exact text of what they send."""

import json
import re
import unittest

from harness import BINARY, CHANNEL, CHANNEL_LIST, Machine, Story, wait_until

TIMESTAMP = r"\d{4}-\d\d-\d\dT\d\d:\d\d:\d\d "


def spectral(event_id, data=None, source="SpectralAnalyser"):
    """A pattern of the whole text of an event, byte for byte but for the time."""
    lines = [f'   "EventId" : "{event_id}",', f'   "Source" : "{source}",', '   "Timestamp" : "@"']
    if data is not None:
        lines.insert(0, f'   "Data" : {json.dumps(data)},')
    text = "\n".join(["{", *lines, "}", ""])
    return re.escape(text.encode()).replace(b"@", TIMESTAMP.encode())


def hotspot(event_id, data):
    return spectral(event_id, data, "HotSpot20")


class Texts(Story):
    def assert_answers(self, client, *exchanges):
        """Commands, each with the texts that answer it; None for texts that come by themselves."""
        for command, *patterns in exchanges:
            if command:
                client.send(command)
            for pattern in patterns:
                self.assertRegex(client.take(), rb"\A" + pattern + rb"\Z")

    def test_the_spectral_port(self):
        levels = {"11": {"congestion": 42, "power": 60, "spread": 0}}
        client = self.start(spectrum={"channels": [36, 1, 36, 11], "levels": levels}).sa()
        orders = ((1, 2), (11, 3), (36, 1))
        entries = (f'   {{\n      "Channel" : {channel},\n      "Order" : {order}\n   }}' for channel, order in orders)
        values = [('   "congestion_value" : 42', '   "order" : 3'), ('   "noise_value" : 67', '   "order" : 3')]
        congestion, noise = ("{\n" + ",\n".join(members) + "\n}\n" for members in values)
        self.assert_answers(
            client,
            ("GET_CURRENT_CHANNEL", spectral(CHANNEL, "0")),
            ("GET_CHANNEL_LIST", spectral("RADIO_ON"), spectral(CHANNEL_LIST, "[\n" + ",\n".join(entries) + "\n]\n")),
            ("FULL_SCAN", spectral("SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION", congestion)),
            (None, spectral("SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE", noise)),
        )

    def test_a_list_that_was_never_known_is_null(self):
        for radio, scenario in (
            ("RADIO_ON", {}),
            ("RADIO_OFF", {"adapters": [], "spectrum": {"channels": [1]}}),
            ("RADIO_ON", {"spectrum": {"channels": []}}),
        ):
            with self.subTest(scenario), Machine({"speed": 20, **scenario}) as machine:
                answers = spectral(radio), spectral(CHANNEL_LIST, "null\n")
                self.assert_answers(machine.sa(), ("GET_CHANNEL_LIST", *answers))

    def test_events_of_the_adapter(self):
        self.start()
        sa, hs20 = self.machine.sa(), self.machine.hs20()
        for action, radio, *names in (
            ("pullAdapter", "false\n", "CARD_PLUG_OUT"),
            ("insertAdapter", "true\n", "RADIO_ON", "CARD_PLUG_IN"),
        ):
            self.control.do(action)
            self.assert_answers(sa, (None, *map(spectral, names)))
            self.assert_answers(
                hs20,
                (None, spectral(names[-1])),
                ("GET_IS_CARD_IN", hotspot(names[-1], "")),
                ("GET_RADIO", hotspot("GET_RADIO", radio)),
            )


# Messages that are no command, whatever the port. @ stands for one.
NOTHING = [
    b"", b"\0", b'\0{"CommandId":"@"}', b" \r\n\t ", b"hello", b"@", b'"@"', b"42", b"1e308", b"1e999999999",
    b"9" * 5000, b"true", b"null", b'["@"]', b'[{"CommandId":"@"}]', b"{}", b'{"Command":"@"}', b'{"commandid":"@"}',
    b'{"CommandId":"get_radio"}', b'{"CommandId":" @ "}', b'{"CommandId":"FORMAT_DISK"}',
    b'{"CommandId":"%d%s%n%x"}', b'{"CommandId":"' + b"A" * 100000 + b'"}', b'{"CommandId":""}',
    b'{"CommandId":"@\\u0000"}', b'{"CommandId":1}', b'{"CommandId":1.5}', b'{"CommandId":true}',
    b'{"CommandId":null}', b'{"CommandId":["@"]}', b'{"CommandId":{"CommandId":"@"}}', b"/* @ */", b"/* @",
    b"\xff\xfe\x80", b'{"CommandId":"\\ud800"}', b'{"CommandId":"\\q"}', b"[" * 200000, b'{"a":' * 50000,
    '{"CommandId":"GET_RADIO"}'.encode("utf-16-le"), b"[" * 2000 + b"]" * 2000,
    b'{"A":' + b"[" * 5000 + b"]" * 5000 + b',"CommandId":"@"}',
]  # fmt: skip

# Messages that are the command nevertheless.
SOMETHING = [
    b' \r\n { "CommandId" : "@" } ',
    b'{"x":[1,{"y":null}],"CommandId":"@","CommandID":"FULL_SCAN"}',
    b'/* a */ {"CommandId": // b\n "@" /* c */}',
    b'{"Comm\\u0061ndId":"@"}',
    b'{"CommandId":"@"}\0{"CommandId":"x"}\xff',
    b'{"CommandId":"x","CommandId":"@"}',
]

# On the hotspot port alone `Data` counts as well.
DATA_OF_WRONG_TYPE = [b"1", b"-1", b"1.5", b"[]", b"{}", b'["true"]', b'{"a":"b"}']
DATA_THAT_IS_FINE = [b'""', b'"true"', b"true", b"false", b"null", b'"{"', b'"\\u0000"', b'"' + b"[" * 4000 + b'"']


def with_data(*values):
    return [b'{"CommandId":"@","Data":' + value + b"}" for value in values]


class Reading(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.machine = cls.enterClassContext(Machine({"speed": 20}))
        cls.sa, cls.hs20 = cls.machine.sa(), cls.machine.hs20()

    # The answer to a second command, another one on the hotspot port, shows what the first has come to.
    def assert_answers(self, texts, on_sa, on_hs20):
        """How often each is answered on each port."""
        for client, command, answer, marker, end, count in (
            (self.sa, b"GET_CURRENT_CHANNEL", CHANNEL, "GET_CHANNEL_LIST", CHANNEL_LIST, on_sa),
            (self.hs20, b"GET_RADIO", "GET_RADIO", "GET_IS_CARD_IN", "CARD_PLUG_IN", on_hs20),
        ):
            for text in texts:
                with self.subTest(text[:200], answer=answer):
                    client.send_frame(BINARY, text.replace(b"@", command))
                    client.send(marker)
                    came = []
                    while end not in came:
                        came.append(client.next_event()["EventId"])
                    self.assertEqual(came.count(answer), count, came)

    def test_what_is_no_command(self):
        self.assert_answers(NOTHING, 0, 0)

    def test_what_is_a_command_nevertheless(self):
        self.assert_answers(SOMETHING, 1, 1)

    def test_every_beginning_of_a_command_is_survived(self):
        whole = b'{"Data":"{\\"a\\":[1,true]}","CommandId":"@"}'
        self.assert_answers([whole[:end] for end in range(len(whole))], 0, 0)

    def test_data_counts_on_the_hotspot_port_alone(self):
        self.assert_answers(with_data(*DATA_OF_WRONG_TYPE), 1, 0)
        self.assert_answers(with_data(*DATA_THAT_IS_FINE), 1, 1)

    def test_every_message_has_its_line(self):
        for text, told in (
            (b'{"CommandId":"A b"}', "A b"),
            (b'{"CommandId":"A\\u0000b"}', "A"),
            (b'{"CommandId":3}', ""),
            (b'{"CommandId":"%d%s%n"}', "%d%s%n"),
            (b"[[[", ""),
            (b"\0", ""),
        ):
            with self.subTest(text):
                before = len(self.machine.output())
                self.sa.send_frame(BINARY, text)
                line = f"Service request from client : request id = {told}\n"
                wait_until(lambda: self.machine.output()[before:] == line, line)
