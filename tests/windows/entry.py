"""Who gets in where the account of the other side can't be told: nobody."""

import unittest

import wine
from harness import WebSocket
from wine import Machine

ANSWER_LIMIT = 10


def first_line(port, request):
    with wine.open_direct(port, ANSWER_LIMIT) as connection:
        connection.sendall(request)
        return connection.makefile("rb").readline().rstrip()


class Stranger(unittest.TestCase):
    """A process that is none of Wine's has no owner in the table of connections, whoever runs it."""

    def test_a_stranger_is_refused_and_a_process_of_the_user_is_not(self):
        with Machine({"adapters": []}) as machine:
            witness = machine.sa(), machine.hs20()
            for port in (machine.sa_port, machine.hs20_port, machine.control_port):
                handshake = (
                    f"GET / HTTP/1.1\r\nHost: 127.0.0.1:{port}\r\nUpgrade: websocket\r\nConnection: Upgrade\r\n"
                    "Sec-WebSocket-Version: 13\r\nSec-WebSocket-Key: dGhlIHNhbXBsZSBub25jZQ==\r\n\r\n"
                )
                # Nothing of what a stranger sends is waited for.
                for request in (handshake.encode(), b"", b"garbage"):
                    with self.subTest(port=port, request=request):
                        self.assertEqual(first_line(port, request), b"HTTP/1.1 403 Forbidden")
                WebSocket(port).close()
            for client, command in zip(witness, ("GET_CURRENT_CHANNEL", "GET_IS_CARD_IN")):
                client.send(command)
                client.next_event()


if __name__ == "__main__":
    unittest.main()
