"""One store for both: what the Windows service writes the native one reads, and the other way round."""

import wine
from harness import STORE, Story

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


def work(client):
    """Adds all, edits one, moves one, deletes one; gives the list that is left."""
    for data in credentials():
        listed = client.credentials("ADD_CREDENTIAL", data)
    ids = [entry["Id"] for entry in listed]
    client.credentials("EDIT_CREDENTIAL", {**next(credentials()), "Id": ids[0], "Username": "\u0416 edited"})
    client.credentials("SET_POSITION_CREDENTIAL", {"Id": ids[2], "Order": 0})
    return client.credentials("DELETE_CREDENTIAL", {"Id": ids[4]})


class Exchange(Story):
    SCENARIO = {"user": USER, "speed": 20}

    def setUp(self):
        self.native = self.new_folder()

    def run_on(self, machine, act):
        """What comes of a client's act, and the file that is left."""
        with machine:
            result = act(machine.hs20())
            self.assertEqual(machine.stop(), 0)
            return result, machine.config().read_bytes()

    def run_native(self, act):
        with wine.native_programs():
            return self.run_on(wine.NativeMachine(self.SCENARIO, folder=self.native), act)

    def run_windows(self, act, **config):
        return self.run_on(wine.Machine({**self.SCENARIO, **config}), act)

    def test_the_same_commands_leave_the_same_bytes_and_each_reads_what_the_other_wrote(self):
        listed, written = self.run_windows(work)
        self.assertEqual({entry["Username"] for entry in listed if entry["RealName"] == "3.example"}, {TEXTS[3]})
        self.assertEqual(self.run_native(work), (listed, written))
        (self.native / STORE / "config.xml").write_bytes(written)
        self.assertEqual(self.run_native(lambda client: client.credentials()), (listed, written))
        first = {"Id": listed[0]["Id"]}
        wrote, content = self.run_native(lambda client: client.credentials("DELETE_CREDENTIAL", first))
        read = self.run_windows(lambda client: client.credentials(), config=content.decode())
        self.assertEqual(read, (wrote, content))
