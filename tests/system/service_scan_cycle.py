"""The scan cycle: requests byte for byte, the watchdog, what malformed notifications do. The test owns the time."""

import json
import struct
import unittest

from harness import Machine

SIGNATURE, MAGIC, SAMPLES, COMPLETED = 0x06C45E00, 23602, 1, 2
HOTSPOT_SIGNATURE = 0x03C45E00
OTHER = "{11111111-2222-3333-4444-555555555555}"
NOT_FOUND = 1168
PERIOD = 10000

CHANNEL_LIST = "SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G"
CHANNEL = "SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA"
LEVELS = {"1": {"congestion": 30, "power": 60, "spread": 0}}

START = struct.pack("<4I8x2I", 1, 0xFFA3000B, 0, 8, 1, 0).hex()
STOP = struct.pack("<4I8x2I", 1, 0xFFA3000B, 0, 8, 0, 0).hex()
LIST = struct.pack("<4I8x4I", 0, 0xFF500004, 0, 2068, 0x00100180, 2056, 2056, 0).ljust(2092, b"\0").hex()


def header(subtype, magic=MAGIC, signature=SIGNATURE):
    return struct.pack("<4I", signature, 0xEEEEEEEE, subtype, magic)


def record(frequency=2412, congestion=50, power=60, magnitude=100):
    """With 0xEE in all that nobody has to read."""
    text = bytearray(b"\xee" * 236)
    struct.pack_into("<HH", text, 0, frequency, congestion)
    struct.pack_into("<h", text, 7, power)
    text[56:112] = bytes([magnitude]) * 56
    return bytes(text)


def samples(*records, count=None, magic=MAGIC):
    announced = len(records) if count is None else count
    return header(SAMPLES, magic) + struct.pack("<H", announced) + b"".join(records)


class World(unittest.TestCase):
    def start(self, **spectrum):
        spectrum = {"channels": [1, 6], "levels": LEVELS, "scanMs": 400, **spectrum}
        machine = Machine({"speed": 0, "spectrum": spectrum})
        self.addCleanup(machine.__exit__, None, None, None)
        machine.__enter__()
        self.machine, self.control, self.client = machine, machine.control, machine.sa()

    def send(self, *commands):
        """Comes back when they have been carried out; what is still to be taken has come with them."""
        for command in commands:
            self.client.send(command)
        return self.values()

    def values(self):
        """The values published since the last look, as (name, order, value)."""
        self.client.send("GET_CURRENT_CHANNEL")
        published = []
        while (event := self.client.next_event())["EventId"] != CHANNEL:
            if "SAMPLE" in event["EventId"]:
                sample = json.loads(event["Data"])
                order = sample.pop("order")
                ((name, value),) = sample.items()
                published.append((name, order, value))
        return published

    def advance(self, milliseconds):
        self.control.do("advance", ms=milliseconds)

    def ihv(self, data, **members):
        self.control.do("ihv", dataHex=data.hex(), **members)

    def now(self):
        return self.control.query("time")["ms"]

    def calls(self):
        """What the spectral module was asked; the hotspot module's requests are of another type."""
        return [call for call in self.control.query("calls") if call["type"] == 1]

    def requests(self):
        """The scan requests as (what, when, result)."""
        names = {START: "start", STOP: "stop"}
        calls = self.calls()
        return [(names[c["inHex"]], c["atMs"], c["result"]) for c in calls if c["inHex"] in names]


CONGESTION, NOISE = ("congestion_value", 1, 30), ("noise_value", 1, 67)


class Requests(World):
    def test_byte_for_byte(self):
        self.start()
        self.send("FULL_SCAN", "STOP_SCAN", "GET_CHANNEL_LIST")
        calls = self.calls()
        self.assertEqual([call["inHex"] for call in calls], [START, STOP, LIST])
        self.assertEqual({(call["call"], call["type"], call["result"]) for call in calls}, {("WlanIhvControl", 1, 0)})
        self.assertEqual([call["outSize"] for call in calls], [0, 0, 2092])

    def test_a_stop_without_a_scan_asks_for_nothing(self):
        self.start()
        self.send("STOP_SCAN", "STOP_SCAN")
        self.assertEqual(self.calls(), [])
        self.send("FULL_SCAN", "STOP_SCAN", "STOP_SCAN")
        self.assertEqual([what for what, _, _ in self.requests()], ["start", "stop"])

    def test_a_stop_that_fails_is_a_stop(self):
        self.start()
        self.send("FULL_SCAN")
        self.control.do("fail", call="WlanIhvControl", match="scan", error=31)
        self.send("STOP_SCAN", "STOP_SCAN")
        self.assertEqual([(what, result) for what, _, result in self.requests()], [("start", 0), ("stop", 31)])
        self.advance(3 * PERIOD)
        self.assertEqual(len(self.requests()), 2)

    def test_a_second_start_is_asked_for_as_well(self):
        self.start()
        self.send("FULL_SCAN", "FULL_SCAN")
        self.assertEqual([what for what, _, _ in self.requests()], ["start", "start"])


class Cycle(World):
    def test_a_completion_starts_the_next_scan_and_puts_the_watchdog_off(self):
        self.start(scanMs=6000)
        began = self.now()
        self.send("GET_CHANNEL_LIST", "FULL_SCAN")
        self.advance(5999)
        self.assertEqual(self.values(), [])
        self.advance(1)
        self.assertEqual(self.values(), [CONGESTION, NOISE])
        self.advance(24000)
        self.assertEqual([at - began for _, at, _ in self.requests()], [0, 6000, 12000, 18000, 24000, 30000])
        self.assertNotIn("ScanTimerRoutine", self.machine.debug_log())

    def test_nothing_more_is_asked_for_after_a_stop(self):
        self.start()
        self.send("FULL_SCAN")
        self.advance(1000)
        self.send("STOP_SCAN")
        known = self.requests()
        self.assertEqual(known[-1][0], "stop")
        self.advance(5 * PERIOD)
        self.assertEqual(self.requests(), known)
        self.assertIn("ScanTimerRoutine", self.machine.debug_log())

    def test_the_watchdog_publishes_and_starts_anew(self):
        self.start(completes=False)
        self.assertEqual(self.send("GET_CHANNEL_LIST", "FULL_SCAN"), [])
        began = self.now()
        self.advance(PERIOD - 1 - began)
        self.assertEqual(self.values(), [])
        self.assertEqual(len(self.requests()), 1)
        self.advance(1)
        self.assertEqual(self.values(), [CONGESTION, NOISE])
        self.assertEqual([(what, at) for what, at, _ in self.requests()], [("start", began), ("start", PERIOD)])
        self.advance(2 * PERIOD)
        self.assertEqual([at for _, at, _ in self.requests()][2:], [2 * PERIOD, 3 * PERIOD])

    def test_a_failing_start_is_tried_again(self):
        self.start()
        self.control.do("fail", call="WlanIhvControl", match="scan", error=31, times=2)
        self.send("GET_CHANNEL_LIST", "FULL_SCAN")
        self.advance(2 * PERIOD)
        tries = [(at, result) for _, at, result in self.requests()]
        self.assertEqual(tries[1:3], [(PERIOD, 31), (2 * PERIOD, 0)])
        self.assertEqual(self.values(), [])
        self.advance(400)
        self.assertEqual(self.values(), [CONGESTION, NOISE])

    def test_a_stop_after_a_failing_start_is_asked_for(self):
        self.start()
        self.control.do("fail", call="WlanIhvControl", match="scan", error=31)
        self.send("FULL_SCAN", "STOP_SCAN")
        self.assertEqual([(what, result) for what, _, result in self.requests()], [("start", 31), ("stop", 0)])

    def test_a_restart_in_a_period_counts_from_there(self):
        self.start()
        self.advance(7000)
        self.ihv(header(COMPLETED))
        before = self.machine.debug_log().count("ScanTimerRoutine")
        self.advance(PERIOD - 1)
        self.assertEqual(self.machine.debug_log().count("ScanTimerRoutine"), before)
        self.advance(1)
        self.assertEqual(self.machine.debug_log().count("ScanTimerRoutine"), before + 1)

    def test_scanning_survives_the_adapter_s_absence(self):
        self.start()
        self.send("GET_CHANNEL_LIST", "FULL_SCAN")
        self.control.do("pullAdapter")
        self.advance(PERIOD)
        self.control.do("insertAdapter")
        self.values()
        self.advance(2 * PERIOD)
        self.assertEqual(self.values(), [CONGESTION, NOISE])


class Lists(World):
    def test_no_values_before_a_list(self):
        self.start()
        self.send("FULL_SCAN")
        self.advance(2000)
        self.assertEqual(self.values(), [])
        self.assertEqual(self.send("GET_CHANNEL_LIST"), [])
        self.advance(400)
        self.assertEqual(self.values(), [CONGESTION, NOISE])

    def test_a_list_forgets_the_values(self):
        self.start()
        self.send("GET_CHANNEL_LIST", "FULL_SCAN")
        self.advance(400)
        self.assertEqual(self.values(), [CONGESTION, NOISE])
        self.advance(4000)
        self.assertEqual(self.values(), [])
        self.control.do("levels", levels={"1": {"congestion": 80, "power": 60, "spread": 0}})
        self.send("GET_CHANNEL_LIST")
        self.advance(400)
        self.assertEqual(self.values(), [("congestion_value", 1, 80), NOISE])

    def test_a_list_that_fails_forgets_nothing(self):
        self.start()
        self.send("GET_CHANNEL_LIST", "FULL_SCAN")
        self.advance(400)
        self.assertEqual(self.values(), [CONGESTION, NOISE])
        self.control.do("fail", call="WlanIhvControl", match="channelList", error=31)
        self.assertEqual(self.channels(), [(1, 1), (6, 2)])
        self.advance(400)
        self.assertEqual(self.values(), [])

    def channels(self):
        self.client.send("GET_CHANNEL_LIST")
        entries = json.loads(self.client.wait_event(CHANNEL_LIST)["Data"])
        return [(entry["Channel"], entry["Order"]) for entry in entries or []]

    def test_answers_of_the_module(self):
        self.start()

        def answer(count, *channels):
            entries = b"".join(b"\xee\xee" + bytes([channel]) + b"\xee" * 5 for channel in channels)
            return b"\0" * 40 + struct.pack("<I", count) + entries

        every = tuple(range(256))
        cases = (
            ("two", answer(2, 9, 3), [(3, 2), (9, 1)]),
            ("a repeat", answer(4, 9, 3, 9, 1), [(1, 3), (3, 2), (9, 1)]),
            ("fewer than there are", answer(1, 9, 3), [(9, 1)]),
            ("more than there are", answer(200, 9, 3), [(3, 2), (9, 1)]),
            ("a count beyond all", answer(0xFFFFFFFF, 9, 3), [(3, 2), (9, 1)]),
            ("half an entry", answer(2, 9, 3)[:-1], [(9, 1)]),
            ("channel 0 and 255", answer(2, 255, 0), [(0, 2), (255, 1)]),
            ("as many as fit", answer(256, *every), [(channel, channel + 1) for channel in every]),
            ("no entry", answer(5), []),
            ("no count", b"\0" * 43, []),
            ("a single byte", b"\xff", []),
        )
        for name, data, expected in cases:
            with self.subTest(name):
                self.control.do("reply", match="channelList", dataHex=data.hex())
                self.assertEqual(self.channels(), expected)


class Notifications(World):
    def setUp(self):
        self.start(levels={})
        self.send("GET_CHANNEL_LIST")

    def complete(self, magic=0):
        self.ihv(header(COMPLETED, magic))
        return self.values()

    def test_records_are_published_at_the_completion(self):
        self.ihv(samples(record(congestion=30), record(congestion=41)))
        self.ihv(samples(record(2437, congestion=8)))
        self.assertEqual(self.values(), [])
        published = self.complete()
        self.assertEqual([value for name, _, value in published if name == "congestion_value"], [35, 8])
        self.assertEqual(self.complete(), [])

    def test_records_that_do_not_fit_are_dropped(self):
        two = record(congestion=10) + record(congestion=20)
        cases = (
            ("more announced than there are", samples(two, count=5), 15),
            ("the most that can be announced", samples(two, count=0xFFFF), 15),
            ("a third without its last byte", samples(two, record(congestion=90)[:-1], count=3), 15),
            ("fewer announced than there are", samples(two, count=1), 10),
        )
        for name, data, expected in cases:
            with self.subTest(name):
                self.send("GET_CHANNEL_LIST")
                self.ihv(data)
                self.assertIn(("congestion_value", 1, expected), self.complete())

    def test_notifications_that_mean_nothing(self):
        good = samples(record())
        cases = {
            "no data": b"",
            "one byte": good[:1],
            "15 bytes": good[:15],
            "no count": good[:16],
            "half a count": good[:17],
            "no record": good[:18],
            "a record without its last byte": good[:-1],
            "no records announced": samples(record(), count=0),
            "a wrong magic": samples(record(), magic=MAGIC + 1),
            "a magic in 16 bits": samples(record(), magic=MAGIC | 0x10000),
            "subtype 0": header(0) + good[16:],
            "subtype 3": header(3) + good[16:],
            "subtype 0x101": header(0x101) + good[16:],
            "another signature": header(SAMPLES, signature=0x07C45E00) + good[16:],
            "a signature the wrong way round": b"\x06\xc4\x5e\x00" + good[4:],
            "zeros": bytes(300),
            "ones": b"\xff" * 300,
        }
        for subtype in range(9):
            for length in (0, 1, 8, 43, 44, 51, 52, 104):
                name = f"subtype {subtype} of the hotspot module with {length} bytes"
                cases[name] = header(subtype, length, HOTSPOT_SIGNATURE) + b"\xff" * length
        for name, data in cases.items():
            with self.subTest(name):
                self.ihv(data)
                self.assertEqual(self.complete(), [])
        self.ihv(good)
        self.assertTrue(self.complete())

    def test_a_completion_needs_neither_magic_nor_more_than_16_bytes(self):
        for magic in (0, MAGIC, 0xFFFFFFFF):
            self.send("GET_CHANNEL_LIST")
            self.ihv(samples(record()))
            self.assertTrue(self.complete(magic))

    def test_any_notification_of_the_module_tells_the_interface(self):
        for data in (b"", b"x" * 15, header(COMPLETED)):
            self.ihv(data, guid=OTHER)
            self.control.do("clearCalls")
            self.send("FULL_SCAN")
            self.assertEqual([result for _, _, result in self.requests()], [NOT_FOUND])
            self.client.send("GET_CHANNEL_LIST")
            self.assertEqual(self.client.next_event()["EventId"], "RADIO_OFF")
            self.client.send("GET_CHANNEL_LIST")
            self.client.wait_event("RADIO_ON")
            self.send("STOP_SCAN")

    def test_thousands_of_records_between_completions(self):
        many = samples(*[record(congestion=40)] * 1000)
        for _ in range(20):
            self.ihv(many)
        self.assertIn(("congestion_value", 1, 40), self.complete())


if __name__ == "__main__":
    unittest.main()
