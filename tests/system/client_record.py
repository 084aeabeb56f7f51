"""`vexa record`, and what is made of a recording: statistics, a replay, a scenario."""

import json
import os
import signal
import subprocess
import zlib

from client_credentials import CredentialStory
from harness import CHANNEL_LIST, Story, clean_environment, network, wait_until

NETWORKS = [
    network(1, "Airport", {"roam.example": [21], "corp.example": [13]}),
    network(2, "Café", {}, internetAccess=0, networkType=3),
    network(3, "Later", {"late.example": [13]}, anqp="never", visible=False),
    {"bssid": "02:aa:00:00:00:04", "ssidHex": "c9e9", "realms": [], "visible": False},
]
CHANNELS = {"channels": [36, 6], "levels": {"6": {"congestion": 30, "power": 30}, "36": {"congestion": 60, "power": 60}}}
LIST = "GET_ALL_NETWORK_LIST"
SPEED = 20


def event(ms, name, data, port="sa"):
    envelope = {"EventId": name, "Source": "SpectralAnalyser" if port == "sa" else "HotSpot20", "Timestamp": ""}
    return {"ms": ms, "port": port, "event": {**envelope, "Data": json.dumps(data)}}


def sample(ms, kind, **value):
    return event(ms, f"SPECTRAL_ANALYSER_SAMPLE_DATA_{kind}", {"order": 1, **value})


HEADER = {"recording": "vexa", "format": 1, "version": "0", "started": "2026-01-02T03:04:05Z"}
WRITTEN = [
    HEADER,
    event(0, "SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G", [{"Channel": 6, "Order": 1}]),
    sample(1000, "CONGESTION", congestion_value=20), sample(1000, "INTERFERENCE", noise_value=60),
    sample(7000, "CONGESTION", congestion_value=80), {"ms": 11000, "end": True},
]  # fmt: skip


def text_of(lines):
    return "".join(json.dumps(line) + "\n" for line in lines)


class RecordStory(CredentialStory):
    scenario = {"speed": SPEED, "connectMs": 4000, "networks": NETWORKS, "spectrum": CHANNELS}

    def record(self, name, *options):
        self.file = self.new_folder() / name
        environment = clean_environment(VEXA_MACHINE=str(self.machine.folder))
        return self.running("record", self.file, *options, environment=environment)

    def recorded(self):
        """What can be read now; the file may be cut off anywhere."""
        data = self.file.read_bytes() if self.file.exists() else b""
        if self.file.suffix == ".gz":
            data = zlib.decompressobj(31).decompress(data)
        return [json.loads(line) for line in data.decode().split("\n")[:-1]]

    def events(self, name):
        return [line["event"] for line in self.recorded()[1:] if line.get("event", {}).get("EventId") == name]

    def wait_events(self, name, count=1):
        return wait_until(lambda: len(found := self.events(name)) >= count and found, f"{count} {name}")


class Recording(RecordStory):
    def test_events_of_both_ports_without_passwords_readable_whatever_ends_it(self):
        for name, number in (("a.rec", signal.SIGINT), ("a.rec.gz", signal.SIGINT), ("b.rec.gz", signal.SIGKILL)):
            with self.subTest(name):
                recorder, is_killed = self.record(name), number == signal.SIGKILL
                self.wait_events("SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE", 2)
                self.add_user(name, realm=name)
                wait_until(lambda: any(name in found["Data"] for found in self.events("GET_ALL_CREDENTIAL_LIST")), name)
                self.assertEqual((recorder.stop(number), recorder.errors), (-9 if is_killed else 130, []))
                if not is_killed:
                    self.assertRegex(recorder.lines[0], r"\ARecorded \d+ events in \d+\.\d s\.\Z")
                lines = self.recorded()
                self.assertEqual((lines[0]["format"], lines[0]["passwords"]), (1, False))
                self.assertEqual({line["port"] for line in lines if "port" in line}, {"sa", "hs20"})
                times = [line["ms"] for line in lines[1:]]
                self.assertEqual(times, sorted(times))
                self.assertEqual("end" in lines[-1], not is_killed)
                self.assertIn("********", str(lines))
                self.assertNotIn("secret", str(lines))
                self.assertEqual(self.file.stat().st_mode & 0o777, 0o600)
                told = json.loads(self.done("stats", self.file, "--json"))["channels"]
                self.assertEqual([(c["channel"], c["congestion"]["max"]) for c in told], [(6, 30), (36, 60)])

    def test_the_time_the_service_or_a_full_disk_ends_it(self):
        self.add_user("Roam", realm="roam.example")
        recorder = self.record("a.rec", "--for", "1s", "--passive", "--show-passwords", "--json")
        self.assertEqual((recorder.wait(), recorder.errors), (0, []))
        told = json.loads(recorder.lines[0])
        self.assertEqual((told["endedBy"], told["events"]), ("time", len(self.recorded()) - 2))
        self.assertEqual(self.events("SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION"), [])
        self.assertIn("secret", str(self.events("GET_ALL_CREDENTIAL_LIST")))
        self.assertIn("is there already", self.refused(1, "record", self.file))
        self.assertIn("No space left", self.refused(1, "record", "/dev/full"))
        self.refused(2, "record", "x.rec", "--for", "soon")
        printed = self.vexa("record", "-", "--for", "1s", "--passive")
        self.assertTrue(all(map(json.loads, printed.stdout.splitlines())))
        self.assertRegex(printed.stderr, r"\ARecorded \d+ events in 1")
        pipe = self.new_folder() / "pipe"
        os.mkfifo(pipe)
        pipe.chmod(0o640)
        with subprocess.Popen(["cat", pipe], stdout=subprocess.PIPE) as reader:
            self.done("record", pipe, "--for", "1s", "--passive")
            self.assertGreater(len(reader.stdout.readlines()), 2)
        self.assertEqual(pipe.stat().st_mode & 0o777, 0o640, "what is no file keeps its rights")
        recorder = self.record("b.rec")
        self.wait_events(LIST)
        self.machine.stop()
        self.assertEqual((recorder.wait(), recorder.errors), (0, []))
        self.assertRegex(recorder.lines[0], r" s; the service has ended\.\Z")


class Statistics(Story):
    def stats(self, *options, lines=WRITTEN, cut=0, code=0):
        text = text_of(lines)
        result = self.vexa("stats", "-", *options, stdin=text[: len(text) - cut], VEXA_MACHINE="/nonexistent")
        self.assertEqual(result.returncode, code, result.stderr)
        return result.stdout if code == 0 else result.stderr

    def test_a_table_json_or_csv(self):
        heading, congestion, interference = self.stats().splitlines()
        self.assertRegex(heading, r"^Channel +Quantity +Seconds +Min +Mean +P50 +P95 +Max +Above 50$")
        self.assertEqual(congestion.split(), ["6", "congestion", "10", "20", "44", "20", "80", "80", "40", "%"])
        self.assertEqual(interference.split(), ["6", "interference", "10", *["60"] * 5, "100", "%"])
        _, first, _ = self.stats("--csv", "--above", "80").splitlines()
        self.assertEqual(first, "6,congestion,10,20,44,20,80,80,0")
        for share, p95 in ((4, 20), (6, 80)):
            late = sample(11000 - 100 * share, "CONGESTION", congestion_value=80)
            _, first, _ = self.stats("--csv", lines=[*WRITTEN[:4], late, WRITTEN[-1]]).splitlines()
            self.assertEqual(first.split(",")[6], str(p95), f"above for {share} % of the time")
        (told,) = json.loads(self.stats("--json"))["channels"]
        self.assertEqual((told["channel"], told["congestion"]["mean"], told["interference"]["p95"]), (6, 44, 60))

    def test_what_is_cut_off_is_read_and_what_is_no_recording_is_told(self):
        for cut in (5, 30, 60):  # within the end, before it, within the last value
            self.assertIn(",congestion,", self.stats("--csv", cut=cut))
        cases = [
            ([{"a": 1}], "the recording is no recording of `vexa record`"),
            ([], "the recording is no recording of `vexa record`"),
            ([HEADER | {"format": 2}], "the recording has the format 2, which only a later vexa reads"),
            ([HEADER, 7, *WRITTEN[1:]], "line 2 of the recording is no line of a recording"),
            ([HEADER], "the recording tells no value of any channel: was a scan running?"),
        ]
        for lines, message in cases:
            self.assertEqual(self.stats(lines=lines, code=1), f"vexa: {message}\n")


REALMS = {"RealmFetched": True, "SupportRealmList": [{"CredentialEapMethod": 2, "RealmName": "roam.example"}]}
AIRPORT = {"NetWorkName": "Airport", "NetworkType": 2, "IsConnected": False, "IsInternetAccess": 2, **REALMS}
AIR = [
    *WRITTEN[:2],
    event(1, "CARD_PLUG_IN", None, "hs20"),
    event(2, "GET_RADIO", True, "hs20"),
    event(3, "GET_ALL_CREDENTIAL_LIST", None, "hs20"),
    event(4, LIST, [AIRPORT], "hs20"),
    event(5, "GET_IS_INTERNET_ACCESS", False, "hs20"),
    *WRITTEN[2:4],
    event(1500, LIST, [{**AIRPORT, "IsConnected": True, "IsInternetAccess": 0}], "hs20"),
    {"ms": 1600, "end": True},
]


def replay_of(story, file, *options):
    """A replay that runs, and its two ports."""
    replay = story.running("replay", file, *options)
    words = replay.wait_line("vexa watch").split()
    return replay, words[words.index("--sa-port") + 1], words[words.index("--hs20-port") + 1]


class Replay(Story):
    def replay(self, *options):
        file = self.new_folder() / "air.rec"
        file.write_text(text_of(AIR))
        return replay_of(self, file, *options)

    def at(self, *command):
        return self.vexa(*command, VEXA_MACHINE="/nonexistent")

    def test_other_commands_see_what_was_recorded_and_change_nothing(self):
        replay, sa, hs20 = self.replay()
        watch = self.running("watch", "--sa-port", sa, "--hs20-port", hs20)
        for told in ('hotspots in range: "Airport"', "the adapter is in", "spectrum  channel 6: interference 60",
                     'hotspot   joined "Airport"'):  # fmt: skip
            watch.wait_line(told)
        replay.wait_line("The recording has ended: 9 events.")
        late = json.loads(self.at("scan", "--json", "--port", sa).stdout)["channels"]
        self.assertEqual(late, [{"channel": 6, "order": 1, "congestion": 20, "interference": 60}])
        (airport,) = json.loads(self.at("networks", "--json", "--hs20-port", hs20).stdout)
        self.assertEqual((airport["name"], airport["connected"], airport["internet"]), ("Airport", True, "reached"))
        for command, asked in (("disable", "SET_HOTSPOT_AUTO_CONNECT"),
                               ("credential add --realm r --method tls --client-cert c", "ADD_CREDENTIAL")):  # fmt: skip
            self.assertEqual(self.at(*command.split(), "--hs20-port", hs20).returncode, 1)
            replay.wait_line(f"{asked} changes nothing: this is a recording.")
        self.assertEqual(watch.stop(signal.SIGINT), 130)
        self.assertEqual((replay.wait(), replay.errors), (0, []))

    def test_in_a_loop_and_faster(self):
        replay, _, hs20 = self.replay("--loop", "--speed", "100")
        networks = self.running("networks", "--watch", "--json", "--hs20-port", hs20)
        networks.wait_line('"connected":true', count=3)
        networks.wait_line('"connected":false', count=3)
        self.assertEqual((replay.stop(signal.SIGINT), networks.wait()), (130, 1))


class Again(RecordStory):
    def test_a_replay_tells_what_the_service_told(self):
        recorder = self.record("a.rec.gz")
        self.wait_events("SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE", 2)
        wait_until(lambda: any("Airport" in told["Data"] for told in self.events(LIST)), "the networks")
        live = self.told("scan"), self.told("networks")
        self.assertEqual([len(live[0]["channels"]), len(live[1])], [2, 2])
        self.assertEqual((recorder.stop(signal.SIGINT), self.machine.stop()), (130, 0))
        replay, sa, hs20 = replay_of(self, self.file, "--speed", "100")
        listener = self.running("listen", sa)
        replay.wait_line("The recording has ended")
        self.assertEqual((self.told("scan", "--port", sa), self.told("networks", "--hs20-port", hs20)), live)
        self.assertEqual((listener.stop(signal.SIGINT), replay.wait(), replay.errors), (130, 0, []))


class Scenario(RecordStory):
    def wait_list(self, *names, **members):
        """The last list is of these networks, and the first of them has these members."""

        def is_there():
            lists = [json.loads(found["Data"]) or [] for found in self.events(LIST)][-1:]
            return lists and [n["NetWorkName"] for n in lists[0]] == list(names) and (
                not members or members.items() <= lists[0][0].items())

        wait_until(is_there, f"a list of {names}, {members}")
        self.control.wait_passed(100)  # what comes next has a moment of its own

    def live(self):
        """What happens on the first machine, each step once the last one is recorded. At its start, and behind a change
        of the radio, the service rests for 10 s, which an adapter that is pulled has to wait for."""
        do = self.control.do
        self.wait_events("SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE", 2)
        self.wait_list("Airport", "Café", IsConnected=False)
        do("show", bssid=NETWORKS[2]["bssid"])
        do("reportNetworks")
        self.wait_list("Airport", "Café", "Later")
        do("setNetwork", bssid=NETWORKS[2]["bssid"], anqp="ready")
        do("setNetwork", bssid=NETWORKS[0]["bssid"], internetAccess=0)
        do("reportNetworks")
        self.wait_list("Airport", "Café", "Later", IsInternetAccess=0)
        do("setDns", dns=[])
        do("osConnect", ssid="Airport")
        self.wait_list("Airport", "Café", "Later", IsConnected=True, IsInternetAccess=1)
        do("hide", bssid=NETWORKS[1]["bssid"])
        do("show", bssid="02:aa:00:00:00:04")
        do("reportNetworks")
        self.wait_list("Airport", "Later", r"\xC9\xE9", IsConnected=True)
        do("dropConnection")
        self.wait_list("Airport", "Later", r"\xC9\xE9", IsConnected=False)
        do("levels", levels={"6": {"congestion": 75, "power": 50}})
        wait_until(lambda: self.values(self.events)[(2, "congestion_value")] >= 74, "the level")
        self.control.wait_passed(10000)
        do("pullAdapter")
        do("hide", bssid=NETWORKS[2]["bssid"])
        self.wait_events("CARD_PLUG_OUT", 2)
        do("insertAdapter")
        self.wait_list("Airport", r"\xC9\xE9", IsConnected=False)
        do("radio", software="off")
        self.wait_list()
        do("radio", software="on")
        self.wait_list("Airport", r"\xC9\xE9")
        self.done("disable")
        self.wait_list()
        self.done("enable")
        self.wait_list("Airport", r"\xC9\xE9")

    @staticmethod
    def values(events):
        """The last one of each kind and order."""
        names = [f"SPECTRAL_ANALYSER_SAMPLE_DATA_{kind}" for kind in ("CONGESTION", "INTERFERENCE")]
        told = [json.loads(found["Data"]) for name in names for found in events(name)]
        return {(data["order"], key): data[key] for data in told for key in data if key != "order"}

    def test_a_simulated_machine_tells_the_same_lists_at_the_same_moments(self):
        recorder = self.record("case.rec")
        self.live()
        recorder.stop(signal.SIGINT)
        lists = [line for line in self.recorded() if line.get("event", {}).get("EventId") == LIST]
        recorded = {line["ms"]: json.loads(line["event"]["Data"]) for line in lists}  # of a moment the last one
        channels = self.events(CHANNEL_LIST)[-1]["Data"]
        file = self.new_folder() / "case.json"
        made = self.vexa("scenario", "from", self.file, "--output", file)
        self.assertEqual((made.returncode, made.stdout), (0, ""))
        written = file.read_text()
        self.assertIn("is there already", self.refused(1, "scenario", "from", self.file, "-o", file))
        self.assertEqual(file.read_text(), written)
        self.assertIn("No space left", self.refused(1, "scenario", "from", self.file, "-o", "/dev/full"))
        for note in ("an address made up", "the channel of 4 networks", "1 connection as one of", "hotspot function",
                     "by flat samples"):  # fmt: skip
            self.assertIn(note, made.stderr)
        case = json.loads(file.read_text())
        for action in case["timeline"]:
            action["atMs"] *= SPEED
        self.start(**case | {"speed": 0})
        now, sa = 0, None
        for moment, networks in recorded.items():
            self.control.do("advance", ms=(moment - now) * SPEED)
            now = moment
            answer = self.machine.hs20().ask(LIST)  # to one who has heard of none before
            self.assertEqual(json.loads(answer["Data"]), networks, moment)
            if not sa:
                sa = self.machine.sa()
                self.assertEqual(sa.ask("GET_CHANNEL_LIST")["Data"], channels)
                sa.send("FULL_SCAN")
        self.control.do("advance", ms=60000)
        sa.send("GET_CHANNEL_LIST")
        told = []
        while (heard := sa.next_event())["EventId"] != CHANNEL_LIST:
            told.append(heard)
        told_now = self.values(lambda name: [heard for heard in told if heard["EventId"] == name])
        self.assertEqual(told_now, self.values(self.events))
