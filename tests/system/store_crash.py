"""What a killed service leaves: everything that a client was told is there, and a file that anybody can read."""

import json
import os
import pathlib
import random
import shutil
import signal
import tempfile
import time
import unittest
import xml.etree.ElementTree

from harness import Machine

SEED = 20
ROUNDS = 12


def credential(realm):
    return {"CredentialEapMethod": 2, "Type": 1, "RealName": realm, "Username": "user", "Password": "secret"}


def listed(event):
    """The realms of a list of credentials."""
    return [entry["RealName"] for entry in json.loads(event["Data"]) or []]


class Crash(unittest.TestCase):
    def setUp(self):
        self.folder = pathlib.Path(tempfile.mkdtemp(prefix="vexa-crash-"))
        self.addCleanup(shutil.rmtree, self.folder, ignore_errors=True)
        self.store = self.folder / "Public" / "Roaming" / "Korvane"
        self.random = random.Random(SEED)
        self.acknowledged = set()
        self.sent = 0

    def add_until_killed(self, machine):
        client, pid = machine.hs20(), machine.service_pid()
        for _ in range(self.random.randrange(1, 8)):
            self.add(client)
        self.send_next(client)
        time.sleep(self.random.uniform(0, 0.02))  # where in a save the kill falls is the point of the test
        os.kill(pid, signal.SIGKILL)
        try:
            while True:
                self.acknowledged.update(listed(client.wait_event("GET_ALL_CREDENTIAL_LIST")))
        except ConnectionError:
            pass
        self.assertEqual(machine.parent.wait(), 128 + signal.SIGKILL)

    def send_next(self, client):
        self.sent += 1
        client.send("ADD_CREDENTIAL", credential(f"realm{self.sent}"))

    def add(self, client):
        self.send_next(client)
        self.acknowledged.update(listed(client.wait_event("GET_ALL_CREDENTIAL_LIST")))

    def check_file(self):
        tree = xml.etree.ElementTree.parse(self.store / "config.xml")
        stored = [node.findtext("realm") for node in tree.findall("credentials/credential")]
        self.assertEqual(self.acknowledged - set(stored), set(), "told to the client and not in the file")
        self.assertEqual(len(stored), len(set(stored)))
        ids = [node.findtext("id") for node in tree.findall("credentials/credential")]
        self.assertEqual(len(ids), len(set(ids)))

    def strays(self):
        return sorted(path.name for path in self.store.iterdir() if path.name not in ("config.xml", "Dump"))

    def test_nothing_that_a_client_was_told_is_lost(self):
        for number in range(ROUNDS):
            with self.subTest(seed=SEED, round=number):
                with Machine(folder=self.folder, scenario={}, control=False) as machine:
                    self.add_until_killed(machine)
                self.check_file()
                self.assertLessEqual(len(self.strays()), 1, self.strays())
        with Machine(folder=self.folder, scenario={}, control=False) as machine:
            client = machine.hs20()
            client.send("GET_ALL_CREDENTIAL_LIST")
            present = set(listed(client.wait_event("GET_ALL_CREDENTIAL_LIST")))
            self.assertEqual(self.acknowledged - present, set())
            self.add(client)
            self.assertEqual(self.strays(), [], "a save leaves no temporary of the dead")
        self.check_file()


if __name__ == "__main__":
    unittest.main()
