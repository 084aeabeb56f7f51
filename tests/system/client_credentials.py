"""`vexa credentials`, `credential` and `reload` on a running service."""

import json
import subprocess
import tempfile
import unittest

from harness import Machine, clean_environment, program

SCENARIO = {"speed": 20}
CONFIG = "Public/Roaming/Korvane/config.xml"


def run_client(*arguments, stdin=None, **variables):
    return subprocess.run(
        [program("vexa"), *map(str, arguments)],
        env=clean_environment(**variables),
        input=stdin,
        stdin=subprocess.DEVNULL if stdin is None else None,
        capture_output=True,
        timeout=60,
        encoding="utf-8",
    )


class CredentialsTest(unittest.TestCase):
    scenario = SCENARIO

    def setUp(self):
        self.machine = self.enterContext(Machine(self.scenario))

    def vexa(self, *arguments, stdin=None):
        return run_client(*arguments, stdin=stdin, VEXA_MACHINE=str(self.machine.folder))

    def done(self, *arguments, stdin=None):
        """Carried out; gives what was printed."""
        result = self.vexa(*arguments, stdin=stdin)
        self.assertEqual((result.returncode, result.stderr), (0, ""), arguments)
        return result.stdout

    def refused(self, exit_code, *arguments, stdin=None):
        """Gives the one line that says why."""
        result = self.vexa(*arguments, stdin=stdin)
        self.assertEqual((result.returncode, result.stdout), (exit_code, ""), (arguments, result.stderr))
        self.assertTrue(result.stderr.startswith("vexa: "), result.stderr)
        return result.stderr.splitlines()[0]

    def list(self, *options):
        return json.loads(self.done("credentials", "--json", *options))

    def names(self):
        return [entry["name"] for entry in self.list()]

    def add_user(self, name, *options, realm=None, password="secret"):
        arguments = ["--name", name, "--realm", realm or name.lower(), "--username", "anna", "--password-stdin"]
        return self.done("credential", "add", *arguments, *options, stdin=password)

    def add_certificate(self, name, *options):
        arguments = ["--name", name, "--realm", name.lower(), "--method", "tls", "--client-cert", "Anna"]
        return self.done("credential", "add", *arguments, *options)


class Listing(CredentialsTest):
    def test_nothing_stored(self):
        self.assertEqual(self.done("credentials"), "No credentials are stored.\n")
        self.assertEqual(self.list(), [])

    def test_the_table_is_in_the_order_of_priority(self):
        self.add_user("Lounge", "--no-auto-connect")
        self.add_certificate("Work", "--per-user", "--ca-cert", "Root", "--creator", "IT")
        heading, *rows = self.done("credentials").splitlines()
        self.assertEqual(heading.split()[:5], ["Position", "Id", "Name", "Realm", "Method"])
        # A column begins where its heading does.
        starts = [heading.index(word) for word in heading.split()] + [None]
        cells = [[row[a:b].strip() for a, b in zip(starts, starts[1:])] for row in rows]
        self.assertEqual(
            cells,
            [
                ["1", "2", "Work", "work", "TLS", "per user", "yes", "IT", "certificate Anna, CA Root"],
                ["2", "1", "Lounge", "lounge", "TTLS", "all users", "no", "KORVANE-PC\\user", "user anna"],
            ],
        )

    def test_passwords_show_only_when_asked_for(self):
        self.add_user("Lounge", password="gEh31m")
        outputs = [self.done("credentials"), self.done("credentials", "--json")]
        outputs += [self.done("credential", "edit", "Lounge", "--name", "B", "--json")]
        for output in outputs:
            self.assertNotIn("gEh31m", output)
        self.assertIn("gEh31m", self.done("credentials", "--show-passwords"))
        self.assertEqual(self.list("--show-passwords")[0]["password"], "gEh31m")

    def test_text_can_do_nothing_to_the_terminal(self):
        name = "a\x9b31m"
        self.machine.hs20().send(
            "ADD_CREDENTIAL", {"Type": 3, "CredentialEapMethod": 1, "RealName": "r", "CredentialName": name}
        )
        self.assertIn("a\\x9b31m", self.done("credentials"))
        self.assertEqual(self.names(), [name])


class Adding(CredentialsTest):
    def test_it_says_what_was_stored_and_where(self):
        self.assertEqual(
            self.add_user("Lounge"), 'Added credential 1 "Lounge" for the realm "lounge", in position 1 of 1.\n'
        )
        added = json.loads(self.add_certificate("Work", "--json"))
        self.assertEqual((added["done"], added["credential"]["position"]), ("added", 1))
        self.assertEqual(self.names(), ["Work", "Lounge"])

    def test_without_a_name_the_realm_is_the_name(self):
        self.done("credential", "add", "--realm", "corp.example", "--method", "TLS", "--client-cert", "c")
        self.assertEqual(self.names(), ["corp.example"])

    def test_what_the_service_does_not_take_is_told(self):
        self.add_user("Lounge", realm="a")
        user = ["credential", "add", "--username", "u", "--password-stdin"]
        self.assertIn("realm", self.refused(1, *user, "--realm", "a", "--name", "B", stdin="p"))
        self.assertIn("name", self.refused(1, *user, "--realm", "b", "--name", "Lounge", stdin="p"))
        self.assertIn("name", self.refused(1, *user, "--realm", "Lounge", stdin="p"))
        self.assertEqual(self.names(), ["Lounge"])

    def test_wrong_use_reaches_no_service(self):
        add = ["credential", "add"]
        tls = [*add, "--realm", "r", "--method", "tls"]
        user = [*add, "--realm", "r", "--username", "u", "--password-stdin"]
        for arguments, stdin in (
            (["credential"], None),
            (add, None),
            ([*add, "--realm", "r"], None),
            ([*add, "--realm", "r", "--username", "u"], None),
            ([*add, "--realm", "r", "--username", "u", "--client-cert", "c", "--password-stdin"], "p"),
            ([*add, "--realm", "r", "--method", "sim"], None),
            ([*user, "--password", "p"], "p"),
            ([*user, "--per-user", "--all-users"], "p"),
            ([*user, "--auto-connect", "--no-auto-connect"], "p"),
            ([*user, "--realm", "x" * 128], "p"),
            (user, "p" * 64),
            (user, "a\x1bb"),
            (tls, None),
            ([*tls, "--client-cert", "c", "--username", "u"], None),
            ([*tls, "--client-cert", "c", "--password-stdin"], "p"),
            ([*tls, "--client-cert", "a\nb"], None),
            (["credential", "edit", "1"], None),
            (["credential", "move", "1", "0"], None),
            (["credential", "delete"], None),
        ):
            with self.subTest(arguments):
                self.refused(2, *arguments, stdin=stdin)
        self.assertEqual(self.list(), [])

    def test_no_password_is_no_credential(self):
        for text in ("", "\n"):
            self.refused(1, "credential", "add", "--realm", "r", "--username", "u", "--password-stdin", stdin=text)
        self.assertEqual(self.list(), [])

    def test_the_first_line_is_the_password(self):
        for text in ("  sp ace ", "one\ntwo\n", "dos\r\n"):
            self.add_user(f"N{text!r}", password=text)
        passwords = [entry["password"] for entry in self.list("--show-passwords")]
        self.assertEqual(passwords, ["dos", "one", "  sp ace "])

    def test_any_text_is_stored_as_it_is(self):
        for text in ("空港ラウンジ", "<&>\"'", " blanks ", "😀" * 31, "-dash", "a;b%s", "0"):
            with self.subTest(text):
                added = json.loads(
                    self.done(
                        *("credential", "add", f"--realm=r{text}", f"--name={text}", f"--username={text}"),
                        *("--password-stdin", "--json"),
                        stdin=text,
                    )
                )["credential"]
                (stored,) = [e for e in self.list("--show-passwords") if e["id"] == added["id"]]
                self.assertEqual([stored[k] for k in ("name", "username", "password")], [text] * 3)

    def test_limits_count_as_the_service_counts(self):
        tls = ["credential", "add", "--method", "tls", "--client-cert", "c", "--realm"]
        self.done(*tls, "é" * 127)
        self.done(*tls, "😀" * 63 + "x")
        self.assertIn("127", self.refused(2, *tls, "😀" * 64))
        self.assertEqual(len(self.list()), 2)


class Changing(CredentialsTest):
    def setUp(self):
        super().setUp()
        for name in ("C", "B", "A"):
            self.add_user(name, password="pw-" + name)
        self.ids = {entry["name"]: entry["id"] for entry in self.list()}

    def test_moving(self):
        for which, position, order, words in (
            ("A", 3, "BCA", 'Moved credential 3 "A" from position 1 to 3.'),
            ("A", 2, "BAC", 'Moved credential 3 "A" from position 3 to 2.'),
            (self.ids["C"], 1, "CBA", 'Moved credential 1 "C" from position 3 to 1.'),
            ("C", 9999, "BAC", 'Moved credential 1 "C" from position 1 to 3.'),
            ("C", 3, "BAC", 'Nothing to move: credential 1 "C" is in position 3 already.'),
        ):
            with self.subTest((which, position)):
                self.assertEqual(self.done("credential", "move", which, position), words + "\n")
                self.assertEqual("".join(self.names()), order)

    def test_an_edit_leaves_alone_what_is_not_given(self):
        before = self.list("--show-passwords")
        words = self.done("credential", "edit", "B", "--realm", "new", "--no-auto-connect")
        self.assertEqual(words, 'Changed credential 2 "B": realm, auto-connect.\n')
        before[1].update(realm="new", autoConnect=False)
        self.assertEqual(self.list("--show-passwords"), before)

    def test_every_part_can_be_edited(self):
        self.add_certificate("T")
        for which, options, member, value in (
            ("A", ["--username", "bert"], "username", "bert"),
            ("A", ["--password-stdin"], "password", "typed"),
            ("T", ["--client-cert", "new"], "clientCert", "new"),
            ("T", ["--ca-cert", "root"], "caCert", "root"),
            ("T", ["--ca-cert", ""], "caCert", ""),
            ("T", ["--name", ""], "name", ""),
        ):
            with self.subTest((which, options)):
                (old,) = [e for e in self.list() if e["name"] == which]
                self.done("credential", "edit", which, *options, stdin="typed")
                (entry,) = [e for e in self.list("--show-passwords") if e["id"] == old["id"]]
                self.assertEqual(entry[member], value)

    def test_an_edit_that_changes_nothing_says_so(self):
        words = self.done("credential", "edit", "B", "--name", "B")
        self.assertEqual(words, 'Nothing to change: credential 2 "B" is like that already.\n')

    def test_edits_that_do_not_fit_the_method(self):
        self.add_certificate("T")
        self.refused(2, "credential", "edit", "A", "--client-cert", "x")
        self.refused(2, "credential", "edit", "A", "--username", "")
        self.refused(2, "credential", "edit", "T", "--username", "x")
        self.refused(2, "credential", "edit", "T", "--password-stdin", stdin="p")

    def test_deleting(self):
        self.assertEqual(self.done("credential", "delete", "B"), 'Deleted credential 2 "B".\n')
        gone = json.loads(self.done("credential", "delete", self.ids["A"], "--json"))
        self.assertEqual((gone["done"], gone["credential"]["name"]), ("deleted", "A"))
        self.assertEqual(self.names(), ["C"])

    def test_who_is_unknown_is_told(self):
        for which in ("77", "nobody", "-1", "0", "99999999999"):
            for arguments in (["delete", "--", which], ["move", "--", which, "1"], ["edit", "--name=x", "--", which]):
                with self.subTest(arguments):
                    self.assertIn(which, self.refused(1, "credential", *arguments))
        self.assertEqual(self.names(), ["A", "B", "C"])

    def test_a_name_that_two_have_names_none(self):
        self.done("credential", "edit", "A", "--name", "B")
        self.assertIn("several", self.refused(1, "credential", "delete", "B"))
        self.done("credential", "delete", self.ids["B"])
        self.assertEqual(self.names(), ["B", "C"])

    def test_an_id_goes_before_a_name(self):
        self.done("credential", "edit", "A", "--name", self.ids["C"])
        self.done("credential", "delete", self.ids["C"])
        self.assertEqual(self.names(), [str(self.ids["C"]), "B"])

    def test_reload_takes_what_was_edited_by_hand(self):
        path = self.machine.folder / CONFIG
        path.write_text(path.read_text("utf-8-sig").replace(">A<", ">By hand<"), encoding="utf-8-sig")
        self.assertEqual(self.names(), ["A", "B", "C"])
        self.assertEqual(self.done("reload"), "The configuration was read again: 3 credentials.\n")
        self.assertEqual(self.names(), ["By hand", "B", "C"])
        self.assertEqual(json.loads(self.done("reload", "--json")), {"credentials": 3})


class WithoutAdapter(CredentialsTest):
    def test_each_command_says_so_at_once(self):
        self.add_user("A")
        self.machine.control.do("pullAdapter")
        for arguments in (
            ["credentials"],
            ["credentials", "--json"],
            ["reload"],
            ["credential", "delete", "A"],
            ["credential", "add", "--realm", "r", "--method", "tls", "--client-cert", "c"],
        ):
            with self.subTest(arguments):
                self.assertIn("no adapter", self.refused(1, *arguments, "--timeout", "3600"))


class WithoutService(unittest.TestCase):
    def test_each_command_says_so(self):
        with tempfile.TemporaryDirectory() as folder:
            for arguments in (
                ["credentials"],
                ["credentials", "--hs20-port", "1"],
                ["reload"],
                ["credential", "delete", "1"],
                ["credential", "move", "1", "1"],
                ["credential", "edit", "1", "--name", "x"],
                ["credential", "add", "--realm", "r", "--method", "tls", "--client-cert", "c"],
                ["credential", "add", "--realm", "r", "--username", "u", "--password-stdin"],
            ):
                with self.subTest(arguments):
                    result = run_client(*arguments, stdin="p", VEXA_MACHINE=folder)
                    self.assertEqual((result.returncode, result.stdout), (1, ""))
                    self.assertEqual(len(result.stderr.splitlines()), 1, result.stderr)


if __name__ == "__main__":
    unittest.main()
