"""`vexa record`, and what is made of a recording: statistics, a replay, a scenario."""

import json
import signal
import zlib

from client_credentials import CredentialStory
from harness import network, wait_until

NETWORKS = [
    network(1, "Airport", {"roam.example": [21], "corp.example": [13]}),
    network(2, "Café", {}, internetAccess=0, networkType=3),
    network(3, "Later", {"late.example": [13]}, anqp="never", visible=False),
    {"bssid": "02:aa:00:00:00:04", "ssidHex": "c9e9", "realms": [], "visible": False},
]
CHANNELS = {"channels": [36, 6], "levels": {"6": {"congestion": 30, "power": 30}, "36": {"congestion": 60, "power": 60}}}
LIST = "GET_ALL_NETWORK_LIST"
SPEED = 20


class RecordStory(CredentialStory):
    scenario = {"speed": SPEED, "connectMs": 4000, "networks": NETWORKS, "spectrum": CHANNELS}

    def record(self, name, *options):
        self.file = self.new_folder() / name
        return self.running("record", self.file, "--machine", self.machine.folder, *options)

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
                self.assertEqual((recorder.stop(number), recorder.errors), (-9 if is_killed else 0, []))
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
        recorder = self.record("b.rec")
        self.wait_events(LIST)
        self.machine.stop()
        self.assertEqual((recorder.wait(), recorder.errors), (0, []))
        self.assertRegex(recorder.lines[0], r" s; the service has ended\.\Z")
