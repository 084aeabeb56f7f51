"""`vexa credential import` and `export` on a running service."""

import json
import pathlib
import stat

from client_credentials import CredentialStory

FILES = pathlib.Path(__file__).parent.parent / "fuzz" / "credential_file_corpus"
UNIVERSITY = FILES / "university.eap-config"
NAME = "University & Friends"


class Files(CredentialStory):
    def shown(self):
        """The stored credentials without what belongs to the machine."""
        hidden = ("id", "creator", "position")
        return [{k: v for k, v in entry.items() if k not in hidden} for entry in self.list("--show-passwords")]

    def test_what_a_provider_hands_out_is_stored_in_its_order_and_the_rest_is_told(self):
        credential = ["credential", "import", UNIVERSITY]
        for options in ([], ["--username", "anna", "--password-stdin"], ["--client-cert", "c"]):
            self.refused(2, *credential, *options, stdin="secret")
        would = self.told(*credential, "--dry-run")
        self.assertEqual((len(would["wouldAdd"]), self.list()), (3, []))
        options = ["--username", "anna", "--client-cert", "anna@uni", "--password-stdin"]
        lines = self.done(*credential, *options, stdin="secret").splitlines()
        self.assertIn(f'Added credential 3 "{NAME} (uni.example, TTLS)" for TTLS and the realm "uni.example".', lines)
        not_kept = [line.removeprefix(f'Not kept: "{NAME}": ').split(" is not")[0] for line in lines[3:]]
        self.assertEqual(
            not_kept,
            ["the inner method PAP", "PEAP", "1 more CA certificate", 'ValidUntil "2036-11-25T00:00:00Z"', "CA",
             'ServerID "radius.uni.example"', 'OuterIdentity "guest@roam.uni.example"',
             'OuterIdentity "anna@uni.example"', "ClientCertificate", "Passphrase", 'SSID "eduroam"',
             'MinRSNProto "CCMP"', 'ConsortiumOID "001bc50460"', "EmailAddress"],
        )  # fmt: skip
        user = {"username": "anna@uni.example", "password": "secret"}
        authority = {"clientCert": "anna@uni", "caCert": "1b 14 dd 2f d7 9f aa 9f 3a bf 27 3e 04 e5 4e 38 51 c5 e2 b3"}
        expected = [
            {"realm": realm, "method": method, "name": f"{NAME} ({realm}, {method})", **others}
            for realm, method, others in (("uni.example", "TTLS", user), ("roam.uni.example", "TTLS", user),
                                          ("uni.example", "TLS", authority))
        ]  # fmt: skip
        self.assertEqual(self.shown(), [{"access": "all users", "autoConnect": True, **entry} for entry in expected])
        again = self.told(*credential)
        self.assertEqual((again["added"], len(again["skipped"])), ([], 3), "needs no password for what is there")

    def test_what_is_exported_can_be_imported_again(self):
        self.add_user("Lounge", "--no-auto-connect", password="hüsch")
        self.add_certificate("Work", "--per-user", "--ca-cert", "Root")
        before, folder = self.shown(), self.new_folder()
        bare, full = folder / "bare.json", folder / "full.json"
        words = self.done("credential", "export", bare)
        self.assertEqual(words, f'Wrote 2 credentials to "{bare}", without passwords.\n')
        self.done("credential", "export", full, "--with-passwords")
        self.assertEqual(stat.S_IMODE(full.stat().st_mode), 0o600)
        self.assertEqual(self.done("credential", "export", "--with-passwords"), full.read_text())
        self.assertNotIn("hüsch", bare.read_text())
        self.assertEqual(json.loads(bare.read_text())["version"], 1)
        (folder / "link").symlink_to(folder / "elsewhere")
        for name in ("bare.json", "link", "none/such", "."):
            self.refused(1, "credential", "export", folder / name)
        for file, password in ((full, None), (bare, "hüsch\n")):
            for name in ("Lounge", "Work"):
                self.done("credential", "delete", name)
            options = ["--password-stdin"] if password else []
            self.done("credential", "import", file, *options, stdin=password)
            self.assertEqual(self.shown(), before)
        self.assertEqual(len(self.told("credential", "import", bare)["skipped"]), 2)
        self.done("credential", "delete", "Work")
        self.control.do("fail", call="rename", error=112)
        unsaved = self.vexa("credential", "import", full)
        self.assertIn("kept in memory only: ", unsaved.stderr)
        self.assertEqual((unsaved.returncode, self.shown()), (1, before))
        self.done("credential", "edit", "Lounge", "--realm", "other")
        taken = self.vexa("credential", "import", full)
        self.assertEqual((taken.returncode, self.names()), (1, ["Work", "Lounge"]))
        self.assertIn('Skipped "Lounge": the name is taken by credential', taken.stdout)

    def test_a_file_that_cannot_be_read_changes_nothing(self):
        folder = self.new_folder()
        (folder / "long").write_bytes(b"<" * (2 << 20))
        (folder / "none").write_text("<EAPIdentityProviderList/>")
        for name, words in (
            (".", "cannot be read"),
            ("missing", "cannot be read"),
            ("long", "longer than 1 MiB"),
            ("none", "not all"),
        ):
            result = self.vexa("credential", "import", folder / name)
            self.assertEqual((result.returncode, words in result.stderr), (1, True), (name, result))
        self.assertEqual(self.list(), [])
