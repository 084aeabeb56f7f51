"""The scan cycle: requests byte for byte, the watchdog, what malformed notifications do. The test owns the time."""

import json
import struct

from harness import CHANNEL, Story

SIGNATURE, MAGIC, SAMPLES, COMPLETED = 0x06C45E00, 23602, 1, 2
HOTSPOT_SIGNATURE = 0x03C45E00
OTHER = "{11111111-2222-3333-4444-555555555555}"
NOT_FOUND = 1168
PERIOD = 10000

CONGESTION, NOISE = ("congestion_value", 1, 30), ("noise_value", 1, 67)

REQUESTS = {
    struct.pack("<4I8x2I", 1, 0xFFA3000B, 0, 8, number, 0).hex(): what for number, what in enumerate(("stop", "start"))
}


def header(subtype, magic=MAGIC, signature=SIGNATURE):
    return struct.pack("<4I", signature, 0xEEEEEEEE, subtype, magic)


def samples(*congestions, count=None, magic=MAGIC):
    """Records of channel 1, with 0xEE in most of what nobody has to read for these."""
    records = (struct.pack("<HH", 2412, congestion).ljust(236, b"\xee") for congestion in congestions)
    announced = len(congestions) if count is None else count
    return header(SAMPLES, magic) + struct.pack("<H", announced) + b"".join(records)


def debug_texts(what, result):
    operation = {"start": "OnStartFullScan()", "stop": "OnStopScan()"}[what]
    ends = {0: ["dwErr == ERROR_SUCCESS"], 31: ["dwErr=0x1f"] if what == "start" else []}[result]
    return [f"portlink begin spectral {operation}", *(f"portlink spectral {operation} {end}" for end in ends)]


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

    def now(self):
        return self.control.query("time")["ms"]

    def requests(self):
        """The scan requests as (what, when, result)."""
        calls = self.control.calls("WlanIhvControl")
        return [(REQUESTS[c["inHex"]], c["atMs"], c["result"]) for c in calls if c["inHex"] in REQUESTS]

    def watchdog_looks(self):
        return self.machine.debug_log().count("ScanTimerRoutine")


class Requests(ScanStory):
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
                before = len(self.machine.debug_log().splitlines())
                if failing is not None:
                    self.control.do("fail", call="WlanIhvControl", match="scan", error=31, **failing)
                self.send(*commands)
                self.advance(3 * PERIOD)
                self.assertEqual([(what, result) for what, _, result in self.requests()], asked)
                said = [line for line in self.machine.debug_log().splitlines()[before:] if line.startswith("portlink")]
                self.assertEqual(said, [text for request in asked for text in debug_texts(*request)])


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
    def test_a_list_forgets_the_values_and_one_that_fails_or_is_cut_short_does_not(self):
        self.begin()
        self.send("GET_CHANNEL_LIST", "FULL_SCAN")
        self.advance(400)
        self.assertEqual(self.values(), [CONGESTION, NOISE])
        self.control.do("fail", call="WlanIhvControl", match="channelList", error=31)
        for cut in (None, 0, 43):
            if cut is not None:
                self.control.do("reply", match="channelList", dataHex="00" * cut)
            known = json.loads(self.client.ask("GET_CHANNEL_LIST")["Data"])
            self.assertEqual(known, [{"Channel": 1, "Order": 1}, {"Channel": 6, "Order": 2}], cut)
        self.advance(4000)
        self.assertEqual(self.values(), [])
        self.control.do("levels", levels={"1": {"congestion": 80, "power": 60, "spread": 0}})
        self.send("GET_CHANNEL_LIST")
        self.advance(400)
        self.assertEqual(self.values(), [("congestion_value", 1, 80), NOISE])


class Notifications(ScanStory):
    def setUp(self):
        self.begin(levels={})
        self.send("GET_CHANNEL_LIST")

    def complete(self, magic=0):
        self.ihv(header(COMPLETED, magic))
        return [value for name, _, value in self.values()]

    def test_records_are_published_at_the_completion_which_needs_no_magic(self):
        for magic in (0, MAGIC, 0xFFFFFFFF):
            self.send("GET_CHANNEL_LIST")
            self.ihv(samples(30, 41))
            self.ihv(samples(50))
            self.assertEqual(self.values(), [])
            self.assertEqual(self.complete(magic), [40])
            self.assertEqual(self.complete(magic), [])

    def test_notifications_that_mean_nothing(self):
        good = samples(50)
        cases = [good[:length] for length in (0, 1, 15, 16, 17, 18, len(good) - 1)]
        cases += [samples(50, count=0), samples(50, magic=MAGIC + 1), samples(50, magic=MAGIC | 0x10000)]
        cases += [header(subtype) + good[16:] for subtype in (0, 3, 0x101)]
        cases += [header(SAMPLES, signature=0x07C45E00) + good[16:], b"\x06\xc4\x5e\x00" + good[4:]]
        cases += [bytes(300), b"\xff" * 300]
        for subtype in range(9):
            for length in (0, 1, 8, 43, 44, 51, 52, 104):
                cases.append(header(subtype, length, HOTSPOT_SIGNATURE) + b"\xff" * length)
        for data in cases:
            with self.subTest(data):
                self.ihv(data)
                self.assertEqual(self.complete(), [])
        self.ihv(good)
        self.assertEqual(self.complete(), [50])

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
