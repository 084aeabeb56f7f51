"""Who gets in at the service's ports, and who does not."""

import os
import socket
import unittest

import harness
from harness import PATIENCE, Machine, WebSocket

NOBODY = 65534
ANSWER_LIMIT = 5.0
UPGRADE = (
    "Upgrade: websocket\r\nConnection: Upgrade\r\nSec-WebSocket-Version: 13\r\n"
    "Sec-WebSocket-Key: dGhlIHNhbXBsZSBub25jZQ==\r\n"
)

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
        cls.machine = Machine({"speed": 20})
        cls.addClassCleanup(cls.machine.__exit__, None, None, None)
        cls.machine.__enter__()
        cls.witness = {cls.machine.sa_port: cls.machine.sa(), cls.machine.hs20_port: cls.machine.hs20()}

    def ports(self):
        return {"sa": self.machine.sa_port, "hs20": self.machine.hs20_port, "control": self.machine.control_port}

    def assert_undisturbed(self):
        for port, command in ((self.machine.sa_port, "GET_CURRENT_CHANNEL"), (self.machine.hs20_port, "GET_RADIO")):
            client = self.witness[port]
            client.send(command)
            client.next_event()
        self.assertGreaterEqual(self.machine.control.query("time")["ms"], 0)

    def test_hosts_that_are_this_machine(self):
        for port in self.ports().values():
            for host in (
                f"localhost:{port}",
                "localhost",
                "LocalHost",
                f"127.0.0.1:{port}",
                "127.0.0.1",
                f"[::1]:{port}",
                "[::1]",
            ):
                with self.subTest(port=port, host=host):
                    WebSocket(port, host=host).close()
        self.assert_undisturbed()

    def test_hosts_that_are_not(self):
        for name, port in self.ports().items():
            for host in (
                "example.com",
                f"example.com:{port}",
                f"localhost.example.com:{port}",
                f"127.0.0.1.example.com:{port}",
                "192.0.2.1",
                f"0.0.0.0:{port}",
                "[2001:db8::1]",
                "[::1",
                "[::1].example.com",
                "::1",
                "localhost@example.com",
                "127.0.0.1x",
                "localhost:80:80",
                "localhost:evil",
                "[::1]:evil",
            ):
                with self.subTest(port=name, host=host):
                    self.assert_refused(port, f"GET / HTTP/1.1\r\nHost: {host}\r\n{UPGRADE}\r\n")
        self.assert_undisturbed()

    def assert_refused(self, port, request):
        answer = exchange(port, request.encode("latin-1"))
        self.assertEqual(answer.split(b"\r\n")[0], b"HTTP/1.1 403 Forbidden")

    def test_requests_that_do_not_get_in(self):
        for name, port in self.ports().items():
            host = f"Host: 127.0.0.1:{port}\r\n"
            get = "GET / HTTP/1.1\r\n"
            cases = {
                "an origin": f"{get}{host}Origin: http://example.com\r\n{UPGRADE}\r\n",
                "an origin on this machine": f"{get}{host}Origin: http://localhost\r\n{UPGRADE}\r\n",
                "the origin of a file": f"{get}{host}Origin: null\r\n{UPGRADE}\r\n",
                "an empty origin": f"{get}{host}Origin:\r\n{UPGRADE}\r\n",
                "an origin in small letters": f"{get}{host}origin: x\r\n{UPGRADE}\r\n",
                "no host": f"{get}{UPGRADE}\r\n",
                "an empty host": f"{get}Host:\r\n{UPGRADE}\r\n",
                "two hosts": f"{get}{host}Host: example.com\r\n{UPGRADE}\r\n",
                "a plain request": f"{get}{host}\r\n",
                "a plain post": f"POST / HTTP/1.1\r\n{host}Content-Length: 21\r\n\r\n" + '{"CommandId":"GET_RA"}',
                "another method": f"POST / HTTP/1.1\r\n{host}{UPGRADE}\r\n",
                "an old protocol": f"GET / HTTP/1.0\r\n{host}{UPGRADE}\r\n",
                "garbage": "\x16\x03\x01\x02\x00\x01\x00\r\n\r\n",
                "a command without a handshake": '{"CommandId":"FULL_SCAN"}\r\n\r\n',
                "a header that has no end": f"{get}{host}X: " + "x" * 100000,
            }
            for case, request in cases.items():
                with self.subTest(port=name, case=case):
                    self.assert_refused(port, request)
        self.assert_undisturbed()

    def test_another_account(self):
        if os.geteuid() != 0:
            self.skipTest("only root can become somebody else")
        for name, port in self.ports().items():
            good = f"GET / HTTP/1.1\r\nHost: 127.0.0.1:{port}\r\n{UPGRADE}\r\n"
            # Nothing of what a stranger sends is waited for.
            for request in (good, "", "garbage"):
                with self.subTest(port=name, request=request):
                    answer = exchange_as(NOBODY, port, request.encode())
                    self.assertEqual(answer.split(b"\r\n")[0], b"HTTP/1.1 403 Forbidden")
        self.assert_undisturbed()

    def test_silent_and_half_requests_hold_up_nobody(self):
        held = []
        try:
            for port in self.ports().values():
                for beginning in (b"", b"G", b"GET / HTTP/1.1\r\nHost: loc"):
                    for _ in range(20):
                        held.append(socket.create_connection(("127.0.0.1", port), timeout=PATIENCE))
                        held[-1].sendall(beginning)
            self.assert_undisturbed()
        finally:
            for connection in held:
                connection.close()
        self.assert_undisturbed()

    def test_only_the_loopback_address_listens(self):
        with open("/proc/net/tcp", encoding="ascii") as table:
            rows = [line.split() for line in table.readlines()[1:]]
        listening = {row[1] for row in rows if row[3] == "0A"}
        for name, port in self.ports().items():
            with self.subTest(name):
                self.assertIn(f"0100007F:{port:04X}", listening)
                self.assertNotIn(f"00000000:{port:04X}", listening)


if __name__ == "__main__":
    unittest.main()
