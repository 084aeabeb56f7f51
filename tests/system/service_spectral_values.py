"""The values that are published of records of every kind, from scan to scan."""

import json

from harness import CHANNEL, CHANNEL_LIST, Story, wait_until

CHANNELS = [36, 1, 6, 36, 14, 255]
LOUD, QUIET, EVEN, MIXED = 32767, -32768, 100, list(range(200, 256))


def record(frequency, congestion, power=60, bins=EVEN):
    return {"frequency": frequency, "congestion": congestion, "power": power, "bins": bins}


# Scans, each with the values by their orders that it brings: a congestion c or an interference i.
SCANS = [
    ("a mean is truncated", [record(2412, 30), record(2412, 41)], "2:c35 2:i67"),
    ("what does not change is not told", [record(2412, 35)], ""),
    (
        "several channels in their order",
        [record(2437, 50, 96), record(5180, 20, -20), record(2484, 7, 40, MIXED)],
        "1:c20 3:c50 3:i100 4:c7 4:i47",
    ),
    (
        "congestion is smoothed and limited, interference limited",
        [record(2412, 65535, LOUD, MIXED), record(5180, 0)],
        "1:c8 1:i67 2:c74",
    ),
    ("interference that falls to nothing is not told", [record(2412, 100, QUIET), record(5180, 8)], "2:c89"),
    ("nor one that comes back as it was", [record(2412, 100), record(5180, 8)], "2:c95"),
    ("a bin without a magnitude counts as 1", [record(5180, 8, 60, [0] * 20 + [200] * 36)], "1:i53"),
    (
        "records without a magnitude spoil their channel",
        [record(2412, 100, 96, bins=0), record(2412, 100, 96), record(2437, 1, QUIET, bins=0)],
        "2:c98 3:c20",
    ),
    (
        "frequencies of no channel, and channels that are not listed",
        [record(frequency, 99) for frequency in (0, 2402, 2407, 2417, 2483, 2512, 4899, 5000, 5200, 65535)],
        "",
    ),
    (
        "frequencies at the end of a channel",
        [record(2416, 90), record(2485, 70), record(5184, 60), record(6275, 40)],
        "1:c39 1:i67 2:c93 4:c44 4:i67 5:c40 5:i67",
    ),
    ("a fall", [record(2437, 0)], "3:c8 3:i67"),
    ("goes on", [record(2437, 0)], "3:c3"),
    ("and on", [record(2437, 0)], "3:c1"),
    ("to its end", [record(2437, 0)], "3:c0"),
    ("from where a value counts as it is", [record(2437, 60, 61)], "3:c60 3:i68"),
    ("7 bins at -84.45 and 49 at the floor", [record(2437, 60, 20, ([255] + [0] * 7) * 7)], "3:i5"),
    ("bins in pairs, 28 at -14.64 and 28 at -28.62", [record(2437, 60, 96, [5, 5, 1, 1] * 14)], "3:i99"),
]


class Values(Story):
    NAMES = {
        "c": ("SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION", "congestion_value"),
        "i": ("SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE", "noise_value"),
    }

    def test_what_each_scan_brings(self):
        scans = [records for _, records, _ in SCANS]
        client = self.start(spectrum={"channels": CHANNELS, "scans": scans, "scanMs": 50}).sa()
        client.send("GET_CHANNEL_LIST")
        client.send("FULL_SCAN")
        wait_until(lambda: len(self.control.query("calls")) > len(scans) + 2, "the last scan")
        client.send("GET_CURRENT_CHANNEL")
        client.wait_event(CHANNEL_LIST)
        for name, _, expected in SCANS:
            for value in expected.split():
                event = client.next_event()
                event_id, member = self.NAMES[value[2]]
                told = {"order": int(value[0]), member: int(value[3:])}
                self.assertEqual((event["EventId"], json.loads(event["Data"])), (event_id, told), name)
        self.assertEqual(client.next_event()["EventId"], CHANNEL)
