"""One store for both: what the Windows service writes the native one reads, and the other way round."""

import json
import os
import shutil
import tempfile
import unittest

import wine
from wine import STORE, Machine

USER = "KORVANE-PC\\J\u00fcrgen \u0141"
# Text that a store has trouble with: other scripts, characters past 16 bits, markup, blanks and ends of lines.
TEXTS = (
    "plain",
    "\u00e4\u00f6\u00fc \u00df \u00e9",
    "\u041f\u0440\u0438\u0432\u0435\u0442 \u4f60\u597d \u0645\u0631\u062d\u0628\u0627",
    "\U0001f511 key \U0001d573",
    "<a b=\"c\">&amp; ]]> 'd'",
    "  blanks  inside  ",
    "tab\there, line\nfeed, return\rhere",
)


def credentials():
    for number, text in enumerate(TEXTS):
        yield {"CredentialEapMethod": 2, "Type": 1, "RealName": f"{number}.example", "AccessType": 1 + number % 2,
               "CredentialName": f"Number {number}", "Username": text, "Password": text[::-1]}


class Session:
    """A client that writes credentials and reads them back."""

    def __init__(self, machine):
        self.client = machine.hs20()

    def ask(self, command, data=None):
        self.client.send(command, data)
        return json.loads(self.client.wait_event("GET_ALL_CREDENTIAL_LIST")["Data"]) or []

    def work(self):
        """Adds all, edits one, moves one, deletes one."""
        for data in credentials():
            listed = self.ask("ADD_CREDENTIAL", data)
        ids = [entry["Id"] for entry in listed]
        self.ask("EDIT_CREDENTIAL", {**next(credentials()), "Id": ids[0], "Username": "\u0416 edited"})
        self.ask("SET_POSITION_CREDENTIAL", {"Id": ids[2], "Order": 0})
        return self.ask("DELETE_CREDENTIAL", {"Id": ids[4]})

    def listed(self):
        return self.ask("GET_ALL_CREDENTIAL_LIST")


class Exchange(unittest.TestCase):
    SCENARIO = {"user": USER, "speed": 20}

    def setUp(self):
        self.native = tempfile.mkdtemp(prefix="vexa-native-")
        self.addCleanup(shutil.rmtree, self.native, ignore_errors=True)

    def native_file(self):
        return os.path.join(self.native, STORE, "config.xml")

    def run_native(self, act):
        with wine.native_machine(scenario=self.SCENARIO, folder=self.native) as machine:
            result = act(Session(machine))
            self.assertEqual(machine.stop(), 0)
        with open(self.native_file(), "rb") as file:
            return result, file.read()

    def run_windows(self, act, stored=None):
        scenario = self.SCENARIO if stored is None else {**self.SCENARIO, "config": stored.decode()}
        with Machine(scenario) as machine:
            result = act(Session(machine))
            self.assertEqual(machine.stop(), 0)
            return result, (machine.store() / "config.xml").read_bytes()

    def test_the_same_commands_leave_the_same_bytes(self):
        ours, written = self.run_windows(Session.work)
        self.assertEqual({entry["Username"] for entry in ours if entry["RealName"] == "3.example"}, {TEXTS[3]})
        theirs, expected = self.run_native(Session.work)
        self.assertEqual(ours, theirs)
        self.assertEqual(written, expected)

    def test_each_reads_what_the_other_wrote(self):
        wrote, content = self.run_windows(Session.work)
        os.makedirs(os.path.dirname(self.native_file()))
        with open(self.native_file(), "wb") as file:
            file.write(content)
        read, kept = self.run_native(Session.listed)
        self.assertEqual((read, kept), (wrote, content))
        wrote, content = self.run_native(lambda session: session.ask("DELETE_CREDENTIAL", {"Id": read[0]["Id"]}))
        read, kept = self.run_windows(Session.listed, stored=content)
        self.assertEqual((read, kept), (wrote, content))


if __name__ == "__main__":
    unittest.main()
