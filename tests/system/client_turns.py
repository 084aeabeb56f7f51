"""Several at once: clients of one service that change its credentials, and a service that goes meanwhile."""

import collections
import os
import random
import signal
import threading
import time
import xml.etree.ElementTree

from harness import Story, run_client, wait_until
from peer import Peer

ADD = ["credential", "add", "--method", "tls", "--client-cert", "c", "--realm"]
UNKNOWN = "whether the change was made is not known"


class WithService(Story):
    def setUp(self):
        self.start()

    def at_once(self, *commands):
        """The commands, started together; gives their exit codes and lines."""
        programs = [self.running(*command, "--hs20-port", self.machine.hs20_port) for command in commands]
        return [(running.wait(), running.lines + running.errors) for running in programs]

    def realms(self):
        return [entry["realm"] for entry in self.told("credentials")]

    def test_everyone_who_is_told_of_success_has_it(self):
        realms = sorted(f"r{n}" for n in range(12))
        results = self.at_once(*[[*ADD, realm] for realm in realms])
        self.assertEqual([code for code, _ in results], [0] * 12, results)
        self.assertEqual(sorted(self.realms()), realms)

    def test_of_equal_ones_one_is_stored(self):
        results = self.at_once(*[[*ADD, "same"]] * 8)
        self.assertEqual(sorted(code for code, _ in results), [0] + [1] * 7, results)
        self.assertTrue(all("already" in lines[0] for code, lines in results if code == 1), results)
        self.assertEqual(self.realms(), ["same"])

    def test_edits_at_once_keep_each_others_part(self):
        self.done(*ADD, "r", "--ca-cert", "old")
        parts = ["--name", "new"], ["--ca-cert", "new"], ["--client-cert", "new"], ["--no-auto-connect"]
        results = self.at_once(*[["credential", "edit", "1", *part] for part in parts])
        self.assertEqual([code for code, _ in results], [0] * 4, results)
        (entry,) = self.told("credentials")
        self.assertEqual([entry[k] for k in ("name", "caCert", "clientCert", "autoConnect")], ["new"] * 3 + [False])

    def test_a_noisy_client_confuses_nobody(self):
        noise = self.machine.hs20()
        quiet = threading.Event()

        def make_noise():
            number = 0
            while not quiet.wait(0.001):
                number += 1
                noise.send("GET_ALL_CREDENTIAL_LIST")
                noise.send("ADD_CREDENTIAL", {"Type": 3, "CredentialEapMethod": 1, "RealName": f"noise{number % 7}"})
                noise.send("DELETE_CREDENTIAL", {"Id": random.randint(1, 40)})

        thread = threading.Thread(target=make_noise)
        thread.start()
        self.addCleanup(thread.join)
        self.addCleanup(quiet.set)
        for n in range(10):
            with self.subTest(n):
                self.done(*ADD, f"mine{n}")
                again = self.vexa(*ADD, f"mine{n}", "--name", "x")
                # The noise may have deleted it in between.
                self.assertEqual("Added" in again.stdout, again.returncode == 0, again.stderr)

    def test_a_killed_service_is_told_and_what_was_told_is_kept(self):
        told = set()
        for n in range(12):
            adding = self.running(*ADD, f"r{n}", "--machine", self.machine.folder)
            time.sleep(random.uniform(0, 0.03))  # any moment will do
            os.kill(self.machine.service_pid(), signal.SIGKILL)
            if adding.wait() == 0:
                told.add(f"r{n}")
            else:
                self.assertEqual((adding.process.returncode, len(adding.errors)), (1, 1), adding.errors)
            self.machine.parent.wait()
            self.start(folder=self.machine.folder)
            self.assertLessEqual(told, set(self.realms()))
        tree = xml.etree.ElementTree.parse(self.machine.config())
        self.assertLessEqual(told, {entry.text for entry in tree.iter("realm")})


LIST, IN = "GET_ALL_CREDENTIAL_LIST", "CARD_PLUG_IN"


def stored(*realms):
    members = {"Type": 3, "AccessType": 1, "CredentialEapMethod": 1, "AutoConnect": True, "Creator": "a"}
    members |= {"CaCert": "", "ClientCert": "c", "Username": "", "Password": ""}
    return [members | {"Id": n, "CredentialName": r, "RealName": r} for n, r in enumerate(realms, 1)] or None


class InAnyOrder(Story):
    """What a service may send while several talk to it, each order on purpose."""

    def add(self, after_add, after_checks=(), timeout=20):
        """`vexa credential add` of the realm new, answered so: gives the exit code, the lines and the commands."""
        checks = collections.deque(after_checks)

        def answer(command):
            if command["CommandId"] == LIST:
                return [(LIST, None)]
            if command["CommandId"] == "ADD_CREDENTIAL":
                return after_add
            return checks.popleft() if checks else [(IN, "")]

        peer = self.enterContext(Peer(answer))
        result = run_client(*ADD, "new", "--hs20-port", peer.port, "--timeout", timeout)
        return result, peer.commands

    def test_what_shows_that_it_is_stored(self):
        new, other = (LIST, stored("new")), (LIST, stored("other"))
        for what, *events in (
            ("a list that comes after one for another", [other, (LIST, None), (LIST, stored("other", "new"))]),
            ("a list after an answer to the check", [(LIST, None)], [[(IN, "")], [new, (IN, "")]]),
            ("a list after news of the adapter and that answer", [(LIST, None)],
             [[("CARD_PLUG_OUT", "", "SpectralAnalyser"), (IN, "")], [new, (IN, "")]]),
            ("a list after events that make no sense", [("X", {}), (LIST, [7, {"Id": "x"}]), (LIST, 5), new]),
        ):  # fmt: skip
            with self.subTest(what):
                result, _ = self.add(*events)
                self.assertEqual((result.returncode, result.stderr), (0, ""))
        result, commands = self.add([new])
        self.assertEqual((result.returncode, commands), (0, [LIST, "ADD_CREDENTIAL"]), "the list is enough")

    def test_what_leaves_it_open_or_refused(self):
        of_another = [{**stored("new")[0], "ClientCert": "another"}]
        for told, *events in (
            ("not stored: the service refused it; its log may say why", [(LIST, None), ("GET_RADIO", True)]),
            ('not stored: credential 1 "new" is for TLS and this realm already', [(LIST, of_another)]),
            (f"the service has closed the connection; {UNKNOWN}", None),
            (f"the service did not answer within 1 s; {UNKNOWN}", [], [[], []], 1),
        ):
            with self.subTest(told):
                result, _ = self.add(*events)
                self.assertEqual((result.returncode, result.stdout, result.stderr), (1, "", f"vexa: {told}\n"))

    def test_a_service_that_has_just_started_is_asked_again(self):
        def answer(command):
            name = command["CommandId"]
            if name == "GET_IS_CARD_IN":
                return [(IN, "")]
            return [] if peer.commands.count(name) == 1 else [(name, None)]

        for command, name in (("credentials", LIST), ("networks", "GET_ALL_NETWORK_LIST")):
            peer = self.enterContext(Peer(answer))
            self.assertEqual(self.done(command, "--json", "--hs20-port", peer.port, VEXA_MACHINE=None), "[]\n")
            self.assertEqual(peer.commands.count(name), 2)

    def test_who_is_stopped_says_that_it_is_open(self):
        peer = self.enterContext(Peer(lambda command: [(LIST, None)] if command["CommandId"] == LIST else []))
        adding = self.running(*ADD, "new", "--hs20-port", peer.port)
        wait_until(lambda: "ADD_CREDENTIAL" in peer.commands, "the command")
        self.assertEqual(adding.stop(signal.SIGINT), 1)
        self.assertEqual(adding.errors, [f"vexa: stopped before the service had answered; {UNKNOWN}"])
