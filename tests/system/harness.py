"""Drives the built programs as a client would: a machine with its service, WebSocket clients, and waits that end.

A test gets the folder with the programs from VEXA_BUILD.
"""

import base64
import collections
import hashlib
import json
import os
import pathlib
import shutil
import signal
import socket
import struct
import subprocess
import sys
import tempfile
import threading
import time

PATIENCE = 30.0
ACCEPT_SUFFIX = b"258EAFA5-E914-47DA-95CA-C5AB0DC85B11"
TEXT, BINARY, CLOSE, PING, PONG = 1, 2, 8, 9, 10


def program(name):
    """The path of a built program."""
    path = pathlib.Path(os.environ.get("VEXA_BUILD", "build/debug")) / "bin" / name
    if not path.exists():
        raise FileNotFoundError(f"{path}: build it, and set VEXA_BUILD to the build folder")
    return str(path.resolve())


def wait_until(condition, what, timeout=PATIENCE):
    """Gives the first true value of the condition; an AssertionError names `what` never came."""
    end = time.monotonic() + timeout
    while True:
        value = condition()
        if value:
            return value
        if time.monotonic() > end:
            raise AssertionError(f"not within {timeout} s: {what}")
        time.sleep(0.01)


def busy_ports():
    """The local ports with a row in the TCP table, each with the states of its rows."""
    ports = collections.defaultdict(set)
    for line in pathlib.Path("/proc/net/tcp").read_text().splitlines()[1:]:
        fields = line.split()
        ports[int(fields[1].split(":")[1], 16)].add(fields[3])
    return ports


def children_of(pid):
    """The processes that this one has started, without those that have ended."""
    children = []
    for path in pathlib.Path("/proc").glob("[0-9]*/stat"):
        try:
            fields = path.read_text().rpartition(")")[2].split()
        except OSError:
            continue
        if int(fields[1]) == pid and fields[0] != "Z":
            children.append(int(path.parent.name))
    return children


def is_running(pid):
    """False once the process has ended, even if nobody has asked for its exit code."""
    try:
        return pathlib.Path(f"/proc/{pid}/stat").read_text().rpartition(")")[2].split()[0] != "Z"
    except OSError:
        return False


def clean_environment(**variables):
    """The environment without anything that points at a machine; None leaves a variable out."""
    environment = {k: v for k, v in os.environ.items() if not k.startswith("VEXA_") and k != "NO_COLOR"}
    environment.update({k: v for k, v in variables.items() if v is not None})
    return environment


def open_connection(port, timeout=PATIENCE, receive_buffer=None):
    """A socket that is connected to a port of the machine under test."""
    connection = socket.socket()
    if receive_buffer:
        connection.setsockopt(socket.SOL_SOCKET, socket.SO_RCVBUF, receive_buffer)
    connection.settimeout(timeout)
    connection.connect(("127.0.0.1", port))
    return connection


class Refused(Exception):
    """The server did not take the client in; `status` is its HTTP status."""

    def __init__(self, status):
        super().__init__(f"HTTP status {status}")
        self.status = status


class WebSocket:
    """One client of one port. A thread collects what comes in, so that a test that does not look holds up nobody."""

    def __init__(self, port, host=None, headers=(), timeout=PATIENCE, reads=True, receive_buffer=None):
        self.received = collections.deque()
        self.close_code = None
        self._arrival = threading.Condition()
        self._sending = threading.Lock()
        self._socket = open_connection(port, timeout, receive_buffer)
        self._input = self._socket.makefile("rb")
        self._handshake(host or f"127.0.0.1:{port}", headers)
        self._socket.settimeout(None)
        self._reader = None
        if reads:
            self.start_reading()

    def start_reading(self):
        """For a client that was made with reads=False, and until now left all in its socket."""
        self._reader = threading.Thread(target=self._read_all, daemon=True)
        self._reader.start()

    def _handshake(self, host, headers):
        key = base64.b64encode(os.urandom(16))
        request = [
            b"GET / HTTP/1.1",
            b"Host: " + host.encode(),
            b"Upgrade: websocket",
            b"Connection: Upgrade",
            b"Sec-WebSocket-Version: 13",
            b"Sec-WebSocket-Key: " + key,
        ]
        request += [f"{name}: {value}".encode() for name, value in headers]
        self._socket.sendall(b"\r\n".join(request) + b"\r\n\r\n")
        status = self._input.readline().split()
        answer = {}
        for line in iter(self._input.readline, b"\r\n"):
            if not line:
                raise ConnectionError("closed during the handshake")
            name, _, value = line.partition(b":")
            answer[name.strip().lower()] = value.strip()
        if len(status) < 2 or status[1] != b"101":
            self._socket.close()
            raise Refused(int(status[1]) if len(status) > 1 else 0)
        accepted = base64.b64encode(hashlib.sha1(key + ACCEPT_SUFFIX).digest())
        if answer.get(b"sec-websocket-accept") != accepted:
            raise ConnectionError("a wrong Sec-WebSocket-Accept")

    def _exactly(self, count):
        data = self._input.read(count)
        if len(data) < count:
            raise ConnectionError("closed")
        return data

    def _read_frame(self):
        first, second = self._exactly(2)
        length = second & 0x7F
        if length == 126:
            (length,) = struct.unpack(">H", self._exactly(2))
        elif length == 127:
            (length,) = struct.unpack(">Q", self._exactly(8))
        return bool(first & 0x80), first & 0x0F, self._exactly(length)

    def _read_all(self):
        message, code = b"", 1006
        try:
            while True:
                final, opcode, payload = self._read_frame()
                if opcode == PING:
                    self.send_frame(PONG, payload)
                elif opcode == CLOSE:
                    code = struct.unpack(">H", payload[:2])[0] if len(payload) >= 2 else 1005
                    self.send_frame(CLOSE, payload[:2])
                    self._socket.shutdown(socket.SHUT_WR)
                    break
                elif opcode != PONG:
                    message += payload
                    if final:
                        self._arrived(message)
                        message = b""
        except (OSError, ValueError):
            pass
        with self._arrival:
            self.close_code = code
            self._arrival.notify_all()

    def _arrived(self, message):
        with self._arrival:
            self.received.append(message)
            self._arrival.notify_all()

    def send_frame(self, opcode, payload, final=True):
        mask = os.urandom(4)
        length = len(payload)
        head = bytes([(0x80 if final else 0) | opcode])
        if length < 126:
            head += bytes([0x80 | length])
        elif length < 0x10000:
            head += bytes([0x80 | 126]) + struct.pack(">H", length)
        else:
            head += bytes([0x80 | 127]) + struct.pack(">Q", length)
        repeated = (mask * (length // 4 + 1))[:length]
        masked = (int.from_bytes(payload, "big") ^ int.from_bytes(repeated, "big")).to_bytes(length, "big")
        with self._sending:
            self._socket.sendall(head + mask + masked)

    def send_text(self, text):
        self.send_frame(TEXT, text.encode() if isinstance(text, str) else text)

    def take(self, timeout=PATIENCE):
        """The oldest message not taken yet, as bytes."""
        with self._arrival:
            if not self._arrival.wait_for(lambda: self.received or self.close_code is not None, timeout):
                raise AssertionError(f"no message within {timeout} s")
            if not self.received:
                raise ConnectionError(f"closed with code {self.close_code}")
            return self.received.popleft()

    def wait_closed(self, timeout=PATIENCE):
        """Gives the close code; 1006 if the connection ended without one."""
        with self._arrival:
            if not self._arrival.wait_for(lambda: self.close_code is not None, timeout):
                raise AssertionError(f"still open after {timeout} s")
            return self.close_code

    def close(self):
        try:
            self._socket.shutdown(socket.SHUT_RDWR)
        except OSError:
            pass
        if self._reader:
            self._reader.join()
        self._input.close()
        self._socket.close()


class PortClient(WebSocket):
    """A client of the spectral or the hotspot port."""

    def send(self, command, data=None):
        message = {"CommandId": command}
        if data is not None:
            message["Data"] = data if isinstance(data, (str, bool)) else json.dumps(data)
        self.send_text(json.dumps(message))

    def next_event(self, timeout=PATIENCE):
        return json.loads(self.take(timeout))

    def wait_event(self, event_id, where=lambda event: True, timeout=PATIENCE):
        """The next event of this name; those before it are passed over."""
        end = time.monotonic() + timeout
        passed = []
        while True:
            try:
                event = self.next_event(max(0.0, end - time.monotonic()))
            except AssertionError:
                raise AssertionError(f"no {event_id} within {timeout} s, but {passed}") from None
            if event["EventId"] == event_id and where(event):
                return event
            passed.append(event["EventId"])


class ControlClient(WebSocket):
    """A client of the machine's control channel."""

    def ask(self, **message):
        self.send_text(json.dumps(message))
        return json.loads(self.take())

    def do(self, action, **members):
        self._result(self.ask(do=action, **members))

    def query(self, name, **members):
        return self._result(self.ask(query=name, **members)).get("result")

    @staticmethod
    def _result(answer):
        if not answer["ok"]:
            raise AssertionError(f"the machine refuses: {answer['error']}")
        return answer


class Program:
    """A running program, its lines collected as they come."""

    def __init__(self, arguments, environment=None, stdin=subprocess.DEVNULL):
        self.lines = []
        self.errors = []
        self.process = subprocess.Popen(
            arguments,
            env=environment if environment is not None else clean_environment(),
            stdin=stdin,
            stdout=subprocess.PIPE,
            stderr=subprocess.PIPE,
            text=True,
            errors="replace",
        )
        self._readers = [
            threading.Thread(target=self._collect, args=(self.process.stdout, self.lines), daemon=True),
            threading.Thread(target=self._collect, args=(self.process.stderr, self.errors), daemon=True),
        ]
        for reader in self._readers:
            reader.start()

    @staticmethod
    def _collect(stream, lines):
        for line in stream:
            lines.append(line.rstrip("\n"))

    def wait_line(self, start, timeout=PATIENCE):
        """The first line that begins so."""

        def found():
            match = next((line for line in list(self.lines) if line.startswith(start)), None)
            if match is None and self.process.poll() is not None:
                self.wait()
                match = next((line for line in self.lines if line.startswith(start)), None)
                if match is None:
                    raise AssertionError(f"ended with {self.process.returncode}, no line {start!r}: {self.errors}")
            return match

        return wait_until(found, f"a line {start!r}; there is {self.lines}, {self.errors}", timeout)

    def wait(self, timeout=PATIENCE):
        """Gives the exit code, with all lines collected."""
        code = self.process.wait(timeout)
        for reader in self._readers:
            reader.join(timeout)
        return code

    def stop(self, number=signal.SIGTERM, timeout=PATIENCE):
        self.process.send_signal(number)
        return self.wait(timeout)

    def end(self):
        """For clean-up: ends it whatever it does."""
        if self.process.poll() is None:
            try:
                self.stop(timeout=10)
            except subprocess.TimeoutExpired:
                self.process.kill()
                self.process.wait()
        for reader in self._readers:
            reader.join(5)
        for stream in (self.process.stdin, self.process.stdout, self.process.stderr):
            if stream:
                stream.close()


class Machine:
    """A simulated machine with its service, started by `vexa start`. Use it with `with`: it stops at the end, and
    after a failure shows what the machine has written."""

    def __init__(self, scenario=None, folder=None, service=None, control=True, arguments=()):
        self._own_folder = folder is None
        self.folder = pathlib.Path(folder or tempfile.mkdtemp(prefix="vexa-test-"))
        self._clients = []
        command = [program("vexa"), "start", "--machine", str(self.folder), *arguments]
        if scenario is not None:
            path = self.folder / "scenario-of-test.json"
            path.write_text(json.dumps(scenario))
            command += ["--scenario", str(path)]
        if control:
            command += ["--control-port", "0"]
        if service:
            command += ["--service", str(service)]
        self.parent = Program(command)
        self.sa_port = self.hs20_port = self.control_port = 0

    def __enter__(self):
        try:
            ports = dict(part.split("=") for part in self.parent.wait_line("ready ").split()[1:])
            self.sa_port, self.hs20_port = int(ports["sa"]), int(ports["hs20"])
            self.control_port = int(ports["control"])
            self.control = self._kept(ControlClient(self.control_port)) if self.control_port else None
        except BaseException:
            self.__exit__(*sys.exc_info())
            raise
        return self

    def __exit__(self, kind, *_):
        self.parent.end()
        for client in self._clients:
            client.close()
        if kind is not None:
            self._show_logs()
        if self._own_folder:
            shutil.rmtree(self.folder, ignore_errors=True)

    def _kept(self, client):
        self._clients.append(client)
        return client

    def sa(self, **options):
        """A new client of the spectral port."""
        return self._kept(PortClient(self.sa_port, **options))

    def hs20(self, **options):
        """A new client of the hotspot port."""
        return self._kept(PortClient(self.hs20_port, **options))

    def stop(self, number=signal.SIGTERM):
        """Stops it and gives the parent's exit code."""
        return self.parent.stop(number)

    def output(self):
        """What the service has printed."""
        return self._content("stdout.log")

    def debug_log(self):
        """What the service has told the debugger."""
        return self._content("debug.log")

    def service_pid(self):
        """The process of the service: the only child of its parent."""
        (pid,) = children_of(self.parent.process.pid)
        return pid

    def _content(self, name):
        path = self.folder / name
        return path.read_text(encoding="latin-1") if path.exists() else ""

    def _show_logs(self):
        for name, text in (
            ("debug.log", self.debug_log()),
            ("stdout.log", self.output()),
            ("standard error", "\n".join(self.parent.errors)),
        ):
            print(f"--- {name}\n{text[-4000:]}", file=sys.stderr)
