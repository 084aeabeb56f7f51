"""The scan cycle: requests byte for byte, the watchdog, what malformed notifications do. The test owns the time."""

import json
import struct

from harness import Story

SIGNATURE, MAGIC, SAMPLES, COMPLETED = 0x06C45E00, 23602, 1, 2
HOTSPOT_SIGNATURE = 0x03C45E00
OTHER = "{11111111-2222-3333-4444-555555555555}"
NOT_FOUND = 1168
PERIOD = 10000

CHANNEL_LIST = "SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G"
CHANNEL = "SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA"
CONGESTION, NOISE = ("congestion_value", 1, 30), ("noise_value", 1, 67)

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


class ScanStory(Story):
    def begin(self, **spectrum):
        levels = {"1": {"congestion": 30, "power": 60, "spread": 0}}
        self.start(speed=0, spectrum={"channels": [1, 6], "levels": levels, "scanMs": 400, **spectrum})
        self.client = self.machine.sa()

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

    def channels(self):
        entries = json.loads(self.client.ask("GET_CHANNEL_LIST", answer=CHANNEL_LIST)["Data"])
        return [(entry["Channel"], entry["Order"]) for entry in entries or []]

    def now(self):
        return self.control.query("time")["ms"]

    def calls(self):
        """What the spectral module was asked; the hotspot module's requests are of another type."""
        return [call for call in self.control.query("calls") if call["type"] == 1]

    def requests(self):
        """The scan requests as (what, when, result)."""
        names = {START: "start", STOP: "stop"}
        return [(names[c["inHex"]], c["atMs"], c["result"]) for c in self.calls() if c["inHex"] in names]

    def watchdog_looks(self):
        return self.machine.debug_log().count("ScanTimerRoutine")


class Requests(ScanStory):
    def test_byte_for_byte(self):
        self.begin()
        self.send("FULL_SCAN", "STOP_SCAN", "GET_CHANNEL_LIST")
        calls = [(c["inHex"], c["outSize"], c["call"], c["result"]) for c in self.calls()]
        expected = [(START, 0), (STOP, 0), (LIST, 2092)]
        self.assertEqual(calls, [(*request, "WlanIhvControl", 0) for request in expected])

    def test_what_is_asked_for_until_the_stop_and_nothing_behind_it(self):
        self.begin()
        start, stop = "FULL_SCAN", "STOP_SCAN"
        for commands, failing, asked in (
            ((stop, stop), None, []),
            ((start, stop, stop), None, [("start", 0), ("stop", 0)]),
            ((start, start, stop), None, [("start", 0), ("start", 0), ("stop", 0)]),
            ((start, stop, stop), {"skip": 1}, [("start", 0), ("stop", 31)]),
            ((start, stop), {}, [("start", 31), ("stop", 0)]),
        ):
            with self.subTest(commands, failing=failing):
                self.control.do("clearCalls")
                if failing is not None:
                    self.control.do("fail", call="WlanIhvControl", match="scan", error=31, **failing)
                self.send(*commands)
                self.advance(3 * PERIOD)
                self.assertEqual([(what, result) for what, _, result in self.requests()], asked)


class Cycle(ScanStory):
    def test_a_completion_starts_the_next_scan_and_puts_the_watchdog_off(self):
        self.begin(scanMs=6000)
        began = self.now()
        self.send("FULL_SCAN")
        self.advance(12000)
        self.assertEqual(self.send("GET_CHANNEL_LIST"), [], "no values before a list")
        self.advance(5999)
        self.assertEqual(self.values(), [])
        self.advance(1)
        self.assertEqual(self.values(), [CONGESTION, NOISE])
        self.advance(12000)
        self.assertEqual([at - began for _, at, _ in self.requests()], [0, 6000, 12000, 18000, 24000, 30000])
        self.assertEqual(self.watchdog_looks(), 0)
        self.send("STOP_SCAN")
        known = self.requests()
        self.assertEqual(known[-1][0], "stop")
        self.advance(5 * PERIOD)
        self.assertEqual(self.requests(), known)
        self.assertGreater(self.watchdog_looks(), 0)

    def test_the_watchdog_publishes_and_starts_anew(self):
        self.begin(completes=False)
        self.assertEqual(self.send("GET_CHANNEL_LIST", "FULL_SCAN"), [])
        began = self.now()
        self.advance(PERIOD - 1 - began)
        self.assertEqual(self.values(), [])
        self.assertEqual(len(self.requests()), 1)
        self.advance(1)
        self.assertEqual(self.values(), [CONGESTION, NOISE])
        self.advance(2 * PERIOD)
        self.assertEqual(self.requests(), [("start", at, 0) for at in (began, PERIOD, 2 * PERIOD, 3 * PERIOD)])

    def test_a_failing_start_is_tried_again(self):
        self.begin()
        self.control.do("fail", call="WlanIhvControl", match="scan", error=31, times=2)
        self.send("GET_CHANNEL_LIST", "FULL_SCAN")
        self.advance(2 * PERIOD)
        tries = [(at, result) for _, at, result in self.requests()]
        self.assertEqual(tries[1:3], [(PERIOD, 31), (2 * PERIOD, 0)])
        self.assertEqual(self.values(), [])
        self.advance(400)
        self.assertEqual(self.values(), [CONGESTION, NOISE])

    def test_a_restart_in_a_period_counts_from_there(self):
        self.begin()
        self.advance(7000)
        self.ihv(header(COMPLETED))
        before = self.watchdog_looks()
        self.advance(PERIOD - 1)
        self.assertEqual(self.watchdog_looks(), before)
        self.advance(1)
        self.assertEqual(self.watchdog_looks(), before + 1)

    def test_scanning_survives_the_adapter_s_absence(self):
        self.begin()
        self.send("GET_CHANNEL_LIST", "FULL_SCAN")
        self.control.do("pullAdapter")
        self.advance(PERIOD)
        self.control.do("insertAdapter")
        self.values()
        self.advance(2 * PERIOD)
        self.assertEqual(self.values(), [CONGESTION, NOISE])


class Lists(ScanStory):
    def test_a_list_forgets_the_values_and_one_that_fails_does_not(self):
        self.begin()
        self.send("GET_CHANNEL_LIST", "FULL_SCAN")
        self.advance(400)
        self.assertEqual(self.values(), [CONGESTION, NOISE])
        self.control.do("fail", call="WlanIhvControl", match="channelList", error=31)
        self.assertEqual(self.channels(), [(1, 1), (6, 2)])
        self.advance(4000)
        self.assertEqual(self.values(), [])
        self.control.do("levels", levels={"1": {"congestion": 80, "power": 60, "spread": 0}})
        self.send("GET_CHANNEL_LIST")
        self.advance(400)
        self.assertEqual(self.values(), [("congestion_value", 1, 80), NOISE])

    def test_answers_of_the_module(self):
        self.begin()

        def answer(count, *channels):
            entries = b"".join(b"\xee\xee" + bytes([channel]) + b"\xee" * 5 for channel in channels)
            return b"\0" * 40 + struct.pack("<I", count) + entries

        every = tuple(range(256))
        for name, data, expected in (
            ("a repeat", answer(4, 9, 3, 9, 1), [(1, 3), (3, 2), (9, 1)]),
            ("fewer than there are", answer(1, 9, 3), [(9, 1)]),
            ("a count beyond all", answer(0xFFFFFFFF, 9, 3), [(3, 2), (9, 1)]),
            ("half an entry", answer(2, 9, 3)[:-1], [(9, 1)]),
            ("channel 0 and 255", answer(2, 255, 0), [(0, 2), (255, 1)]),
            ("as many as fit", answer(256, *every), [(channel, channel + 1) for channel in every]),
            ("no entry", answer(5), []),
            ("no count", b"\0" * 43, []),
            ("a single byte", b"\xff", []),
        ):
            with self.subTest(name):
                self.control.do("reply", match="channelList", dataHex=data.hex())
                self.assertEqual(self.channels(), expected)


class Notifications(ScanStory):
    def setUp(self):
        self.begin(levels={})
        self.send("GET_CHANNEL_LIST")

    def complete(self, magic=0):
        self.ihv(header(COMPLETED, magic))
        return self.values()

    def test_records_are_published_at_the_completion(self):
        for magic in (0, MAGIC, 0xFFFFFFFF):  # which a completion does not need
            self.send("GET_CHANNEL_LIST")
            self.ihv(samples(record(congestion=30), record(congestion=41)))
            self.ihv(samples(record(2437, congestion=8)))
            self.assertEqual(self.values(), [])
            published = self.complete(magic)
            self.assertEqual([value for name, _, value in published if name == "congestion_value"], [35, 8])
            self.assertEqual(self.complete(), [])

    def test_records_that_do_not_fit_are_dropped(self):
        two = record(congestion=10) + record(congestion=20)
        for name, data, expected in (
            ("more announced than there are", samples(two, count=5), 15),
            ("the most that can be announced", samples(two, count=0xFFFF), 15),
            ("a third without its last byte", samples(two, record(congestion=90)[:-1], count=3), 15),
            ("fewer announced than there are", samples(two, count=1), 10),
        ):
            with self.subTest(name):
                self.send("GET_CHANNEL_LIST")
                self.ihv(data)
                self.assertIn(("congestion_value", 1, expected), self.complete())

    def test_notifications_that_mean_nothing(self):
        good = samples(record())
        cases = {
            **{f"{length} bytes": good[:length] for length in (0, 1, 15, 16, 17, 18, len(good) - 1)},
            "no records announced": samples(record(), count=0),
            "a wrong magic": samples(record(), magic=MAGIC + 1),
            "a magic in 16 bits": samples(record(), magic=MAGIC | 0x10000),
            **{f"subtype {subtype:#x}": header(subtype) + good[16:] for subtype in (0, 3, 0x101)},
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

    def test_any_notification_of_the_module_tells_the_interface(self):
        for data in (b"", b"x" * 15, header(COMPLETED)):
            self.ihv(data, guid=OTHER)
            self.control.do("clearCalls")
            self.send("FULL_SCAN")
            self.assertEqual([result for _, _, result in self.requests()], [NOT_FOUND])
            self.client.send("GET_CHANNEL_LIST")
            self.assertEqual(self.client.next_event()["EventId"], "RADIO_OFF")
            self.client.ask("GET_CHANNEL_LIST", answer="RADIO_ON")
            self.send("STOP_SCAN")

    def test_thousands_of_records_between_completions(self):
        for _ in range(20):
            self.ihv(samples(*[record(congestion=40)] * 1000))
        self.assertIn(("congestion_value", 1, 40), self.complete())
