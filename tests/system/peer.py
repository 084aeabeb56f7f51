"""What stands in for a service that a client of the hotspot port talks to."""

import json
import socket
import threading

from harness import TEXT, accepted, frame, read_frame, read_head


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
                    envelope = {"EventId": event, "Source": (source or ["HotSpot20"])[0], "Data": json.dumps(data)}
                    connection.sendall(frame(TEXT, json.dumps(envelope).encode()))

    @staticmethod
    def _read(stream):
        try:
            _, opcode, payload = read_frame(stream)
        except OSError:
            return None
        return json.loads(payload) if opcode == TEXT else None
