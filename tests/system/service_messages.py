"""What the ports make of a message, and the exact text of what they send."""

import json
import re
import unittest

from harness import BINARY, Machine, wait_until

TIMESTAMP = r"\d{4}-\d\d-\d\dT\d\d:\d\d:\d\d "


def envelope(event_id, source, data=None):
    """A pattern of the whole text of an event, byte for byte but for the time."""
    lines = [f'   "EventId" : "{event_id}",', f'   "Source" : "{source}",', '   "Timestamp" : "@"']
    if data is not None:
        lines.insert(0, f'   "Data" : {json.dumps(data)},')
    text = "\n".join(["{", *lines, "}", ""])
    return re.compile(re.escape(text.encode()).replace(b"@", TIMESTAMP.encode()))


def spectral(event_id, data=None):
    return envelope(event_id, "SpectralAnalyser", data)


def hotspot(event_id, data=None):
    return envelope(event_id, "HotSpot20", data)


class Texts(unittest.TestCase):
    def assert_next(self, client, pattern):
        text = client.take()
        self.assertIsNotNone(pattern.fullmatch(text), f"{text!r}\nis not\n{pattern.pattern!r}")

    def test_answers_of_the_spectral_port(self):
        spectrum = {"channels": [36, 1, 36, 11]}
        with Machine({"speed": 20, "spectrum": spectrum}) as machine:
            client = machine.sa()
            client.send("GET_CURRENT_CHANNEL")
            self.assert_next(client, spectral("SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA", "0"))
            client.send("GET_CHANNEL_LIST")
            self.assert_next(client, spectral("RADIO_ON"))
            entries = ",\n".join(
                f'   {{\n      "Channel" : {channel},\n      "Order" : {order}\n   }}'
                for channel, order in ((1, 2), (11, 3), (36, 1))
            )
            self.assert_next(client, spectral("SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G", f"[\n{entries}\n]\n"))

    def test_a_list_that_was_never_known_is_null(self):
        for scenario in ({}, {"adapters": [], "spectrum": {"channels": [1]}}, {"spectrum": {"channels": []}}):
            with self.subTest(scenario), Machine({"speed": 20, **scenario}) as machine:
                client = machine.sa()
                client.send("GET_CHANNEL_LIST")
                client.take()
                self.assert_next(client, spectral("SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G", "null\n"))

    def test_sample_events(self):
        levels = {"6": {"congestion": 42, "power": 60, "spread": 0}}
        with Machine({"speed": 20, "spectrum": {"channels": [6], "levels": levels}}) as machine:
            client = machine.sa()
            client.send("GET_CHANNEL_LIST")
            client.send("FULL_SCAN")
            client.take(), client.take()
            for name, member, value in (("CONGESTION", "congestion_value", 42), ("INTERFERENCE", "noise_value", 67)):
                members = sorted([f'   "{member}" : {value}', '   "order" : 1'])
                data = "{\n" + ",\n".join(members) + "\n}\n"
                self.assert_next(client, spectral(f"SPECTRAL_ANALYSER_SAMPLE_DATA_{name}", data))

    def test_events_of_the_adapter(self):
        with Machine({"speed": 20}) as machine:
            sa, hs20 = machine.sa(), machine.hs20()
            machine.control.do("pullAdapter")
            self.assert_next(sa, spectral("CARD_PLUG_OUT"))
            self.assert_next(hs20, spectral("CARD_PLUG_OUT"))
            hs20.send("GET_IS_CARD_IN")
            self.assert_next(hs20, hotspot("CARD_PLUG_OUT", ""))
            hs20.send("GET_RADIO")
            self.assert_next(hs20, hotspot("GET_RADIO", "false\n"))
            machine.control.do("insertAdapter")
            self.assert_next(sa, spectral("RADIO_ON"))
            self.assert_next(sa, spectral("CARD_PLUG_IN"))
            self.assert_next(hs20, spectral("CARD_PLUG_IN"))
            hs20.send("GET_IS_CARD_IN")
            self.assert_next(hs20, hotspot("CARD_PLUG_IN", ""))
            hs20.send("GET_RADIO")
            self.assert_next(hs20, hotspot("GET_RADIO", "true\n"))


# Messages that are no command, whatever the port.
NOTHING = {
    "empty": b"",
    "a NUL": b"\0",
    "a NUL before a command": b"\0" + b'{"CommandId":"@"}',
    "blanks": b" \r\n\t ",
    "a word": b"hello",
    "the bare command": b"@",
    "a text": b'"@"',
    "a number": b"42",
    "a negative number": b"-1",
    "a real number": b"1e308",
    "a number out of range": b"1e999999999",
    "a very long number": b"9" * 5000,
    "true": b"true",
    "null": b"null",
    "an array": b'["@"]',
    "an array of a command": b'[{"CommandId":"@"}]',
    "an empty array": b"[]",
    "an empty object": b"{}",
    "another member": b'{"Command":"@"}',
    "a member in other case": b'{"commandid":"@"}',
    "a command in other case": b'{"CommandId":"get_radio"}',
    "blanks around the command": b'{"CommandId":" @ "}',
    "an unknown command": b'{"CommandId":"FORMAT_DISK"}',
    "percent signs": b'{"CommandId":"%d%s%n%x"}',
    "a long unknown command": b'{"CommandId":"' + b"A" * 100000 + b'"}',
    "an empty command": b'{"CommandId":""}',
    "a NUL inside the command": b'{"CommandId":"@\\u0000"}',
    "a number as command": b'{"CommandId":1}',
    "a real number as command": b'{"CommandId":1.5}',
    "true as command": b'{"CommandId":true}',
    "null as command": b'{"CommandId":null}',
    "an array as command": b'{"CommandId":["@"]}',
    "an object as command": b'{"CommandId":{"CommandId":"@"}}',
    "the end in the name": b'{"Comman',
    "the end before the value": b'{"CommandId":',
    "the end in the value": b'{"CommandId":"@',
    "only a comment": b"/* @ */",
    "a comment that does not end": b"/* @",
    "no UTF-8": b"\xff\xfe\x80",
    "half a surrogate": b'{"CommandId":"\\ud800"}',
    "an unknown escape": b'{"CommandId":"\\q"}',
    "UTF-16": '{"CommandId":"GET_RADIO"}'.encode("utf-16-le"),
    "deep arrays": b"[" * 200000,
    "deep objects": b'{"a":' * 50000,
    "deep arrays around": b"[" * 2000 + b"]" * 2000,
    "deep arrays before the command": b'{"A":' + b"[" * 5000 + b"]" * 5000 + b',"CommandId":"@"}',
}

# Messages that are the command nevertheless.
SOMETHING = {
    "blanks around": b' \r\n { "CommandId" : "@" } ',
    "other members": b'{"x":[1,{"y":null}],"CommandId":"@","CommandID":"FULL_SCAN"}',
    "a comment": b'/* a */ {"CommandId": // b\n "@" /* c */}',
    "escapes": b'{"Comm\\u0061ndId":"@"}',
    "bytes behind a NUL": b'{"CommandId":"@"}\0{"CommandId":"x"}\xff',
    "the last of two": b'{"CommandId":"x","CommandId":"@"}',
}

# On the hotspot port alone `Data` counts as well.
DATA_OF_WRONG_TYPE = [b"1", b"-1", b"1.5", b"[]", b"{}", b'["true"]', b'{"a":"b"}']
DATA_THAT_IS_FINE = [b'""', b'"true"', b"true", b"false", b"null", b'"{"', b'"\\u0000"', b'"' + b"[" * 4000 + b'"']


class Port:
    def __init__(self, client, command, answer):
        self.client, self.command, self.answer = client, command, answer

    def send(self, text):
        self.client.send_frame(BINARY, text.replace(b"@", self.command.encode()))


class Reading(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.machine = Machine({"speed": 20})
        cls.addClassCleanup(cls.machine.__exit__, None, None, None)
        cls.machine.__enter__()

    def setUp(self):
        self.sa = Port(self.machine.sa(), "GET_CURRENT_CHANNEL", "SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA")
        self.hs20 = Port(self.machine.hs20(), "GET_RADIO", "GET_RADIO")
        self.addCleanup(self.sa.client.close)
        self.addCleanup(self.hs20.client.close)

    # The answer to a second command, another one on the hotspot port, shows what the first has come to.
    def assert_answers(self, port, text, count, name):
        marker = "GET_IS_CARD_IN" if port is self.hs20 else "GET_CHANNEL_LIST"
        ends = "CARD_PLUG_IN" if port is self.hs20 else "SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G"
        port.send(text)
        port.client.send(marker)
        came = []
        while ends not in came:
            came.append(port.client.next_event()["EventId"])
        self.assertEqual(came.count(port.answer), count, f"{name}: {came}")

    def test_what_is_no_command(self):
        for port in (self.sa, self.hs20):
            for name, text in NOTHING.items():
                with self.subTest(name, port=port.answer):
                    self.assert_answers(port, text, 0, name)

    def test_what_is_a_command_nevertheless(self):
        for port in (self.sa, self.hs20):
            for name, text in SOMETHING.items():
                with self.subTest(name, port=port.answer):
                    self.assert_answers(port, text, 1, name)

    def test_every_beginning_of_a_command_is_survived(self):
        for port in (self.sa, self.hs20):
            whole = b'{"Data":"{\\"a\\":[1,true]}","CommandId":"@"}'
            text = whole.replace(b"@", port.command.encode())
            for end in range(text.index(b'"CommandId":"') + len(b'"CommandId":"')):
                with self.subTest(end, port=port.answer):
                    self.assert_answers(port, text[:end], 0, text[:end])

    def test_data_of_a_wrong_type_makes_no_command(self):
        for data in DATA_OF_WRONG_TYPE:
            text = b'{"CommandId":"@","Data":' + data + b"}"
            with self.subTest(data):
                self.assert_answers(self.hs20, text, 0, data)
                self.assert_answers(self.sa, text, 1, data)

    def test_data_that_a_command_does_not_use(self):
        for data in DATA_THAT_IS_FINE:
            text = b'{"CommandId":"@","Data":' + data + b"}"
            with self.subTest(data):
                self.assert_answers(self.hs20, text, 1, data)
                self.assert_answers(self.sa, text, 1, data)

    def test_every_message_has_its_line(self):
        cases = {
            b'{"CommandId":"A b"}': "A b",
            b'{"CommandId":"A\\u0000b"}': "A",
            b'{"CommandId":3}': "",
            b'{"CommandId":"%d%s%n"}': "%d%s%n",
            b"[[[": "",
            b"garbage": "",
            b"\0": "",
        }
        for text, told in cases.items():
            with self.subTest(text):
                before = len(self.machine.output())
                self.sa.send(text)
                line = f"Service request from client : request id = {told}\n"
                wait_until(lambda: self.machine.output()[before:] == line, line)


if __name__ == "__main__":
    unittest.main()
