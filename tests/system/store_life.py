"""The file of the credentials: two users of one machine share it, one after the other and both at once; and what a
killed service leaves: everything that a client was told is there, and a file that anybody can read."""

import os
import random
import re
import signal
import stat
import threading
import time
import xml.etree.ElementTree

from harness import STORE, Machine, Story, wait_until

DEFAULT = (
    b'\xef\xbb\xbf<?xml version="1.0" encoding="UTF-8"?><configurations>\t<global>\t\t<dump_file_path>hs20log.txt'
    b"</dump_file_path>\t\t<create_new_dump_file>true</create_new_dump_file>\t\t<autoconnect>true</autoconnect>\t\t"
    b"<enabledump>false</enabledump>\t\t<dumplevel>0</dumplevel>\t\t<homerealm></homerealm>\t\t<nextcredid>1"
    b"</nextcredid>\t</global>\t<credentials>\t</credentials>\t<users>\t</users></configurations>"
)
ALICE, BOB = "PC\\alice", "PC\\bob"
PRIVATE, PUBLIC = 2, 1
SEED = 20
STEPS = 100
KILLED = 0.06  # of the steps


def realms(credentials):
    return [entry["RealName"] for entry in credentials]


def credential(realm, access=PUBLIC):
    kind = {"CredentialEapMethod": 2, "Type": 1, "AccessType": access}
    return {**kind, "RealName": realm, "Username": "user", "Password": "secret"}


def add(client, *data):
    """Gives the realms of the list that answers."""
    return realms(client.credentials("ADD_CREDENTIAL", credential(*data)))


class StoreStory(Story):
    def setUp(self):
        self.folder = self.new_folder()
        self.store = self.folder / STORE

    def stored(self, path="credentials/credential"):
        return xml.etree.ElementTree.parse(self.store / "config.xml").findall(path)

    def strays(self):
        return [path.name for path in self.store.iterdir() if path.name not in ("config.xml", "Dump")]


class Users(StoreStory):
    def session(self, user, **scenario):
        return Machine({"user": user, "speed": 20, **scenario}, folder=self.folder)

    def owners(self):
        return {node.findtext("realm"): node.findtext("creator") for node in self.stored()}

    def references(self, user):
        """The ids and priorities of his list."""
        (node,) = [node for node in self.stored("users/user") if node.findtext("username") == user] or [None]
        if node is None:
            return None
        return [(r.findtext("id"), r.findtext("priority")) for r in node.findall("credentials/credential")]

    def test_they_take_turns(self):
        with self.session(ALICE) as machine:
            client = machine.hs20()
            add(client, "alices-private", PRIVATE)
            add(client, "shared")
            self.assertEqual(add(client, "short-lived"), ["short-lived", "shared", "alices-private"])
        with self.session(BOB) as machine:
            client = machine.hs20()
            self.assertEqual(realms(client.credentials()), ["short-lived", "shared"])
            self.assertIsNone(self.references(BOB), "a first read saves nothing")
            add(client, "bobs-private", PRIVATE)
            left = client.credentials("DELETE_CREDENTIAL", {"Id": 3})
            self.assertEqual(realms(left), ["bobs-private", "shared"])
            self.assertEqual(self.references(ALICE), [("3", "1"), ("2", "2"), ("1", "3")])
            owners = {"alices-private": ALICE, "bobs-private": BOB, "shared": BOB}
            self.assertEqual(self.owners(), owners, "each save signs what all see")
        with self.session(ALICE) as machine:
            self.assertEqual(realms(machine.hs20().credentials()), ["shared", "alices-private"])
            self.assertEqual([number for number, _ in self.references(ALICE)], ["2", "1"])
            self.assertEqual(self.references(BOB), [("4", "1"), ("2", "2")])
            self.assertEqual(self.owners(), {"bobs-private": BOB, "alices-private": ALICE, "shared": ALICE})
        self.assertEqual(self.strays(), [])

    def test_what_is_made_is_for_its_owner_alone(self):
        with self.session(ALICE) as machine:
            self.assertEqual((self.store / "config.xml").read_bytes(), DEFAULT)
            add(machine.hs20(), "a")
        self.assertEqual(list((self.store / "Dump").iterdir()), [], "the log is off")
        text = DEFAULT.replace(b"<enabledump>false", b"<enabledump>true").decode("utf-8-sig")
        first, second = (self.store / "Dump" / f"hs20log_alice_{number}.txt" for number in (0, 1))
        with self.session(ALICE, config=text):
            content = wait_until(lambda: first.exists() and first.read_text(), "the log is written")
        numbers = [int(number) for number in re.findall(r"^\[(\d+)\] ", content, re.MULTILINE)]
        self.assertEqual(numbers, list(range(1, len(numbers) + 1)))
        with self.session(ALICE):
            wait_until(second.exists, "the second log is written")
        for path in (self.store, *self.store.rglob("*")):
            mode = stat.S_IMODE(path.stat().st_mode)
            self.assertEqual(mode, 0o700 if path.is_dir() else 0o600, path)


class Neighbour(threading.Thread):
    """A user whose service runs beside another's on the same file. What he was told has to stay: what he adds is his to
    delete, and where he moves a credential it stands."""

    def __init__(self, user, folder, seed, steps):
        super().__init__()
        self.user, self.folder, self.random, self.steps = user, folder, random.Random(seed), steps
        self.own, self.unsure, self.sent, self.told, self.problem = set(), set(), 0, [], None
        self.machine = None

    def run(self):
        try:
            self.begin()
            while self.steps > 0:
                self.steps -= 1
                self.step()
            self.hear(self.client.credentials())
        except Exception as problem:
            self.problem = problem
        finally:
            if self.machine:
                self.machine.__exit__(type(self.problem) if self.problem else None)

    def begin(self):
        self.machine = Machine({"user": self.user}, folder=self.folder, control=False).__enter__()
        self.client, self.pid = self.machine.hs20(), self.machine.service_pid()
        self.hear(self.client.credentials())

    def hear(self, told):
        names = realms(told)
        self.unsure -= self.own
        missing, doubled = self.own - set(names), len(names) - len(set(names))
        if missing or doubled or len({entry["Id"] for entry in told}) < len(told):
            raise AssertionError(f"{self.user}: {missing} is missing, {doubled} doubled in {names}")
        self.told = told

    def step(self):
        kind, kills = self.random.random(), self.random.random() < KILLED
        mine = [entry for entry in self.told if entry["RealName"] in self.own]
        if kind < 0.4 or not mine:
            self.sent += 1
            realm = f"{self.user[3:]}{self.sent}"
            change = ("ADD_CREDENTIAL", credential(realm, self.random.choice((PRIVATE, PUBLIC)))), {realm}
        elif kind < 0.7:
            place, moved = self.random.randrange(len(self.told)), self.random.choice(self.told)
            change = ("SET_POSITION_CREDENTIAL", {"Id": moved["Id"], "Order": place}), set()
        else:
            gone = self.random.choice(mine)
            change = ("DELETE_CREDENTIAL", {"Id": gone["Id"]}), {gone["RealName"]}
        command, touched = change
        self.own -= touched
        if kills:
            self.unsure |= touched
            self.client.send(*command)
            time.sleep(self.random.uniform(0, 0.01))  # where in a save the kill falls is the point of the test
            os.kill(self.pid, signal.SIGKILL)
            self.machine.parent.wait()
            self.machine.__exit__(None)
            return self.begin()
        told = self.client.credentials(*command)
        if command[0] == "ADD_CREDENTIAL":
            self.own |= touched
        elif touched & set(realms(told)):
            raise AssertionError(f"{touched} is back")
        self.hear(told)


class Neighbours(StoreStory):
    def test_nothing_that_either_was_told_is_lost(self):
        other = self.new_folder()
        (self.folder / "Public").mkdir()
        (other / "Public").symlink_to(self.folder / "Public")
        both = [Neighbour(ALICE, self.folder, SEED, STEPS), Neighbour(BOB, other, SEED + 1, STEPS)]
        for neighbour in both:
            neighbour.start()
        for neighbour in both:
            neighbour.join()
        self.assertEqual([neighbour.problem for neighbour in both], [None, None])
        stored, ids = ([node.findtext(name) for node in self.stored()] for name in ("realm", "id"))
        self.assertEqual((len(set(stored)), len(set(ids))), (len(stored), len(ids)))
        own, unsure = (set().union(*(getattr(one, name) for one in both)) for name in ("own", "unsure"))
        self.assertEqual((own - set(stored), set(stored) - own - unsure), (set(), set()))
        with Machine({"user": ALICE}, folder=self.folder, control=False) as machine:
            add(machine.hs20(), "last")
        self.assertEqual(self.strays(), [], "a save leaves no temporary of the dead")
