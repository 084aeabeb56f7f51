"""Several at once: clients of one service that change its credentials, and a service that goes meanwhile."""

import collections
import json
import signal
import socket
import threading

from harness import CHANNEL_LIST, TEXT, Story, accepted, frame, read_frame, read_head, run_client, wait_until

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


NO_DATA = object()
SAMPLE = "SPECTRAL_ANALYSER_SAMPLE_DATA_"


class Peer:
    """Listens like a service and lets the test say what each command is answered with, in which order; None closes the
    connection."""

    def __init__(self, answer):
        self._answer = answer
        self._listener = socket.create_server(("127.0.0.1", 0))
        self.port = self._listener.getsockname()[1]
        self.commands = []
        threading.Thread(target=self._listen, daemon=True).start()

    def __enter__(self):
        return self

    def __exit__(self, *_):
        self._listener.close()

    def _listen(self):
        try:
            while True:
                connection, _ = self._listener.accept()
                threading.Thread(target=self._serve, args=(connection,), daemon=True).start()
        except OSError:
            pass  # closed

    def _serve(self, connection):
        with connection, connection.makefile("rb") as stream:
            _, headers = read_head(stream)
            head = b"HTTP/1.1 101 x\r\nUpgrade: websocket\r\nConnection: Upgrade\r\nSec-WebSocket-Accept: "
            connection.sendall(head + accepted(headers[b"sec-websocket-key"]) + b"\r\n\r\n")
            while (command := self._read(stream)) is not None:
                self.commands.append(command["CommandId"])
                events = self._answer(command)
                if events is None:
                    return
                for event, data, *source in events:
                    envelope = {"EventId": event, "Source": (source or ["HotSpot20"])[0]}
                    envelope |= {} if data is NO_DATA else {"Data": json.dumps(data)}
                    connection.sendall(frame(TEXT, json.dumps(envelope).encode()))

    @staticmethod
    def _read(stream):
        try:
            _, opcode, payload = read_frame(stream)
        except OSError:
            return None
        return json.loads(payload) if opcode == TEXT else None


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

    def test_a_scan_is_not_over_with_what_was_told_before_its_list(self):
        def answer(command):
            if command["CommandId"] == "GET_CHANNEL_LIST":
                return [(f"{SAMPLE}INTERFERENCE", {"order": 1, "noise_value": 42}), (CHANNEL_LIST, listed)]
            is_renewed = peer.commands.count("FULL_SCAN") == 2
            return [(f"{SAMPLE}CONGESTION", {"order": 1, "congestion_value": 30})] if is_renewed else []

        listed = [{"Channel": 36, "Order": 1}]
        for limit, congestion in ((1, None), (30, 30)):
            peer = self.enterContext(Peer(answer))
            told = self.done("scan", "--json", "--timeout", limit, "--sa-port", peer.port, VEXA_MACHINE=None)
            channel = {"channel": 36, "order": 1, "congestion": congestion, "interference": 42}
            self.assertEqual(json.loads(told), {"channels": [channel]})

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
        self.assertEqual(adding.stop(signal.SIGINT), 130)
        self.assertEqual(adding.errors, [f"vexa: stopped before the service had answered; {UNKNOWN}"])

    def test_a_connection_that_nothing_tells_of_is_believed_when_it_lasts(self):
        looks = iter([False] + [True] * 9)
        known = {"GET_IS_CARD_IN": (IN, ""), LIST: (LIST, stored("r")), "CONNECT_NETWORK": ("X", 0)}

        def answer(command):
            name = command["CommandId"]
            if name == "GET_ALL_NETWORK_LIST":
                realms = [{"CredentialEapMethod": 1, "RealmName": "r"}]
                entry = {"NetWorkName": "Café", "RealmFetched": True, "SupportRealmList": realms}
                return [(name, [{**entry, "IsConnected": next(looks)}])]
            return [known.get(name, (name, True))]

        peer = self.enterContext(Peer(answer))
        told = self.done("connect", "Café", "--hs20-port", peer.port, VEXA_MACHINE="/nonexistent")
        self.assertEqual(told, 'Connected to "Café" with the credential "r".\n')
