"""Who gets in where the account of the other side can't be told: nobody."""

import wine
from harness import Story, WebSocket, handshake

ANSWER_LIMIT = 10


class Stranger(Story):
    """A process that is none of Wine's has no owner in the table of connections, whoever runs it."""

    def test_a_stranger_is_refused_and_a_process_of_the_user_is_not(self):
        machine = self.start(adapters=[])
        witnesses = (machine.sa(), "GET_CURRENT_CHANNEL"), (machine.hs20(), "GET_IS_CARD_IN")
        for port in (machine.sa_port, machine.hs20_port, machine.control_port):
            # Nothing of what a stranger sends is waited for.
            for request in (handshake(f"127.0.0.1:{port}"), b"", b"garbage"):
                with self.subTest(port=port, request=request), wine.open_direct(port, ANSWER_LIMIT) as connection:
                    connection.sendall(request)
                    self.assertEqual(connection.makefile("rb").readline(), b"HTTP/1.1 403 Forbidden\r\n")
            WebSocket(port).close()
        for client, command in witnesses:
            client.send(command)
            client.next_event()
