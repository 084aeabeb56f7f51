"""The values that are published, against a computation of its own over thousands of records."""

import json
import math
import random

from harness import Machine, Story, wait_until


def channel_of(frequency):
    """0 for none."""
    if frequency == 0:
        return 0
    if frequency == 2484:
        return 14
    if frequency < 2484:
        return int((frequency - 2407) / 5)
    if frequency < 4900:
        return 15 + int((frequency - 2512) / 20)
    return (frequency - (4000 if frequency <= 5000 else 5000)) // 5


def power_of_ten(exponent):
    try:
        return 10.0**exponent if exponent >= 0 else 1.0 / 10.0 ** abs(exponent)
    except OverflowError:
        return math.inf if exponent >= 0 else 0.0


def decibels(ratio):
    if math.isnan(ratio):
        return math.nan
    if ratio == 0.0:
        return -120.0
    return max(-120.0, 10.0 * math.log10(ratio))


def level_of(power, bins):
    total = float(sum(value * value for value in bins))
    factor = power_of_ten((power - 96) / 10.0)
    level = 0.0
    for value in bins:
        magnitude = float(value or 1)
        share = magnitude * magnitude / total if total else math.inf
        level += decibels(math.nan if share == math.inf and factor == 0.0 else share * factor)
    return level / 56.0


def percent(mean, base=0):
    if math.isnan(mean) or not -(2.0**31) - 1 < mean < 2.0**31:
        return 0
    return min(100, max(0, int(mean) + base))


class Model:
    """What a client of the spectral port has to hear."""

    def __init__(self, channels):
        self.order = {channel: i + 1 for i, channel in enumerate(dict.fromkeys(channels))}
        self.tables = {order: [0, 0, 0, 0] for order in self.order.values()}

    def scan(self, records):
        by_channel = {}
        for record in records:
            by_channel.setdefault(channel_of(record["frequency"]), []).append(record)
        for channel, group in by_channel.items():
            if channel in self.order:
                levels = congestion = 0.0
                for record in group:
                    levels += level_of(record["power"], bins_of(record))
                    congestion += record["congestion"]
                levels = 1.7976931348623157e308 if math.isinf(levels) else levels
                table = self.tables[self.order[channel]]
                table[0:2] = percent(congestion / len(group)), percent(levels / len(group), 120)
        return [event for order in sorted(self.tables) for event in self.publish(order, self.tables[order])]

    @staticmethod
    def publish(order, table):
        congestion, noise, last_congestion, last_noise = table
        if last_congestion:
            congestion = int(0.4 * last_congestion + 0.6 * congestion)
        if congestion != last_congestion:
            yield {"order": order, "congestion_value": congestion}
        table[0] = table[2] = congestion
        if noise not in (last_noise, 0):
            yield {"order": order, "noise_value": noise}
            table[3] = noise


def bins_of(record):
    bins = record["bins"]
    return [bins] * 56 if isinstance(bins, int) else bins


def frequency_of(channel):
    return 2484 if channel == 14 else 2407 + 5 * channel if channel < 14 else 5000 + 5 * channel


CHANNELS = [36, 1, 6, 36, 11, 14, 165, 1, 149, 100, 13, 200, 255, 12, 40]
EDGES = [0, 1, 2401, 2402, 2403, 2406, 2407, 2411, 2483, 2485, 2511, 2512, 4899, 4900, 4920, 5000, 5001, 5004, 65535]


def random_record(chance):
    frequencies = [frequency_of(channel) for channel in CHANNELS] * 3 + EDGES + [chance.randrange(65536)]
    usual = (chance.randrange(-20, 120),) * 20
    unusual = (chance.randrange(-(2**15), 2**15), -(2**15), 2**15 - 1, -2980, -3140, 3100, 3200, 96, 95)
    any_bins = [chance.randrange(256) for _ in range(56)]
    few_bins = [chance.choice((0, 0, 0, 1, 255)) for _ in range(56)]
    return {
        "frequency": chance.choice(frequencies),
        "congestion": chance.choice((chance.randrange(101),) * 20 + (0, 65535)),
        "power": chance.choice(usual + unusual),
        "bins": chance.choice((chance.randrange(256), [0] * 56, few_bins, any_bins, any_bins, any_bins)),
    }


def quiet_record(chance, **members):
    return {**random_record(chance), "power": chance.randrange(-60, 97), "bins": chance.randrange(1, 256), **members}


def of_channel_1(name, values, **members):
    """A scan for each value of one member."""
    return [[{"frequency": 2412, "congestion": 0, "power": 0, "bins": 100, **members, name: value}] for value in values]


class Values(Story):
    def assert_published(self, channels, scans):
        spectrum = {"channels": channels, "scans": scans, "scanMs": 50}
        model = Model(channels)
        expected = [event for scan in scans for event in model.scan(scan)]
        self.assertGreater(len(expected), 3)
        with Machine({"speed": 20, "spectrum": spectrum}) as machine:
            client = machine.sa()
            client.send("GET_CHANNEL_LIST")
            client.send("FULL_SCAN")
            starts = len(scans) + 2
            wait_until(lambda: len(machine.control.query("calls")) > starts, "the last scan")
            client.send("GET_CURRENT_CHANNEL")
            client.wait_event("SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G")
            published = []
            while (event := client.next_event())["EventId"] != "SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA":
                sample = json.loads(event["Data"])
                name = "CONGESTION" if "congestion_value" in sample else "INTERFERENCE"
                self.assertEqual(event["EventId"], f"SPECTRAL_ANALYSER_SAMPLE_DATA_{name}")
                published.append(sample)
        for i, (got, wanted) in enumerate(zip(published, expected)):
            self.assertEqual(got, wanted, f"event {i} of {len(expected)}")
        self.assertEqual(len(published), len(expected))

    def test_thousands_of_records_of_every_kind(self):
        for seed in range(2):
            chance = random.Random(seed)
            with self.subTest(seed):
                self.assert_published(CHANNELS, [[random_record(chance) for _ in range(100)] for _ in range(20)])

    def test_one_record_for_each_value_and_many_of_one_channel(self):
        chance = random.Random(10)
        self.assert_published(CHANNELS, [[quiet_record(chance) for _ in range(25)] for _ in range(60)])
        self.assert_published([1], [[quiet_record(chance, frequency=2412) for _ in range(400)] for _ in range(5)])

    def test_every_frequency_has_its_channel(self):
        edges = (2407, 2412, 2477, 2482, 2483, 2484, 2485, 2531, 2532, 2552, 4899, 4900, 4920, 5000, 5001, 5005, 5180)
        scans = [
            [{"frequency": frequency, "congestion": 7 + i, "power": 30, "bins": 1 + i}]
            for i, frequency in enumerate(edges)
        ]
        self.assert_published(list(range(256)), scans)

    def test_the_smoothing_of_congestion_and_interference_that_falls_to_nothing(self):
        congestion = [50, 20, 20, 20, 0, 0, 0, 0, 0, 0, 0, 7, 100, 65535, 1, 2, 1]
        power = [60, -200, 60, -200, 61, 60, -200, -200, 96, 200]
        self.assert_published([1], of_channel_1("congestion", congestion) + of_channel_1("power", power))

    def test_the_model_by_values_that_were_worked_out_by_hand(self):
        for power, value in ((60, 67), (96, 100)):
            (scan,) = of_channel_1("power", [power])
            self.assertEqual(Model([1]).scan(scan), [{"order": 1, "noise_value": value}])
        scan = [record for (record,) in of_channel_1("congestion", (30, 41), bins=0)]
        self.assertEqual(Model([1]).scan(scan), [{"order": 1, "congestion_value": 35}])
