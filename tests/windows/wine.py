"""The programs for Windows in Wine: what the stories on the native programs find in harness.py, for a prefix.

VEXA_WINDOWS_BUILD names the folder with the programs and what stands in for the system's libraries, WINEPREFIX a
prefix, which `wine.py make` makes anew and `wine.py remove` ends and removes. One machine lives in it at a time. Its
clock is that of the host: a scenario's `speed` is left out.
"""

import atexit
import contextlib
import fcntl
import functools
import json
import os
import pathlib
import shlex
import shutil
import signal
import socket
import struct
import subprocess
import sys
import tempfile

sys.path.insert(0, str(pathlib.Path(__file__).resolve().parent.parent / "system"))

import harness
from harness import PATIENCE, STORE, ControlClient, Program, clean_environment, free_ports, is_running, wait_until

STAND_INS = ("wlanapi", "iphlpapi", "wtsapi32", "secur32")
# All that Wine itself says: why it has ended a program.
WORDS_OF_WINE = "-all,err+seh,err+virtual,err+thread,err+process,err+module,err+server"

CLONE_NEWNET = 0x40000000
SIOCGIFFLAGS, SIOCSIFFLAGS, IFF_UP = 0x8913, 0x8914, 1

BUILD, PREFIX = (pathlib.Path(os.environ[name]) for name in ("VEXA_WINDOWS_BUILD", "WINEPREFIX"))
USERS = PREFIX / "drive_c" / "users"

open_direct = harness.open_connection  # as a process that is not Wine's
native_program = harness.program
NativeMachine = harness.Machine


def enter_own_network():
    """Moves this process and its children into a network without anybody else. Wine looks for the owner of every row of
    the TCP table in all processes, which takes it half a second for a thousand rows, and the table of a busy host
    grows between two looks. Where that isn't allowed, the stories take longer."""
    if not harness.enter_namespace(CLONE_NEWNET):
        return
    with socket.socket(socket.AF_INET, socket.SOCK_DGRAM) as any_socket:
        request = bytearray(struct.pack("16sh22x", b"lo", 0))
        fcntl.ioctl(any_socket, SIOCGIFFLAGS, request)
        (flags,) = struct.unpack_from("h", request, 16)
        struct.pack_into("h", request, 16, flags | IFF_UP)
        fcntl.ioctl(any_socket, SIOCSIFFLAGS, request)


def windows_path(path):
    return "Z:" + str(pathlib.Path(path).resolve()).replace("/", "\\")


def environment(**variables):
    """Without a window or a menu of Wine's own; the stand-ins go first where they stand beside a program."""
    overrides = ";".join([f"{','.join(STAND_INS)}=n,b", "mscoree,mshtml,winemenubuilder.exe="])
    return clean_environment(WINEPREFIX=str(PREFIX), WINEDEBUG=WORDS_OF_WINE, WINEDLLOVERRIDES=overrides, **variables)


@functools.cache
def stage():
    """A folder with the programs by themselves in `plain`, and the service among the stand-ins in `simulated`."""
    folder = pathlib.Path(tempfile.mkdtemp(prefix="vexa-wine-"))
    atexit.register(shutil.rmtree, folder, ignore_errors=True)
    stand_ins = [f"stand-ins/{name}.dll" for name in STAND_INS]
    parts = {"plain": ["bin/vexa.exe", "bin/vexa-service.exe"], "simulated": ["bin/vexa-service.exe", *stand_ins]}
    for name, files in parts.items():
        (folder / name).mkdir()
        for file in files:
            shutil.copy(BUILD / file, folder / name)
    return folder


def client():
    """The client's executable; the libraries beside it are the system's."""
    return stage() / "plain" / "vexa.exe"


@functools.cache
def program(name):
    """A program of this host that becomes the one in Wine, for whoever starts it himself."""
    relay()
    path = stage() / name
    settings = [f"{variable}={environment()[variable]}" for variable in ("WINEPREFIX", "WINEDEBUG", "WINEDLLOVERRIDES")]
    path.write_text(f'#!/bin/sh\nexec env {shlex.join(settings)} wine {stage()}/plain/{name}.exe "$@"\n')
    path.chmod(0o700)
    return str(path)


def service(simulated=True):
    return stage() / ("simulated" if simulated else "plain") / "vexa-service.exe"


def scenario_file(scenario, folder):
    path = pathlib.Path(folder) / "scenario-of-test.json"
    path.write_text(json.dumps({name: value for name, value in scenario.items() if name != "speed"}))
    return windows_path(path)


def run(program, *arguments, stdin=None, timeout=PATIENCE, **variables):
    relay()
    return subprocess.run(
        ["wine", str(program), *map(str, arguments)],
        env=environment(**variables),
        input=stdin or "",
        capture_output=True,
        encoding="utf-8",
        errors="replace",
        timeout=timeout,
    )


def run_client(*arguments, stdin=None, **_):
    """Runs a command of the client on the service that runs here."""
    return run(client(), *arguments, stdin=stdin, timeout=60)


def end_all():
    """Ends whatever runs in the prefix, also what a story left that was killed."""
    subprocess.run(["wineserver", "-k", "-w"], env=environment(), stderr=subprocess.DEVNULL, check=False)


def remove_prefix():
    if PREFIX.exists():
        end_all()
        shutil.rmtree(PREFIX)


def make_prefix():
    remove_prefix()
    PREFIX.parent.mkdir(parents=True, exist_ok=True)
    quiet = {"stdin": subprocess.DEVNULL, "stdout": subprocess.DEVNULL, "stderr": subprocess.DEVNULL}
    subprocess.run(["wineboot", "--init"], env=environment(), check=True, **quiet)
    end_all()


def forget_machine():
    """As if no service had ever run here."""
    run("reg", "delete", "HKCU\\Software\\Korvane", "/f")
    shutil.rmtree((USERS / STORE).parent, ignore_errors=True)
    for folder in USERS.glob("*/AppData/Local/Korvane"):
        shutil.rmtree(folder, ignore_errors=True)


@functools.cache
def relay():
    """The port of a program in Wine that connects on behalf of this process, whose account Wine can't tell. Wine's own
    programs come up with the first one, and would hold its pipe open: so that is this one, and has none."""
    end_all()
    output = stage() / "relay"
    with output.open("w") as file:
        process = subprocess.Popen(
            ["wine", str(BUILD / "stand-ins" / "vexa-test-relay.exe")],
            env=environment(),
            stdin=subprocess.PIPE,
            stdout=file,
            stderr=subprocess.DEVNULL,
        )
    atexit.register(lambda: (process.stdin.close(), process.wait(PATIENCE)))
    line = wait_until(lambda: output.read_text().endswith("\n") and output.read_text(), "the relay's port")
    return int(line.split()[1])


def open_connection(port, timeout=PATIENCE, receive_buffer=None):
    connection = open_direct(relay(), timeout, receive_buffer)
    connection.sendall(f"{port}\n".encode())
    return connection


@contextlib.contextmanager
def native_programs():
    """For a machine of the native programs, of VEXA_BUILD, beside this one."""
    harness.open_connection, harness.program = open_direct, native_program
    try:
        yield
    finally:
        harness.open_connection, harness.program = open_connection, program


def service_pid(port):
    """The process of the service that was started with this spectral port, or None."""
    for path in pathlib.Path("/proc").glob("[0-9]*/cmdline"):
        try:
            words = path.read_bytes().split(b"\0")
        except OSError:
            continue
        if b"vexa-service.exe" in words[0] and str(port).encode() in words[1:2]:
            return int(path.parent.name)
    return None


class Parent(Program):
    """`vexa start` in Wine, which takes no signals from outside: it stops when its standard input ends."""

    def __init__(self, arguments=(), simulated=True, **variables):
        relay()
        own = windows_path(service(simulated))
        command = ["wine", str(client()), "start", "--stop-on-eof", "--service", own, *arguments]
        super().__init__(command, environment(**variables), subprocess.PIPE)

    def stop(self, number=signal.SIGTERM, timeout=PATIENCE):
        self.process.stdin.close()
        return self.wait(timeout)

    def end(self):
        if self.process.poll() is None:
            self.process.kill()
            self.process.wait()
        super().end()


class Machine(NativeMachine):
    """A prefix with its service. At the end of the block what still runs is killed: only stop() waits for the
    service's own end."""

    def __init__(self, scenario=None, folder=None, control=True, arguments=(), simulated=True):
        self._own_folder = folder is None
        self._clients = []
        self._port_for_control = free_ports(1)[0] if control and simulated else 0
        self.folder = pathlib.Path(folder or tempfile.mkdtemp(prefix="vexa-test-"))
        if self._own_folder:
            forget_machine()
            (self.folder / "Public").symlink_to(USERS / "Public")
        self.sa_port = self.hs20_port = self.control_port = 0
        self.parent = Parent(
            arguments,
            simulated,
            VEXA_SCENARIO=scenario_file(scenario or {}, self.folder),
            VEXA_CONTROL_PORT=str(self._port_for_control) if self._port_for_control else None,
        )

    def __enter__(self):
        super().__enter__()
        if self._port_for_control:
            self.control_port = self._port_for_control
            self.control = self._kept(ControlClient(self.control_port))
        return self

    def __exit__(self, kind, *rest):
        pid = self.service_pid()
        if pid:
            os.kill(pid, signal.SIGKILL)
            wait_until(lambda: not is_running(pid), "the end of a killed service")
        super().__exit__(kind, *rest)

    def service_pid(self):
        return service_pid(self.sa_port) if self.sa_port else None

    def _content(self, name):
        (path,) = list(USERS.glob(f"*/AppData/Local/Korvane/Vexa/{name}")) or (self.folder / name,)
        return path.read_text(encoding="latin-1") if path.exists() else ""


harness.open_connection, harness.program = open_connection, program
harness.run_client, harness.Machine = run_client, Machine
enter_own_network()

if __name__ == "__main__":
    {"make": make_prefix, "remove": remove_prefix}[sys.argv[1]]()
