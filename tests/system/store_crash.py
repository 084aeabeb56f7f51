"""What a killed service leaves: everything that a client was told is there, and a file that anybody can read."""

import os
import random
import signal
import time
import xml.etree.ElementTree

from harness import STORE, Machine, Story

SEED = 20
ROUNDS = 12


def realms(credentials):
    return {entry["RealName"] for entry in credentials}


class Crash(Story):
    def setUp(self):
        self.folder = self.new_folder()
        self.random = random.Random(SEED)
        self.acknowledged = set()
        self.sent = 0

    def session(self):
        return Machine({}, folder=self.folder, control=False)

    def next_credential(self):
        self.sent += 1
        user = {"Username": "user", "Password": "secret"}
        return {"CredentialEapMethod": 2, "Type": 1, "RealName": f"realm{self.sent}", **user}

    def add(self, client):
        self.acknowledged |= realms(client.credentials("ADD_CREDENTIAL", self.next_credential()))

    def add_until_killed(self, machine):
        client, pid = machine.hs20(), machine.service_pid()
        for _ in range(self.random.randrange(1, 8)):
            self.add(client)
        client.send("ADD_CREDENTIAL", self.next_credential())
        time.sleep(self.random.uniform(0, 0.02))  # where in a save the kill falls is the point of the test
        os.kill(pid, signal.SIGKILL)
        try:
            while True:
                self.acknowledged |= realms(client.credential_list())
        except ConnectionError:
            pass
        self.assertEqual(machine.parent.wait(), 128 + signal.SIGKILL)

    def check_file(self):
        credentials = xml.etree.ElementTree.parse(self.folder / STORE / "config.xml").findall("credentials/credential")
        for name in ("realm", "id"):
            values = [node.findtext(name) for node in credentials]
            self.assertEqual(len(values), len(set(values)))
        stored = {node.findtext("realm") for node in credentials}
        self.assertEqual(self.acknowledged - stored, set(), "told to the client and not in the file")

    def strays(self):
        return [path.name for path in (self.folder / STORE).iterdir() if path.name not in ("config.xml", "Dump")]

    def test_nothing_that_a_client_was_told_is_lost(self):
        for number in range(ROUNDS):
            with self.subTest(seed=SEED, round=number):
                with self.session() as machine:
                    self.add_until_killed(machine)
                self.check_file()
                self.assertLessEqual(len(self.strays()), 1, self.strays())
        with self.session() as machine:
            client = machine.hs20()
            self.assertEqual(self.acknowledged - realms(client.credentials()), set())
            self.add(client)
            self.assertEqual(self.strays(), [], "a save leaves no temporary of the dead")
        self.check_file()
