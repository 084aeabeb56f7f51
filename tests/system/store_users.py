"""Two users of one machine share one file, one after the other; and what the first start and the log leave on disk."""

import re
import stat
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


class Store(Story):
    def setUp(self):
        self.folder = self.new_folder()
        self.store = self.folder / STORE
        self.file = self.store / "config.xml"

    def session(self, user, **scenario):
        return Machine({"user": user, "speed": 20, **scenario}, folder=self.folder)

    @staticmethod
    def ask(client, *command):
        """The realms of the list that answers, in order."""
        return [entry["RealName"] for entry in client.credentials(*command)]

    def add(self, client, realm, access=PUBLIC):
        data = {"CredentialEapMethod": 2, "Type": 1, "RealName": realm, "AccessType": access}
        return self.ask(client, "ADD_CREDENTIAL", {**data, "Username": "u", "Password": "p"})

    def owners(self):
        """Each stored realm with its creator."""
        tree = xml.etree.ElementTree.parse(self.file)
        return {node.findtext("realm"): node.findtext("creator") for node in tree.findall("credentials/credential")}

    def references(self, user):
        tree = xml.etree.ElementTree.parse(self.file)
        for node in tree.findall("users/user"):
            if node.findtext("username") == user:
                return [(r.findtext("id"), r.findtext("priority")) for r in node.findall("credentials/credential")]
        return None

    def test_two_users_take_turns(self):
        with self.session(ALICE) as machine:
            client = machine.hs20()
            self.add(client, "alices-private", PRIVATE)
            self.add(client, "shared")
            self.assertEqual(self.add(client, "short-lived"), ["short-lived", "shared", "alices-private"])
        with self.session(BOB) as machine:
            client = machine.hs20()
            self.assertEqual(self.ask(client), ["short-lived", "shared"])
            self.assertIsNone(self.references(BOB), "a first read saves nothing")
            self.add(client, "bobs-private", PRIVATE)
            self.assertEqual(self.ask(client, "DELETE_CREDENTIAL", {"Id": 3}), ["bobs-private", "shared"])
            self.assertEqual(self.references(ALICE), [("3", "1"), ("2", "2"), ("1", "3")])
            owners = {"alices-private": ALICE, "bobs-private": BOB, "shared": BOB}
            self.assertEqual(self.owners(), owners, "each save signs what all see")
        with self.session(ALICE) as machine:
            self.assertEqual(self.ask(machine.hs20()), ["shared", "alices-private"])
            self.assertEqual([number for number, _ in self.references(ALICE)], ["2", "1"])
            self.assertEqual(self.references(BOB), [("4", "1"), ("2", "2")])
            self.assertEqual(self.owners(), {"bobs-private": BOB, "alices-private": ALICE, "shared": ALICE})

    def test_anothers_change_comes_between_two_commands(self):
        with self.session(ALICE) as machine:
            client = machine.hs20()
            self.add(client, "a")
            text = self.file.read_text(encoding="utf-8-sig")
            other = (
                "<credential><id>50</id><type>eaptls</type><accesstype>peruser</accesstype><creator>PC\\bob</creator>"
                "<realm>b</realm></credential>"
            )
            text = text.replace("</credentials>", other + "</credentials>", 1)
            text = text.replace("<homerealm></homerealm>", "<homerealm>h</homerealm>")
            self.file.write_text(text, encoding="utf-8")
            self.assertEqual(self.add(client, "c"), ["c", "a"])
            self.assertEqual(self.owners(), {"b": BOB, "c": ALICE, "a": ALICE})
            self.assertIn("<homerealm>h</homerealm>", self.file.read_text(encoding="utf-8-sig"))

    def test_the_first_start_makes_a_file_for_its_owner_alone(self):
        with self.session(ALICE) as machine:
            self.assertEqual(self.file.read_bytes(), DEFAULT)
            self.add(machine.hs20(), "a")
        for path in (self.store, *self.store.rglob("*")):
            mode = stat.S_IMODE(path.stat().st_mode)
            self.assertEqual(mode, 0o700 if path.is_dir() else 0o600, path)
        self.assertEqual(sorted(path.name for path in self.store.iterdir()), ["Dump", "config.xml"])
        self.assertEqual(list((self.store / "Dump").iterdir()), [], "the log is off")

    def test_each_run_with_the_log_on_has_its_own_file(self):
        text = DEFAULT.replace(b"<enabledump>false", b"<enabledump>true").decode("utf-8-sig")
        first, second = (self.store / "Dump" / f"hs20log_alice_{number}.txt" for number in (0, 1))
        with self.session(ALICE, config=text):
            content = wait_until(lambda: first.exists() and first.read_text(), "the log is written")
        self.assertRegex(content, r"\A\[1\] \d\d/\d\d \d\d:\d\d:\d\d  ")
        numbers = [int(number) for number in re.findall(r"^\[(\d+)\]", content, re.MULTILINE)]
        self.assertEqual(numbers, list(range(1, len(numbers) + 1)))
        self.assertEqual(stat.S_IMODE(first.stat().st_mode), 0o600)
        with self.session(ALICE):
            wait_until(second.exists, "the second log is written")
