"""`vexa credentials`, `credential` and `reload` on a running service."""

from harness import Story


LONG = "n" * 127  # as long as a name may be


class CredentialStory(Story):
    scenario = {}

    def setUp(self):
        self.start(**self.scenario)

    def list(self, *options):
        return self.told("credentials", *options)

    def names(self):
        return [entry["name"] for entry in self.list()]

    def add_user(self, name, *options, realm=None, password="secret"):
        arguments = ["--name", name, "--realm", realm or name.lower(), "--username", "anna", "--password-stdin"]
        return self.done("credential", "add", *arguments, *options, stdin=password)

    def add_certificate(self, name, *options, realm=None):
        arguments = ["--name", name, "--realm", realm or name.lower(), "--method", "tls", "--client-cert", "Anna"]
        return self.done("credential", "add", *arguments, *options)


class Listing(CredentialStory):
    def test_the_table_is_in_the_order_of_priority(self):
        self.assertEqual(self.done("credential", "list"), "No credentials are stored.\n")
        self.add_user("Lounge", "--no-auto-connect")
        self.add_certificate("Work", "--per-user", "--ca-cert", "Root", "--creator", "IT")
        heading, *rows = self.done("credentials").splitlines()
        self.assertEqual(heading.split()[:5], ["Pos", "Id", "Name", "Realm", "Method"])
        # A column begins where its heading does.
        starts = [heading.index(word) for word in heading.split()] + [None]
        cells = [[row[a:b].strip() for a, b in zip(starts, starts[1:])] for row in rows]
        self.assertEqual(
            cells,
            [
                ["1", "2", "Work", "work", "TLS", "per user", "yes", "IT", "Anna, CA Root"],
                ["2", "1", "Lounge", "lounge", "TTLS", "all users", "no", "KORVANE-PC\\user", "anna"],
            ],
        )

    def test_on_a_terminal_the_table_fits_into_its_lines(self):
        self.add_user("Lounge of a very long name", "--creator", "Headquarters", realm="a.very.long.realm.example")
        whole = self.done("credentials").splitlines()
        for columns, shown in ((60, "Loun…  "), (80, "Lounge of…  "), (max(map(len, whole)), whole[1])):
            terminal = self.terminal("credentials", columns=columns, VEXA_MACHINE=str(self.machine.folder))
            terminal.finish()
            rows = terminal.screen.decode().splitlines()
            self.assertIn(shown, rows[1])
            self.assertLessEqual(max(map(len, rows)), columns)

    def test_passwords_show_only_when_asked_for(self):
        self.add_user("Lounge", password="gEh31m")
        asked = f"send {self.machine.hs20_port} GET_ALL_CREDENTIAL_LIST --wait 500"
        for command in ("credentials", "credentials --json", "credential edit Lounge --name B --json", asked):
            self.assertNotIn("gEh31m", self.done(*command.split()))
        self.assertIn("gEh31m", self.done(*asked.split(), "--show-passwords"))
        self.assertIn("gEh31m", self.done("credentials", "--show-passwords"))
        self.assertEqual(self.list("--show-passwords")[0]["password"], "gEh31m")

    def test_text_can_do_nothing_to_the_terminal(self):
        name = "a\x9b\x7f\t31m"
        data = {"Type": 3, "CredentialEapMethod": 1, "RealName": "r", "CredentialName": name}
        self.machine.hs20().send("ADD_CREDENTIAL", data)
        self.assertIn("a\\x9b\\x7f\\x0931m", self.done("credentials"))
        self.assertEqual(self.names(), [name])


class Adding(CredentialStory):
    USER = ["credential", "add", "--username", "u", "--password-stdin", "--realm"]
    TLS = ["credential", "add", "--method", "tls", "--client-cert", "c", "--realm"]

    def test_it_says_what_was_stored_and_where(self):
        words = 'Added credential 1 "Lounge" for the realm "lounge", in position 1 of 1.\n'
        self.assertEqual(self.add_user("Lounge"), words)
        added = self.told(*self.TLS, "corp.example")
        self.assertEqual((added["done"], added["credential"]["position"]), ("added", 1))
        self.assertEqual(self.names(), ["corp.example", "Lounge"], "without a name the realm is the name")

    def test_what_the_service_does_not_take_is_told(self):
        self.add_user("Lounge", realm="a")
        for reason, *options in (("realm", "a", "--name", "B"), ("name", "b", "--name", "Lounge"), ("name", "Lounge")):
            self.assertIn(reason, self.refused(1, *self.USER, *options, stdin="p"))
        self.assertEqual(self.names(), ["Lounge"])

    def test_wrong_use_reaches_no_service(self):
        bare, user, tls = ["credential", "add", "--realm", "r"], [*self.USER, "r"], [*self.TLS, "r"]
        for password, *commands in (
            (None, ["credential"], ["credential", "add"], bare, [*bare, "--username", "u"], [*bare, "--method", "sim"],
             [*bare, "--method", "tls"], [*tls, "--username", "u"], [*tls, "--client-cert", "a\nb"],
             ["credential", "edit", "1"], ["credential", "move", "1", "0"], ["credential", "delete"]),
            ("p", [*user, "--client-cert", "c"], [*user, "--password", "p"], [*user, "--per-user", "--all-users"],
             [*user, "--auto-connect", "--no-auto-connect"], [*tls, "--password-stdin"],
             *([*user, option, "x" * 128] for option in ("--realm", "--name")),
             *([*tls, option, text] for option in ("--client-cert", "--ca-cert") for text in ("x" * 128, "caf\udce9")),
             *([*user, option, "x" * 64] for option in ("--username", "--creator")), [*self.USER, "空港"]),
            *((password, user) for password in ("p" * 64, "😀" * 32, "a\x1bb", "a\tb", "a\x7f")),
        ):  # fmt: skip
            for command in commands:
                with self.subTest(command):
                    self.refused(2, *command, stdin=password)
        self.assertEqual(self.list(), [])

    def test_the_first_line_is_the_password_and_none_is_no_credential(self):
        for text in ("", "\n"):
            self.refused(1, *self.USER, "r", stdin=text)
        for text in ("  sp ace ", "one\ntwo\n", "dos\r\n"):
            self.add_user(f"N{text!r}", password=text)
        passwords = [entry["password"] for entry in self.list("--show-passwords")]
        self.assertEqual(passwords, ["dos", "one", "  sp ace "])

    def test_any_text_is_stored_as_it_is(self):
        for text in ("空港ラウンジ", "<&>\"'", " blanks ", "😀" * 31 + "x", "-dash", "a;b%s", "0"):
            with self.subTest(text):
                realm = "r" + text.encode("latin-1", "ignore").decode("latin-1")
                arguments = [f"--realm={realm}", f"--name={text}", f"--username={text}", "--password-stdin", "--json"]
                self.done("credential", "add", *arguments, stdin=text)
                stored = self.list("--show-passwords")[0]
                self.assertEqual([stored[k] for k in ("name", "username", "password")], [text] * 3)


class Changing(CredentialStory):
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

    def test_every_part_can_be_edited_and_what_is_not_given_is_left_alone(self):
        self.add_certificate("T")
        entries = {entry["name"]: entry for entry in self.list("--show-passwords")}
        for which, options, changes, words in (
            ("B", ["--realm", LONG, "--no-auto-connect"], {"realm": LONG, "autoConnect": False}, "realm, auto-connect"),
            ("A", ["--username", "bert"], {"username": "bert"}, "user name"),
            ("A", ["--password-stdin"], {"password": "typed"}, "password"),
            ("T", ["--client-cert", LONG], {"clientCert": LONG}, "client certificate"),
            ("T", ["--ca-cert", LONG], {"caCert": LONG}, "CA certificate"),
            ("T", ["--ca-cert", ""], {"caCert": ""}, "CA certificate"),
        ):
            with self.subTest((which, options)):
                told = self.done("credential", "edit", which, *options, stdin="typed")
                self.assertEqual(told, f'Changed credential {entries[which]["id"]} "{which}": {words}.\n')
                entries[which].update(changes)
                self.assertEqual(self.list("--show-passwords"), list(entries.values()))
        for edit in ("A --client-cert x", "A --username=", "T --username x", "T --password-stdin"):
            self.refused(2, "credential", "edit", *edit.split(), stdin="p")
        self.done("credential", "edit", "T", "--name", "")
        self.assertEqual(self.names(), ["", "A", "B", "C"])
        words = self.done("credential", "edit", "B", "--name", "B")
        self.assertEqual(words, 'Nothing to change: credential 2 "B" is like that already.\n')

    def test_deleting(self):
        self.assertEqual(self.done("credential", "delete", "B"), 'Deleted credential 2 "B".\n')
        gone = self.told("credential", "delete", self.ids["A"])
        self.assertEqual((gone["done"], gone["credential"]["name"]), ("deleted", "A"))
        self.assertEqual(self.names(), ["C"])

    def test_who_is_unknown_is_told(self):
        for which in ("77", "nobody", "-1", "0", "99999999999", "3 ", ""):
            for arguments in (["delete", "--", which], ["move", "--", which, "1"], ["edit", "--name=x", "--", which]):
                with self.subTest(arguments):
                    self.assertIn(which, self.refused(1, "credential", *arguments))
        self.assertEqual(self.names(), ["A", "B", "C"])

    def test_who_could_be_two_is_not_guessed(self):
        for part, told in ((("--name", "B"), "name is taken by"), (("--realm", "b"), "this realm already")):
            line = self.refused(1, "credential", "edit", "A", *part)
            self.assertRegex(line, 'not changed: .*credential 2 "B"')
            self.assertIn(told, line)
        self.assertIn("Changed", self.done("credential", "edit", "A", "--name", "A", "--realm", "a2"))
        client = self.machine.hs20()
        client.credentials("EDIT_CREDENTIAL", {**client.credentials()[0], "CredentialName": "B", "RealName": "b"})
        self.done("credential", "edit", "--id", "3", "--no-auto-connect")
        for arguments in (["delete", "B"], ["delete", "--name", "B"], ["move", "--name", "B", "1"]):
            self.assertIn("several", self.refused(1, "credential", *arguments))
        self.done("credential", "edit", "--id", "1", "--name", "3")
        told = 'vexa: "3" is the id of credential "B" and the name of credential 1: give --id 3 or --id 1'
        for arguments in (["delete", "3"], ["move", "3", "1"], ["edit", "3", "--name=x"]):
            self.assertEqual(self.refused(1, "credential", *arguments), told)
        for arguments in (["delete"], ["delete", "3", "--id", "3"], ["move", "--id", "3"], ["move", "3", "--id", "3", "1"]):
            self.refused(2, "credential", *arguments)
        self.assertIn('credential 1 "3"', self.done("credential", "move", "--name", "3", "1"))
        self.assertIn('credential 3 "B"', self.done("credential", "delete", "--id", "3"))

    def test_what_does_not_get_into_the_file_is_told(self):
        path, good = self.machine.config(), self.machine.config().read_bytes()

        def cannot_write():
            path.write_bytes(good)
            self.control.do("fail", call="rename", error=112)

        for why, spoil in (
            ("could not be written", cannot_write),
            ("is not well-formed XML", lambda: path.write_bytes(good[:-1])),
            ("cannot be opened", path.unlink),
        ):
            for verb, name, *arguments in (
                ("edited", "B", "edit", "B", "--no-auto-connect"), ("moved", "A", "move", "A", 3),
                ("deleted", "C", "delete", "C"), ("added", "D", "add", *Adding.TLS[2:], "D"),
            ):  # fmt: skip
                with self.subTest((why, verb)):
                    spoil() if path.exists() else None
                    told = self.refused(1, "credential", *arguments, "--json")
                    expected = rf'vexa: kept in memory only: credential \d "{name}" was {verb}, but {path} {why}'
                    self.assertRegex(told, expected)
            if spoil != cannot_write:
                told = f"vexa: not read again: {path} {why}; the service goes on with what it has"
                self.assertEqual(self.refused(1, "reload"), told)
            path.write_bytes(good)
            self.assertEqual(self.done("reload"), "The configuration was read again: 3 credentials.\n")

    def test_a_file_without_a_place_for_them_is_told(self):
        path, good = self.machine.config(), self.machine.config().read_bytes()
        users = good.index(b"<users>")
        for content in (good[:users] + b"</configurations>",
                        good[: good.index(b"<credentials>")] + good[users:],
                        b"<configurations><global/></configurations>"):  # fmt: skip
            path.write_bytes(content)
            told = self.refused(1, "credential", "add", *Adding.TLS[2:], "D")
            self.assertRegex(told, rf'kept in memory only: credential \d "D" was added, but {path} lacks an element')
            path.write_bytes(good)
            self.done("reload")

    def test_reload_takes_what_was_edited_by_hand(self):
        path = self.machine.config()
        path.write_text(path.read_text("utf-8-sig").replace(">A<", ">By hand<"), encoding="utf-8-sig")
        self.assertEqual(self.names(), ["A", "B", "C"])
        self.assertEqual(self.done("reload"), "The configuration was read again: 3 credentials.\n")
        self.assertEqual(self.names(), ["By hand", "B", "C"])
        self.assertEqual(self.told("reload"), {"credentials": 3})
