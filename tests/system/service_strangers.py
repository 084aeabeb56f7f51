"""Other accounts at the service's ports, and what is left on the ports of those who were there."""

import os
import pathlib
import signal
import socket
import unittest

import harness
from harness import Machine, WebSocket, wait_until

NOBODY = 65534
FIN_WAIT_1 = "04"
MOST_OUTSIDE = 16
CROWD = 300
HALF_A_REQUEST = b"GET / HTTP/1.1\r\nHost: localhost\r\n"
REST = (
    b"Upgrade: websocket\r\nConnection: Upgrade\r\nSec-WebSocket-Version: 13\r\n"
    b"Sec-WebSocket-Key: dGhlIHNhbXBsZSBub25jZQ==\r\n"
)


def request(size):
    """A handshake of so many bytes."""
    fixed = HALF_A_REQUEST + REST + b"X: \r\n\r\n"
    return fixed.replace(b"X: ", b"X: " + b"x" * (size - len(fixed)))


def frame(text):
    return bytes([0x81, 0x80 | len(text), 0, 0, 0, 0]) + text


def connect(port):
    connection = socket.socket()
    connection.settimeout(harness.PATIENCE)
    connection.connect(("127.0.0.1", port))
    return connection


def press(port):
    """Many at once; for most of them there is no answer but the end."""
    crowd = [socket.socket() for _ in range(CROWD)]
    for connection in crowd:
        connection.connect_ex(("127.0.0.1", port))
    return crowd


class Stranger:
    """A process of another account that does one thing and keeps what it has until the end of the block."""

    def __init__(self, action):
        done, self._done = os.pipe()
        self._stay, stay = os.pipe()
        self.pid = os.fork()
        if self.pid == 0:
            code = 1
            try:
                os.setgroups([])
                os.setgid(NOBODY)
                os.setuid(NOBODY)
                kept = action()
                code = 0 if kept is not False else 1
                os.write(self._done, b"x")
                signal.pause()
            finally:
                os._exit(code)
        os.close(self._done)
        os.close(self._stay)
        os.close(stay)
        with os.fdopen(done, "rb") as pipe:
            if not pipe.read(1):
                raise AssertionError("the stranger has failed")

    def __enter__(self):
        return self

    def __exit__(self, *_):
        os.kill(self.pid, signal.SIGKILL)
        os.waitpid(self.pid, 0)


def sockets_at(port):
    """Rows of the TCP table with this port at one end, each once: ports, state, inode. On a busy host the table, which
    comes in pieces, holds some twice."""
    rows = set()
    for line in pathlib.Path("/proc/net/tcp").read_text().splitlines()[1:]:
        fields = line.split()
        ends = [int(end.split(":")[1], 16) for end in fields[1:3]]
        if port in ends:
            rows.add((*ends, fields[3], fields[9]))
    return rows


def accepted_at(port):
    """How many connections the service has there."""
    return sum(row[0] == port and row[2] != "0A" and row[3] != "0" for row in sockets_at(port))


@unittest.skipIf(os.geteuid() != 0, "only root can become somebody else")
class Strangers(unittest.TestCase):
    def test_what_a_stranger_leaves_behind_is_not_carried_out(self):
        with Machine({"speed": 20}) as machine:
            witness = {"sa": machine.sa(), "hs20": machine.hs20()}
            cases = {
                machine.sa_port: b'{"CommandId":"GET_CURRENT_CHANNEL"}',
                machine.hs20_port: b'{"CommandId":"GET_IS_CARD_IN"}',
                machine.control_port: b'{"do":"pullAdapter"}',
            }

            def leave_commands():
                for port, command in cases.items():
                    for size in (200, 512) * 20:
                        with connect(port) as connection:
                            connection.sendall(request(size) + frame(command))

            # All of them have gone before the service sees the first one.
            os.kill(machine.service_pid(), signal.SIGSTOP)
            try:
                with Stranger(leave_commands):
                    for port in cases:
                        wait_until(
                            lambda port=port: all(row[2] != FIN_WAIT_1 for row in sockets_at(port)),
                            "the end of what the stranger has left",
                        )
            finally:
                os.kill(machine.service_pid(), signal.SIGCONT)
            for port in cases:
                WebSocket(port).close()  # comes behind them
            witness["sa"].send("GET_CHANNEL_LIST")
            self.assertEqual(witness["sa"].next_event()["EventId"], "RADIO_ON")
            witness["hs20"].send("GET_RADIO")
            self.assertEqual(witness["hs20"].next_event()["EventId"], "GET_RADIO")

    def test_a_crowd_of_strangers_shuts_nobody_out(self):
        with Machine({"speed": 20}) as machine:
            for port, clients in ((machine.sa_port, 0), (machine.hs20_port, 0), (machine.control_port, 1)):
                with self.subTest(port=port), connect(port) as early:
                    early.sendall(HALF_A_REQUEST)
                    with Stranger(lambda port=port: press(port)):
                        WebSocket(port).close()
                        self.assertLessEqual(accepted_at(port), MOST_OUTSIDE + clients + 1)
                        early.sendall(REST + b"\r\n")
                        self.assertTrue(early.recv(100).startswith(b"HTTP/1.1 101"))

    def test_a_refused_stranger_can_read_why(self):
        with Machine({"speed": 20}) as machine:

            def ask():
                with connect(machine.sa_port) as connection:
                    return connection.recv(100).startswith(b"HTTP/1.1 403")

            with Stranger(ask):
                pass


class Silent(unittest.TestCase):
    def test_clients_of_ours_that_say_nothing_shut_nobody_out(self):
        with Machine({"speed": 20}) as machine:
            early = [connect(machine.sa_port) for _ in range(MOST_OUTSIDE - 1)]
            for connection in early:
                connection.sendall(HALF_A_REQUEST)
            silent = [connect(machine.sa_port) for _ in range(2 * MOST_OUTSIDE)]
            WebSocket(machine.sa_port).close()
            self.assertLessEqual(accepted_at(machine.sa_port), MOST_OUTSIDE + 1)
            for connection in early:
                connection.sendall(REST + b"\r\n")
                self.assertTrue(connection.recv(100).startswith(b"HTTP/1.1 101"))
            for connection in (*early, *silent):
                connection.close()


class Restart(unittest.TestCase):
    def test_the_ports_are_free_again_however_the_clients_and_the_service_end(self):
        with Machine({"speed": 20}) as machine:
            ports = ("--sa-port", str(machine.sa_port), "--hs20-port", str(machine.hs20_port))
        for number in (signal.SIGTERM, signal.SIGKILL, signal.SIGTERM):
            with Machine({"speed": 20}, arguments=ports) as machine:
                clients = [port() for port in (machine.sa, machine.hs20) for _ in range(10)]
                clients += [machine.sa(reads=False), machine.hs20(reads=False)]
                clients[0].send_frame(harness.CLOSE, b"\x03\xe8")
                clients[0].wait_closed()
                with connect(machine.sa_port) as refused:
                    refused.sendall(b"GET / HTTP/1.1\r\n\r\n")
                    self.assertTrue(refused.recv(100).startswith(b"HTTP/1.1 403"))
                os.kill(machine.service_pid(), number) if number == signal.SIGKILL else machine.stop()
                machine.parent.wait()
                self.assertEqual(clients[1].wait_closed(), 1006 if number == signal.SIGKILL else 1001)


if __name__ == "__main__":
    unittest.main()
