"""Several at once: clients of one service that change its credentials, and a service that goes meanwhile."""

import base64
import collections
import hashlib
import json
import os
import random
import signal
import socket
import struct
import threading
import time
import unittest
import xml.etree.ElementTree

from client_credentials import CONFIG, run_client
from harness import ACCEPT_SUFFIX, Machine, Program, program, wait_until

TLS = ["--method", "tls", "--client-cert", "c", "--realm"]
UNKNOWN = "whether the change was made is not known"


class WithService(unittest.TestCase):
    def setUp(self):
        self.machine = self.enterContext(Machine({"speed": 20}))

    def at_once(self, *commands):
        """The commands, started together; gives their exit codes and lines."""
        programs = [Program([program("vexa"), *map(str, c), "--hs20-port", str(self.machine.hs20_port)]) for c in commands]
        for running in programs:
            self.addCleanup(running.end)
        return [(running.wait(), running.lines + running.errors) for running in programs]

    def realms(self):
        return [entry["realm"] for entry in json.loads(run_client("credentials", "--json", "--hs20-port", self.machine.hs20_port).stdout)]

    def test_everyone_who_is_told_of_success_has_it(self):
        commands = [["credential", "add", *TLS, f"r{n}"] for n in range(12)]
        results = self.at_once(*commands)
        self.assertEqual([code for code, _ in results], [0] * 12, results)
        self.assertEqual(sorted(self.realms()), sorted(f"r{n}" for n in range(12)))

    def test_of_equal_ones_one_is_stored(self):
        results = self.at_once(*[["credential", "add", *TLS, "same"]] * 8)
        self.assertEqual(sorted(code for code, _ in results), [0] + [1] * 7, results)
        self.assertTrue(all("already" in lines[0] for code, lines in results if code == 1), results)
        self.assertEqual(self.realms(), ["same"])

    def test_edits_at_once_keep_each_others_part(self):
        self.at_once(["credential", "add", *TLS, "r", "--ca-cert", "old"])
        results = self.at_once(
            ["credential", "edit", "1", "--name", "new"],
            ["credential", "edit", "1", "--ca-cert", "new"],
            ["credential", "edit", "1", "--client-cert", "new"],
            ["credential", "edit", "1", "--no-auto-connect"],
        )
        self.assertEqual([code for code, _ in results], [0] * 4, results)
        (entry,) = json.loads(run_client("credentials", "--json", "--machine", self.machine.folder).stdout)
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
                added = run_client("credential", "add", *TLS, f"mine{n}", "--hs20-port", self.machine.hs20_port)
                self.assertEqual(added.returncode, 0, added.stderr)
                again = run_client("credential", "add", *TLS, f"mine{n}", "--name", "x", "--hs20-port", self.machine.hs20_port)
                # The noise may have deleted it in between.
                self.assertEqual("Added" in again.stdout, again.returncode == 0, again.stderr)

    def test_a_killed_service_is_told_and_what_was_told_is_kept(self):
        told = set()
        for n in range(12):
            adding = Program([program("vexa"), "credential", "add", *TLS, f"r{n}", "--machine", str(self.machine.folder)])
            self.addCleanup(adding.end)
            time.sleep(random.uniform(0, 0.03))  # any moment will do
            os.kill(self.machine.service_pid(), signal.SIGKILL)
            if adding.wait() == 0:
                told.add(f"r{n}")
            else:
                self.assertEqual((adding.process.returncode, len(adding.errors)), (1, 1), adding.errors)
            self.machine.parent.wait()
            self.machine = self.enterContext(Machine({"speed": 20}, folder=self.machine.folder))
            self.assertLessEqual(told, set(self.realms()))
        text = (self.machine.folder / CONFIG).read_text("utf-8-sig")
        self.assertLessEqual(told, {e.text for e in xml.etree.ElementTree.fromstring(text).iter("realm")})


class Peer:
    """Listens like a service and lets the test say what each command is answered with, in which order."""

    def __init__(self, answer):
        self._answer = answer
        self._listener = socket.create_server(("127.0.0.1", 0))
        self.port = self._listener.getsockname()[1]
        self.commands = []
        self._thread = threading.Thread(target=self._listen, daemon=True)
        self._thread.start()

    def _listen(self):
        try:
            while True:
                connection, _ = self._listener.accept()
                threading.Thread(target=self._serve, args=(connection,), daemon=True).start()
        except OSError:
            pass  # closed

    def _serve(self, connection):
        with connection, connection.makefile("rb") as stream:
            key = b""
            for line in iter(stream.readline, b"\r\n"):
                name, _, value = line.partition(b":")
                key = value.strip() if name.lower() == b"sec-websocket-key" else key
            accepted = base64.b64encode(hashlib.sha1(key + ACCEPT_SUFFIX).digest())
            head = b"HTTP/1.1 101 x\r\nUpgrade: websocket\r\nConnection: Upgrade\r\nSec-WebSocket-Accept: "
            connection.sendall(head + accepted + b"\r\n\r\n")
            for command in iter(lambda: self._read(stream), None):
                self.commands.append(command["CommandId"])
                events = self._answer(command)
                if events is None:
                    return
                for event, data, *source in events:
                    envelope = {"EventId": event, "Source": (source or ["HotSpot20"])[0], "Data": json.dumps(data)}
                    text = json.dumps(envelope).encode()
                    length = bytes([len(text)]) if len(text) < 126 else b"\x7e" + struct.pack(">H", len(text))
                    connection.sendall(b"\x81" + length + text)

    @staticmethod
    def _read(stream):
        head = stream.read(2)
        if len(head) < 2 or head[0] & 0x0F != 1:
            return None
        length = head[1] & 0x7F
        if length == 126:
            (length,) = struct.unpack(">H", stream.read(2))
        mask = stream.read(4)
        payload = bytes(b ^ mask[i % 4] for i, b in enumerate(stream.read(length)))
        return json.loads(payload)

    def close(self):
        self._listener.close()


LIST, IN = "GET_ALL_CREDENTIAL_LIST", "CARD_PLUG_IN"


def stored(*realms):
    members = {"Type": 3, "AccessType": 1, "CredentialEapMethod": 1, "AutoConnect": True, "Creator": "a"}
    members |= {"CaCert": "", "ClientCert": "c", "Username": "", "Password": ""}
    return [members | {"Id": n, "CredentialName": r, "RealName": r} for n, r in enumerate(realms, 1)] or None


class InAnyOrder(unittest.TestCase):
    """What a service may send while several talk to it, each order on purpose."""

    def add(self, after_add, after_checks=(), timeout=20):
        """`vexa credential add` of the realm new, answered so."""
        checks = collections.deque(after_checks)

        def answer(command):
            if command["CommandId"] == "GET_ALL_CREDENTIAL_LIST":
                return [(LIST, None)]
            if command["CommandId"] == "ADD_CREDENTIAL":
                return after_add
            return checks.popleft() if checks else [(IN, "")]

        peer = Peer(answer)
        self.addCleanup(peer.close)
        return run_client("credential", "add", *TLS, "new", "--hs20-port", peer.port, "--timeout", timeout), peer

    def test_the_list_that_shows_it_is_enough(self):
        result, peer = self.add([(LIST, stored("new"))])
        self.assertEqual(result.returncode, 0, result.stderr)
        self.assertEqual(peer.commands, [LIST, "ADD_CREDENTIAL"])

    def test_a_list_without_it_may_be_for_another(self):
        result, _ = self.add([(LIST, stored("other")), (LIST, None), (LIST, stored("other", "new"))])
        self.assertEqual(result.returncode, 0, result.stderr)

    def test_so_may_an_answer_to_the_check(self):
        for early in ([(IN, "")], [("CARD_PLUG_OUT", "", "SpectralAnalyser"), (IN, "")]):
            result, _ = self.add([(LIST, None)], [early, [(LIST, stored("new")), (IN, "")]])
            self.assertEqual(result.returncode, 0, result.stderr)

    def test_a_service_that_went_past_it_has_refused_it(self):
        result, _ = self.add([(LIST, None), ("GET_RADIO", True)])
        self.assertEqual((result.returncode, result.stdout), (1, ""))
        self.assertIn("not stored", result.stderr)

    def test_equal_ones_of_another_are_not_taken_for_ours(self):
        other = [{**stored("new")[0], "ClientCert": "another"}]
        result, _ = self.add([(LIST, other)])
        self.assertEqual(result.returncode, 1)
        self.assertIn('credential 1 "new" is for TLS and this realm already', result.stderr)

    def test_a_service_that_goes_leaves_it_open(self):
        result, _ = self.add(None)
        self.assertEqual((result.returncode, result.stdout), (1, ""))
        self.assertEqual(result.stderr, f"vexa: the service has closed the connection; {UNKNOWN}\n")

    def test_so_does_one_that_says_nothing(self):
        result, _ = self.add([], [[], []], timeout=1)
        self.assertEqual(result.returncode, 1)
        self.assertEqual(result.stderr, f"vexa: the service did not answer within 1 s; {UNKNOWN}\n")

    def test_an_event_that_makes_no_sense_is_passed_over(self):
        result, _ = self.add([("X", {}), (LIST, [7, {"Id": "x"}]), (LIST, 5), (LIST, stored("new"))])
        self.assertEqual(result.returncode, 0, result.stderr)

    def test_a_service_that_has_just_started_is_asked_again(self):
        starting = ["GET_ALL_CREDENTIAL_LIST", "GET_ALL_NETWORK_LIST"]

        def answer(command):
            name = command["CommandId"]
            if name == "GET_IS_CARD_IN":
                return [(IN, "")]
            return [] if peer.commands.count(name) == 1 else [(name, None)]

        for command, name in zip(("credentials", "networks"), starting):
            peer = Peer(answer)
            self.addCleanup(peer.close)
            result = run_client(command, "--json", "--hs20-port", peer.port, "--timeout", 20)
            self.assertEqual((result.returncode, result.stdout), (0, "[]\n"), result.stderr)
            self.assertEqual(peer.commands.count(name), 2)

    def test_who_is_stopped_says_that_it_is_open(self):
        peer = Peer(lambda command: [(LIST, None)] if command["CommandId"] == LIST else [])
        self.addCleanup(peer.close)
        adding = Program([program("vexa"), "credential", "add", *TLS, "new", "--hs20-port", str(peer.port)])
        self.addCleanup(adding.end)
        wait_until(lambda: "ADD_CREDENTIAL" in peer.commands, "the command")
        self.assertEqual(adding.stop(signal.SIGINT), 1)
        self.assertEqual(adding.errors, [f"vexa: stopped before the service had answered; {UNKNOWN}"])


if __name__ == "__main__":
    unittest.main()
