"""Drives the built programs as a client would: a machine with its service, WebSocket clients, and waits that end.

A test gets the folder with the programs from VEXA_BUILD.
"""

import base64
import collections
import contextlib
import ctypes
import fcntl
import hashlib
import json
import os
import pathlib
import pty
import random
import re
import select
import shutil
import signal
import socket
import struct
import subprocess
import sys
import tempfile
import termios
import threading
import time
import unittest

PATIENCE = 30.0
KEY = base64.b64encode(bytes(16))
CLONE_NEWUSER = 0x10000000
TEXT, BINARY, CLOSE, PING, PONG = 1, 2, 8, 9, 10
CHANNEL, CHANNEL_LIST = "SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA", "SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G"
# Commands whose answer has another name.
ANSWERS = {"GET_CURRENT_CHANNEL": CHANNEL, "GET_CHANNEL_LIST": CHANNEL_LIST, "GET_IS_CARD_IN": "CARD_PLUG_IN"}
STORE = pathlib.PurePath("Public", "Roaming", "Korvane")


def enter_namespace(kind):
    """Moves this process and its children into a namespace of their own; False where that isn't allowed."""
    libc = ctypes.CDLL(None, use_errno=True)
    user, group = os.getuid(), os.getgid()
    if libc.unshare(kind) != 0:
        if libc.unshare(CLONE_NEWUSER | kind) != 0:
            return False
        for name, content in (("uid_map", f"{user} {user} 1"), ("setgroups", "deny"), ("gid_map", f"{group} {group} 1")):
            pathlib.Path("/proc/self", name).write_text(content)
    return True


def program(name):
    path = pathlib.Path(os.environ.get("VEXA_BUILD", "build/debug")) / "bin" / name
    if not path.exists():
        raise FileNotFoundError(f"{path}: build it, and set VEXA_BUILD to the build folder")
    return str(path.resolve())


def wait_until(condition, what, timeout=PATIENCE):
    """Gives the first true value of the condition; an AssertionError names `what` never came."""
    end = time.monotonic() + timeout
    while not (value := condition()):
        if time.monotonic() > end:
            raise AssertionError(f"not within {timeout} s: {what}")
        time.sleep(0.01)
    return value


def tcp_rows(port):
    """The rows of the TCP table with this local port, each with its address, backwards, and its state."""
    lines = pathlib.Path("/proc/net/tcp").read_text().splitlines()[1:]
    rows = [(*line.split()[1].split(":"), line.split()[3]) for line in lines]
    return [(address, state) for address, local, state in rows if int(local, 16) == port]


def free_ports(count):
    """Ports without a row in the TCP table, which neither an outgoing connection nor another test, nor `vexa start`,
    takes while this process runs."""
    ports = []
    while len(ports) < count:
        port, name = random.randrange(10000, 32000), socket.socket(socket.AF_UNIX, socket.SOCK_DGRAM)
        with contextlib.suppress(OSError), socket.socket() as trial:
            name.bind(f"\0vexa-port-{port}")
            trial.bind(("127.0.0.1", port))
            ports.append(port)
            name.detach()
    return ports


def process_state(pid):
    """The letter of its state and its parent; Z as well once nobody knows it any more."""
    try:
        fields = pathlib.Path(f"/proc/{pid}/stat").read_text(errors="replace").rpartition(")")[2].split()
    except OSError:
        return "Z", 0
    return fields[0], int(fields[1])


def is_running(pid):
    """False once the process has ended, even if nobody has asked for its exit code."""
    return process_state(pid)[0] != "Z"


def child_of(pid):
    """The only process that this one has started and that has not ended."""
    states = {path.name: process_state(path.name) for path in pathlib.Path("/proc").glob("[0-9]*")}
    (child,) = [int(name) for name, (state, parent) in states.items() if parent == pid and state != "Z"]
    return child


def clean_environment(**variables):
    """The environment without anything that points at a machine; None leaves a variable out."""
    environment = {k: v for k, v in os.environ.items() if not k.startswith("VEXA_") and k != "NO_COLOR"}
    environment.update({k: v for k, v in variables.items() if v is not None})
    return environment


def run_client(*arguments, stdin=None, **variables):
    return subprocess.run(
        [program("vexa"), *map(str, arguments)],
        env=clean_environment(**variables),
        input=stdin or "",
        capture_output=True,
        timeout=60,
        encoding="utf-8",
    )


def network(number, name, realms=None, **members):
    """Of a scenario: with realms by their names, each with its EAP methods."""
    if realms is not None:
        members["realms"] = [{"names": [realm], "eapMethods": methods} for realm, methods in realms.items()]
    return {"bssid": f"02:aa:00:00:00:{number:02x}", "ssid": name, **members}


def open_connection(port, timeout=PATIENCE, receive_buffer=None):
    connection = socket.socket()
    if receive_buffer:
        connection.setsockopt(socket.SOL_SOCKET, socket.SO_RCVBUF, receive_buffer)
    connection.settimeout(timeout)
    connection.connect(("127.0.0.1", port))
    return connection


def handshake(host, target="/", headers=""):
    """A request that the ports let in, if nothing else is wrong with it."""
    upgrade = f"Upgrade: websocket\r\nConnection: Upgrade\r\nSec-WebSocket-Version: 13\r\n{headers}"
    return f"GET {target} HTTP/1.1\r\nHost: {host}\r\n{upgrade}Sec-WebSocket-Key: {KEY.decode()}\r\n\r\n".encode()


def accepted(key):
    """What a server answers to the key of a handshake."""
    return base64.b64encode(hashlib.sha1(key + b"258EAFA5-E914-47DA-95CA-C5AB0DC85B11").digest())


def read_head(stream):
    first, headers = stream.readline(), {}
    for line in iter(stream.readline, b"\r\n"):
        if not line:
            raise ConnectionError("closed during the handshake")
        name, _, value = line.partition(b":")
        headers[name.strip().lower()] = value.strip()
    return first, headers


def read_exactly(stream, count):
    data = stream.read(count)
    if len(data) < count:
        raise ConnectionError("closed")
    return data


def masked(payload, mask):
    repeated = (mask * (len(payload) // 4 + 1))[: len(payload)]
    return (int.from_bytes(payload, "big") ^ int.from_bytes(repeated, "big")).to_bytes(len(payload), "big")


def read_frame(stream):
    """Whether it is the last of its message, the opcode and the payload."""
    first, second = read_exactly(stream, 2)
    length, form = second & 0x7F, {126: ">H", 127: ">Q"}.get(second & 0x7F)
    if form:
        (length,) = struct.unpack(form, read_exactly(stream, struct.calcsize(form)))
    mask = read_exactly(stream, 4) if second & 0x80 else None
    payload = read_exactly(stream, length)
    return bool(first & 0x80), first & 0x0F, masked(payload, mask) if mask else payload


def frame(opcode, payload, final=True, mask=None):
    length, head = len(payload), (0x80 if final else 0) | opcode
    bit = 0x80 if mask else 0
    if length < 126:
        text = bytes([head, bit | length])
    elif length < 0x10000:
        text = struct.pack(">BBH", head, bit | 126, length)
    else:
        text = struct.pack(">BBQ", head, bit | 127, length)
    return text + mask + masked(payload, mask) if mask else text + payload


class WebSocket:
    """One client of one port. A thread collects what comes in, so that a test that does not look holds up nobody."""

    def __init__(self, port, host=None, reads=True, receive_buffer=None, target="/", headers=""):
        self.received = collections.deque()
        self.close_code = None
        self._arrival = threading.Condition()
        self._sending = threading.Lock()
        self.socket = open_connection(port, receive_buffer=receive_buffer)
        self.input = self.socket.makefile("rb")
        self.socket.sendall(handshake(host or f"127.0.0.1:{port}", target, headers))
        status, self.headers = read_head(self.input)
        if self.headers.get(b"sec-websocket-accept") != accepted(KEY):
            self.socket.close()
            raise ConnectionError(f"not let in: {status!r}")
        self.socket.settimeout(None)
        self._reader = None
        if reads:
            self.start_reading()

    def start_reading(self):
        """For a client that was made with reads=False, and until now left all in its socket."""
        self._reader = threading.Thread(target=self._read_all, daemon=True)
        self._reader.start()

    def _read_all(self):
        message, code = b"", 1006
        try:
            while True:
                final, opcode, payload = read_frame(self.input)
                if opcode == PING:
                    self.send_frame(PONG, payload)
                elif opcode == CLOSE:
                    code = struct.unpack(">H", payload[:2])[0] if len(payload) >= 2 else 1005
                    self.send_frame(CLOSE, payload[:2])
                    self.socket.shutdown(socket.SHUT_WR)
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
        with self._sending:
            self.socket.sendall(frame(opcode, payload, final, os.urandom(4)))

    def take(self):
        """The oldest message not taken yet, as bytes."""
        with self._arrival:
            if not self._arrival.wait_for(lambda: self.received or self.close_code is not None, PATIENCE):
                raise AssertionError(f"no message within {PATIENCE} s")
            if not self.received:
                raise ConnectionError(f"closed with code {self.close_code}")
            return self.received.popleft()

    def wait_closed(self):
        """Gives the close code; 1006 if the connection ended without one."""
        with self._arrival:
            if not self._arrival.wait_for(lambda: self.close_code is not None, PATIENCE):
                raise AssertionError(f"still open after {PATIENCE} s")
            return self.close_code

    def close(self):
        try:
            self.socket.shutdown(socket.SHUT_RDWR)
        except OSError:
            pass
        if self._reader:
            self._reader.join()
        self.input.close()
        self.socket.close()


class PortClient(WebSocket):
    def send(self, command, data=None):
        message = {"CommandId": command}
        if data is not None:
            message["Data"] = data if isinstance(data, (str, bool)) else json.dumps(data)
        self.send_frame(TEXT, json.dumps(message).encode())

    def next_event(self):
        return json.loads(self.take())

    def wait_event(self, event_id, where=lambda event: True):
        """The next event of this name; those before it are passed over."""
        while (event := self.next_event())["EventId"] != event_id or not where(event):
            pass
        return event

    def ask(self, command, data=None, answer=None):
        self.send(command, data)
        return self.wait_event(answer or ANSWERS.get(command, command))

    def credentials(self, command="GET_ALL_CREDENTIAL_LIST", data=None):
        self.send(command, data)
        return self.credential_list()

    def credential_list(self):
        return json.loads(self.wait_event("GET_ALL_CREDENTIAL_LIST")["Data"]) or []


class ControlClient(WebSocket):
    def ask(self, **message):
        self.send_frame(TEXT, json.dumps(message).encode())
        return json.loads(self.take())

    def do(self, action, **members):
        self._result(self.ask(do=action, **members))

    def query(self, name, **members):
        return self._result(self.ask(query=name, **members)).get("result")

    def connected(self):
        """The name of the network that the machine is connected to, or None."""
        interface = self.query("interface")
        return interface["ssid"] if interface["state"] == "connected" else None

    def wait_connected(self, ssid):
        wait_until(lambda: self.connected() == ssid, f"a connection to {ssid}")

    def calls(self, name):
        return [call for call in self.query("calls") if call["call"] == name]

    def wait_passed(self, milliseconds):
        end = self.query("time")["ms"] + milliseconds
        wait_until(lambda: self.query("time")["ms"] > end, f"{milliseconds} ms of the machine")

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
        streams = (self.process.stdout, self.lines), (self.process.stderr, self.errors)
        self._readers = [threading.Thread(target=self._collect, args=pair, daemon=True) for pair in streams]
        for reader in self._readers:
            reader.start()

    @staticmethod
    def _collect(stream, lines):
        for line in stream:
            lines.append(line.rstrip("\n"))

    def wait_line(self, text, count=1):
        """The first line that holds this text, once so many do."""

        def found():
            is_over = self.process.poll() is not None
            if is_over:
                self.wait()
            matches = [line for line in list(self.lines) if text in line]
            if is_over and len(matches) < count:
                raise AssertionError(f"ended with {self.process.returncode}, no line {text!r}: {self.errors}")
            return matches if len(matches) >= count else None

        return wait_until(found, f"a line {text!r}; there is {self.lines}, {self.errors}")[0]

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


class Terminal:
    def __init__(self, arguments, environment, columns=100, rows=40):
        self.screen = b""
        self.ours, self._theirs = pty.openpty()
        self.resize(columns, rows)
        self.before = self.settings()
        self.process = subprocess.Popen(
            arguments,
            env=environment,
            stdin=self._theirs,
            stdout=self._theirs,
            stderr=self._theirs,
            start_new_session=True,
            preexec_fn=lambda: fcntl.ioctl(0, termios.TIOCSCTTY, 0),
        )

    def resize(self, columns, rows):
        fcntl.ioctl(self.ours, termios.TIOCSWINSZ, struct.pack("HHHH", rows, columns, 0, 0))

    def read_until(self, pattern, timeout=PATIENCE):
        self._read(lambda: re.search(pattern, self.screen), timeout)

    def finish(self):
        self._read(lambda: self.process.poll() is not None)
        self._drain(0)
        return self.process.returncode

    def suspend_and_resume(self):
        self.press(b"\x1a")
        wait_until(lambda: process_state(self.process.pid)[0] == "T", "the stop")
        wait_until(lambda: self.settings() == self.before, "the terminal as before")
        self.process.send_signal(signal.SIGCONT)
        wait_until(lambda: self.settings() != self.before, "the terminal being taken again")

    def _read(self, done, timeout=PATIENCE):
        end = time.monotonic() + timeout
        while not done():
            if time.monotonic() > end:
                raise AssertionError(f"not in {timeout} s; the terminal got {self.screen[-2000:]!r}")
            self._drain(0.05)

    def _drain(self, wait):
        while select.select([self.ours], [], [], wait)[0]:
            self.screen += os.read(self.ours, 65536)
            wait = 0

    def press(self, keys):
        os.write(self.ours, keys)

    def settings(self):
        return termios.tcgetattr(self._theirs)

    def last_line(self):
        # A terminal that echoes shows the pressed Ctrl-C. With Ctrl-Z it drops what it has not shown yet, in the middle
        # of a character too.
        return self.screen.decode(errors="replace").rstrip().splitlines()[-1].removeprefix("^C")

    def close(self):
        if self.process.poll() is None:
            self.process.kill()
            self.process.wait()
        os.close(self.ours)
        os.close(self._theirs)


class Machine:
    """A simulated machine with its service, started by `vexa start`. Use it with `with`: it stops at the end, and
    after a failure shows what the machine has written."""

    def __init__(self, scenario=None, folder=None, control=True, arguments=()):
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
        self.parent = Program(command)
        self.sa_port = self.hs20_port = self.control_port = 0

    def __enter__(self):
        try:
            ports = dict(part.split("=") for part in self.parent.wait_line("ready ").split()[1:])
            self.sa_port, self.hs20_port, self.control_port = (int(ports[name]) for name in ("sa", "hs20", "control"))
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
        return self._kept(PortClient(self.sa_port, **options))

    def hs20(self, **options):
        return self._kept(PortClient(self.hs20_port, **options))

    def stop(self, number=signal.SIGTERM):
        """Stops it and gives the parent's exit code."""
        return self.parent.stop(number)

    def config(self):
        return self.folder / STORE / "config.xml"

    def output(self):
        """What the service has printed."""
        return self._content("stdout.log")

    def debug_log(self):
        """What the service has told the debugger."""
        return self._content("debug.log")

    def service_pid(self):
        return child_of(self.parent.process.pid)

    def _content(self, name):
        path = self.folder / name
        return path.read_text(encoding="latin-1") if path.exists() else ""

    def _show_logs(self):
        told = {"debug.log": self.debug_log(), "stdout.log": self.output(), "errors": "\n".join(self.parent.errors)}
        for name, text in told.items():
            print(f"--- {name}\n{text[-4000:]}", file=sys.stderr)


class Story(unittest.TestCase):
    """A test with machines, programs and folders that go when it ends."""

    def run(self, result=None):
        self._result = result
        return super().run(result)

    def _end(self, machine):
        failed = [getattr(test, "test_case", test) for test, _ in self._result.failures + self._result.errors]
        machine.__exit__(AssertionError if self in failed else None)

    def start(self, folder=None, arguments=(), **scenario):
        """Gives a machine, whose time is twenty times as fast if the scenario does not say otherwise."""
        machine = Machine({"speed": 20, **scenario}, folder=folder, arguments=arguments).__enter__()
        self.addCleanup(self._end, machine)
        self.machine, self.control = machine, machine.control
        return machine

    def new_folder(self):
        folder = tempfile.TemporaryDirectory(prefix="vexa-test-", ignore_cleanup_errors=True)
        return pathlib.Path(self.enterContext(folder))

    def running(self, *arguments, environment=None, stdin=subprocess.DEVNULL):
        running = Program([program("vexa"), *map(str, arguments)], environment, stdin)
        self.addCleanup(running.end)
        return running

    def terminal(self, *arguments, columns=100, rows=40, **variables):
        environment = clean_environment(**{"TERM": "xterm-256color", "LC_ALL": "C.UTF-8", **variables})
        terminal = Terminal([program("vexa"), *map(str, arguments)], environment, columns, rows)
        self.addCleanup(terminal.close)
        return terminal

    def done(self, *arguments, stdin=None, **variables):
        """What a command of `vexa` prints that does what it is asked for, on this machine if no other is named."""
        result = self.vexa(*arguments, stdin=stdin, **variables)
        self.assertEqual((result.returncode, result.stderr), (0, ""), (arguments, result.stdout))
        return result.stdout

    def refused(self, exit_code, *arguments, stdin=None, **variables):
        """The line that says why it doesn't; behind wrong use, 2, may come a hint."""
        result = self.vexa(*arguments, stdin=stdin, **variables)
        self.assertEqual((result.returncode, result.stdout), (exit_code, ""), (arguments, result.stderr))
        self.assertRegex(result.stderr, r"\Avexa: .*\n" + (r"\Z" if exit_code == 1 else ""))
        return result.stderr.splitlines()[0]

    def vexa(self, *arguments, stdin=None, **variables):
        if "VEXA_MACHINE" not in variables:
            variables["VEXA_MACHINE"] = str(self.machine.folder)
        return run_client(*arguments, stdin=stdin, **variables)

    def told(self, *arguments):
        return json.loads(self.done(*arguments, "--json"))
