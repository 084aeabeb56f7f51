"""`vexa doctor`: each gate on the way to a connection, shut and opened again on one machine."""

import json

from client_credentials import CredentialStory
from client_log import config
from harness import network, run_client, wait_until

CAFE = network(1, "Café", {"cafe.example": [21]}, visible=False, accepts=[{"eapMethod": 21, "password": "right"}])
SILENT = network(2, "Silent", {}, visible=False, anqp="never")
GATES = "service adapter radio switch session networks credential retries blocked outcome".split()


class Doctor(CredentialStory):
    scenario = {"connectMs": 100, "networks": [CAFE, SILENT], "config": config("true")}

    def found(self, *options, **variables):
        """The exit code, and each gate's state and words."""
        result = self.vexa("doctor", "--json", *options, **variables)
        gates = {entry["gate"]: entry for entry in json.loads(result.stdout)["gates"]}
        self.assertEqual(list(gates), GATES)
        return result, gates

    def wait_shut(self, names, *words):
        """Until these gates and no others are in the way, told in these words."""

        def shut():
            result, gates = self.found()
            shut = [gate for gate in gates if gates[gate]["state"] == "inTheWay"]
            self.assertEqual((result.returncode == 0, ", ".join(shut) in result.stderr), (not shut, True))
            self.assertEqual([bool(gates[gate]["advice"]) for gate in GATES], [gate in shut for gate in GATES])
            texts = [gates[gate]["seen"] for gate in shut]
            return shut == names.split() and all(word in text for word, text in zip(words, texts))

        wait_until(shut, f"{names or 'nothing'} in the way: {words}")

    def turn(self, action, *networks):
        """Shows or hides them, and has the module tell."""
        for entry in networks:
            self.control.do(action, bssid=entry["bssid"])
        self.control.do("reportNetworks")

    def edit(self, *options, stdin=None):
        self.done("credential", "edit", "Anna", *options, stdin=stdin)

    def test_every_gate_is_named_while_it_is_shut_and_no_other(self):
        self.add_user("Other")
        anna = ["--no-auto-connect"]
        for act, names, *words in (
            (lambda: self.control.do("pullAdapter"), "adapter"),
            (lambda: self.control.do("insertAdapter"), "networks", "no hotspot network is in range"),
            (lambda: self.control.do("radio", software="off"), "radio"),
            (lambda: self.control.do("radio", software="on"), "networks"),
            (lambda: self.done("disable"), "switch"),
            (lambda: self.done("enable"), "networks"),
            (lambda: self.turn("show", CAFE, SILENT), "networks credential", '"Silent"', "cafe.example (TTLS)"),
            (lambda: self.turn("hide", SILENT), "credential", "none fits"),
            (lambda: self.add_user("Anna", *anna, realm="cafe.example"), "credential", "waits to be asked"),
            (lambda: self.control.do("setSession", session="disconnected") or self.edit("--auto-connect"), "session"),
            (lambda: self.control.do("setSession", session="active"), "retries outcome", 'credential 2 "Anna"', "Café"),
            (lambda: self.edit("--password-stdin", stdin="right"), ""),
            (lambda: self.done("disconnect"), "blocked", '"Café"'),
        ):
            with self.subTest(names, words=words):
                act()
                self.wait_shut(names, *words)
        self.done("connect", "Café")
        self.assertIn("Nothing is in the way of a connection.\n", self.done("doctor"))
        for command, state in (("enable", "fine"), ("disable", "inTheWay")):
            self.done(command)
            self.machine.stop()
            result, gates = self.found()
            self.assertEqual((gates["switch"]["state"], "no service" in gates["service"]["seen"]), (state, True))
            self.start(folder=self.machine.folder, **self.scenario)

    def test_what_only_the_log_knows_is_not_known_without_it(self):
        self.machine.stop()
        self.start(**{**self.scenario, "config": config("false")})
        _, gates = self.found()
        unknown = [gate for gate in GATES if "set enabledump to true" in gates[gate]["seen"]]
        self.assertEqual(unknown, ["session", "retries", "blocked", "outcome"])
        lines = self.vexa("doctor").stdout.splitlines()
        self.assertEqual([sum(text in line for line in lines) for text in ("set enabledump", "see session")], [1, 3])
        terminal = self.terminal("doctor", columns=80, VEXA_MACHINE=str(self.machine.folder))
        terminal.finish()
        rows = terminal.screen.decode().splitlines()
        self.assertLessEqual(max(map(len, rows)), 80)
        self.assertTrue(any(row.startswith(" " * 16) for row in rows), rows)
        _, gates = self.found("--hs20-port", self.machine.hs20_port, VEXA_MACHINE="/nonexistent")
        self.assertEqual(gates["switch"]["state"], "notKnown")
        self.assertIn("no service runs", run_client("doctor", VEXA_MACHINE=self.new_folder()).stdout)
