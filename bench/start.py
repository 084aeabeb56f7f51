#!/usr/bin/env python3
"""Measures whole processes, `start.py BIN OUT`: how long the service takes from its start to both ports listening, and what
it takes when nothing happens, each beside a program that only opens two servers. Writes a report as the benchmarks do."""

import contextlib
import fcntl
import json
import os
import pathlib
import random
import signal
import socket
import statistics
import sys
import tempfile
import time

ROUNDS = 25
IDLE_SECONDS = 12.0  # more than the service's longest interval
STOP_MUTEX = "{39EAA3ED-1A26-46B7-90A7-AAFFECE80392}"
CREDENTIAL = (
    "<credential><id>{0}</id><type>eapttls</type><accesstype>alluser</accesstype><creator>KORVANE-PC\\user</creator>"
    "<eap>2</eap><autoconnect>true</autoconnect><credname>Name {0}</credname><realm>realm{0}.example</realm>"
    "<username>someone</username><password>secret</password></credential>"
)
PLACE = "<credential><id>{0}</id><priority>{0}</priority></credential>"
FILE = (
    '<?xml version="1.0" encoding="UTF-8"?><configurations><global><nextcredid>{0}</nextcredid></global><credentials>{1}'
    "</credentials><users><user><username>KORVANE-PC\\user</username><credentials>{2}</credentials></user></users>"
    "</configurations>"
)


class Program:
    """Runs until it has told of both of its ports, and is killed at the end."""

    def __init__(self, arguments, **variables):
        output, theirs = os.pipe()
        actions = [(os.POSIX_SPAWN_DUP2, theirs, 1), (os.POSIX_SPAWN_CLOSE, output)]
        environment = {"PATH": os.defpath, **variables}
        begin = time.perf_counter()
        self.pid = os.posix_spawn(arguments[0], arguments, environment, file_actions=actions)
        os.close(theirs)
        told = b""
        while told.count(b"\n") < 2:
            part = os.read(output, 4096)
            if not part:
                sys.exit(f"{arguments}: ended early, after {told!r}")
            told += part
        self.seconds = time.perf_counter() - begin
        os.close(output)

    def __enter__(self):
        return self

    def __exit__(self, *_):
        os.kill(self.pid, signal.SIGKILL)
        os.waitpid(self.pid, 0)

    def status(self, name):
        """The sum over its threads of a number that the kernel keeps."""
        texts = [path.read_text() for path in pathlib.Path(f"/proc/{self.pid}/task").glob("*/status")]
        return sum(int(line.split()[1]) for text in texts for line in text.splitlines() if line.startswith(name + ":"))

    def megabytes(self):
        pages = int(pathlib.Path(f"/proc/{self.pid}/statm").read_text().split()[1])
        return pages * os.sysconf("SC_PAGE_SIZE") / 1e6


class Programs:
    def __init__(self, folder, programs):
        self.folder = pathlib.Path(folder)
        self.programs = programs
        self.ports = free_ports(2)

    def bare(self):
        return Program([f"{self.programs}/bare_start"])

    def machine(self, credentials):
        """A folder with a machine that has so many credentials and nothing in range."""
        machine = self.folder / str(credentials)
        store = machine / "Public/Roaming/Korvane"
        store.mkdir(parents=True)
        (machine / "scenario.json").write_text("{}")
        numbers = range(1, credentials + 1)
        parts = ("".join(map(form.format, numbers)) for form in (CREDENTIAL, PLACE))
        (store / "config.xml").write_text(FILE.format(credentials + 1, *parts))
        return machine

    def service(self, machine):
        return Program([f"{self.programs}/vexa-service", *map(str, self.ports)], VEXA_MACHINE=str(machine))


def free_ports(count):
    """Ports without a row in the TCP table, below those of outgoing connections."""
    rows = pathlib.Path("/proc/net/tcp").read_text().splitlines()[1:]
    taken = {int(row.split()[1].split(":")[1], 16) for row in rows}
    return random.sample(sorted(set(range(10000, 32000)) - taken), count)


@contextlib.contextmanager
def parent_of(machine):
    """Holds what tells the service that its parent lives."""
    folder = machine / "mutexes"
    folder.mkdir(mode=0o700, exist_ok=True)
    with open(folder / f"{STOP_MUTEX}.open", "w") as presence, open(folder / STOP_MUTEX, "w") as ownership:
        fcntl.flock(presence, fcntl.LOCK_SH)
        fcntl.flock(ownership, fcntl.LOCK_EX)
        yield


def seconds_of(start):
    with start() as program:
        return program.seconds


def starts(programs, sizes, rounds):
    """The seconds of each start, in turns: the bare program's, and for each size of the table the service's."""
    machines = {size: programs.machine(size) for size in sizes}
    services = {size: lambda m=machine: programs.service(m) for size, machine in machines.items()}
    sides = {"bare": programs.bare, **services}
    with programs.bare():  # any host has a few sockets
        for start in sides.values():
            seconds_of(start)  # what is read for the first time
        taken = [{side: seconds_of(start) for side, start in sides.items()} for _ in range(rounds)]
    return {side: [round_[side] for round_ in taken] for side in sides}


def idle(programs):
    machine = programs.machine(0)
    with parent_of(machine), programs.service(machine) as ours, programs.bare() as bare:
        time.sleep(1)
        before = [program.status("voluntary_ctxt_switches") for program in (ours, bare)]
        time.sleep(IDLE_SECONDS)
        for side, program, first in zip(("ours", "bare"), (ours, bare), before):
            wakeups = (program.status("voluntary_ctxt_switches") - first) / IDLE_SECONDS
            yield f"idle/{side}", {"wakeups": wakeups, "megabytes": program.megabytes()}


def main():
    programs, out = sys.argv[1:]
    with tempfile.TemporaryDirectory(prefix="vexa-bench-") as folder:
        all_ = Programs(folder, programs)
        taken = starts(all_, (1, 10, 100, 1000, 2000), ROUNDS)
        rate = {side: {"per_second": 1 / statistics.median(seconds)} for side, seconds in taken.items()}
        rows = {f"growth/starts/{size}": rate[size] for size in (1, 10, 100, 1000)}
        rows |= {f"start/ours/{size}": rate[size] for size in (1, 2000)}
        rows |= {f"start/bare/{size}": rate["bare"] for size in (1, 2000)}
        rows |= dict(idle(all_))
    report = [{"run_name": name, "aggregate_name": "median", **counters} for name, counters in rows.items()]
    pathlib.Path(out).write_text(json.dumps({"benchmarks": report}))


if __name__ == "__main__":
    main()
