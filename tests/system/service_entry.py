"""Who gets in at the service's ports, and who does not."""

import os
import socket
import unittest

import harness
from harness import PATIENCE, Machine, WebSocket, handshake, tcp_rows

NOBODY = 65534
ANSWER_LIMIT = 5.0
GET = "GET / HTTP/1.1\r\n"
ORIGINS = ["Origin: http://example.com", "Origin: http://localhost", "Origin: null", "Origin:", "origin: x"]


def exchange(port, request):
    """All that the server answers until it closes the connection."""
    answer = b""
    with harness.open_connection(port, timeout=ANSWER_LIMIT) as connection:
        try:
            connection.sendall(request)
            while chunk := connection.recv(4096):
                answer += chunk
        except (ConnectionResetError, TimeoutError):
            pass
    return answer


def exchange_as(account, port, request):
    """As exchange(), in a process of another account. It does not start a program: that account may be unable to."""
    reader, writer = os.pipe()
    child = os.fork()
    if child == 0:
        try:
            os.setgroups([])
            os.setgid(account)
            os.setuid(account)
            os.write(writer, exchange(port, request))
        finally:
            os._exit(0)
    os.close(writer)
    with os.fdopen(reader, "rb") as answer:
        text = answer.read()
    os.waitpid(child, 0)
    return text


class Entry(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        machine = cls.machine = cls.enterClassContext(Machine({"speed": 20}))
        cls.ports = {"sa": machine.sa_port, "hs20": machine.hs20_port, "control": machine.control_port}
        cls.witnesses = (machine.sa(), "GET_CURRENT_CHANNEL"), (machine.hs20(), "GET_RADIO")

    def tearDown(self):
        self.assert_undisturbed()

    def assert_undisturbed(self):
        for client, command in self.witnesses:
            client.send(command)
            client.next_event()
        self.assertGreaterEqual(self.machine.control.query("time")["ms"], 0)

    def assert_refused(self, answer):
        self.assertEqual(answer.split(b"\r\n")[0], b"HTTP/1.1 403 Forbidden")

    def test_hosts_that_are_this_machine(self):
        for port in self.ports.values():
            for host in ("localhost", "LocalHost", "127.0.0.1", "[::1]"):
                for end in ("", f":{port}"):
                    with self.subTest(port=port, host=host + end):
                        WebSocket(port, host=host + end).close()

    def test_hosts_that_are_not(self):
        for name, port in self.ports.items():
            for host in (
                "example.com", f"example.com:{port}", f"localhost.example.com:{port}",
                f"127.0.0.1.example.com:{port}", "192.0.2.1", f"0.0.0.0:{port}", "[2001:db8::1]", "[::1",
                "[::1].example.com", "::1", "localhost@example.com", "127.0.0.1x", "localhost:80:80",
                "localhost:evil", "[::1]:evil",
            ):  # fmt: skip
                with self.subTest(port=name, host=host):
                    self.assert_refused(exchange(port, handshake(host)))

    def test_requests_that_do_not_get_in(self):
        for name, port in self.ports.items():
            host = f"127.0.0.1:{port}"
            good = handshake(host).decode()
            self.assertTrue(good.startswith(f"{GET}Host: {host}\r\n"))
            for request in (
                *(good.replace(GET, f"{GET}{header}\r\n") for header in ORIGINS),
                good.replace(f"Host: {host}\r\n", ""),
                good.replace(f"Host: {host}\r\n", "Host:\r\n"),
                good.replace(GET, f"{GET}Host: example.com\r\n"),
                good.replace("GET", "POST", 1),
                good.replace("HTTP/1.1", "HTTP/1.0"),
                f"{GET}Host: {host}\r\n\r\n",
                f"POST / HTTP/1.1\r\nHost: {host}\r\nContent-Length: 21\r\n\r\n" + '{"CommandId":"GET_RA"}',
                '{"CommandId":"FULL_SCAN"}\r\n\r\n',
                "\x16\x03\x01\x02\x00\x01\x00\r\n\r\n",
                f"{GET}Host: {host}\r\nX: " + "x" * 100000,
            ):
                with self.subTest(port=name, request=request[:200]):
                    self.assert_refused(exchange(port, request.encode("latin-1")))

    def test_another_account(self):
        if os.geteuid() != 0:
            self.skipTest("only root can become somebody else")
        for name, port in self.ports.items():
            # Nothing of what a stranger sends is waited for.
            for request in (handshake(f"127.0.0.1:{port}"), b"", b"garbage"):
                with self.subTest(port=name, request=request):
                    self.assert_refused(exchange_as(NOBODY, port, request))

    def test_silent_and_half_requests_hold_up_nobody(self):
        for port in self.ports.values():
            for beginning in (b"", b"G", b"GET / HTTP/1.1\r\nHost: loc") * 20:
                held = socket.create_connection(("127.0.0.1", port), timeout=PATIENCE)
                self.enterContext(held).sendall(beginning)
        self.assert_undisturbed()

    def test_only_the_loopback_address_listens(self):
        for name, port in self.ports.items():
            with self.subTest(name):
                listening = [address for address, state in tcp_rows(port) if state == "0A"]
                self.assertEqual(listening, ["0100007F"])
