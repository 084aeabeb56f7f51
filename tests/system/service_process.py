"""The service as a process: its command line, its parent, its end."""

import ctypes
import json
import os
import signal
import socket
import subprocess
import tempfile
import time
import unittest

from harness import Machine, busy_ports, children_of, clean_environment, is_running, program, wait_until

# The thread that connects may be in a sleep of ten seconds, which nothing ends early; the rest takes a moment.
STOP_LIMIT = 11.5
PR_SET_CHILD_SUBREAPER = 36


def free_ports(count):
    """Ports without a row in the TCP table."""
    sockets = [socket.create_server(("127.0.0.1", 0)) for _ in range(count)]
    ports = [s.getsockname()[1] for s in sockets]
    for s in sockets:
        s.close()
    return ports


def created(sa, hs20):
    return f"create ipc successfully,port={hs20}\nCreate IPC server successfully, port={sa}\n"


class Alone(unittest.TestCase):
    """Without a parent that holds the stop mutex: what starts ends at once."""

    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = folder.name

    def run_service(self, *arguments, scenario=None):
        path = os.path.join(self.folder, "scenario.json")
        with open(path, "w", encoding="utf-8") as file:
            json.dump(scenario or {"speed": 20}, file)
        return subprocess.run(
            [program("vexa-service"), *arguments],
            env=clean_environment(VEXA_MACHINE=self.folder, VEXA_SCENARIO=path),
            stdin=subprocess.DEVNULL,
            capture_output=True,
            text=True,
            timeout=STOP_LIMIT,
            check=False,
        )

    def assert_refused(self, *arguments, scenario=None, prints=""):
        done = self.run_service(*arguments, scenario=scenario)
        self.assertEqual((done.returncode, done.stdout, done.stderr), (1, prints, ""))

    def assert_runs(self, *arguments, prints):
        done = self.run_service(*arguments)
        self.assertEqual((done.returncode, done.stdout, done.stderr), (0, prints, ""))

    def test_command_lines_that_are_refused(self):
        sa, hs20 = free_ports(2)
        too_long = f"{sa}".ljust(32, "x")
        cases = {
            "nothing": [],
            "an empty text": [""],
            "one blank": [" "],
            "one port": [f"{sa}"],
            "a leading blank": [f" {sa} {hs20}"],
            "nothing behind the blank": [f"{sa} "],
            "a word for the first": ["abc", f"{hs20}"],
            "a word for the second": [f"{sa}", "abc"],
            "zero first": ["0", f"{hs20}"],
            "zero second": [f"{sa}", "0"],
            "a tab between": [f"{sa}\t{hs20}"],
            "a first token of 32": [too_long, f"{hs20}"],
            "a second token of 32": [f"{sa}", f"{hs20}".ljust(32, "x")],
            "a second token of 32 with blanks": [f"{sa} {hs20} ".ljust(len(f"{sa} ") + 32, "x")],
            "a second token of 10000": [f"{sa}", f"{hs20}".ljust(10000, "x")],
        }
        for name, arguments in cases.items():
            with self.subTest(name):
                self.assert_refused(*arguments)

    def test_command_lines_that_are_taken(self):
        cases = {
            "two arguments": "{sa} {hs20}",
            "a third word": "{sa} {hs20} rest",
            "two blanks": "{sa}  {hs20}",
            "signs": "+{sa} +{hs20}",
            "a tab before": "\t{sa} \t{hs20}",
            "other characters behind the digits": "{sa}x {hs20}.5",
        }
        for name, form in cases.items():
            with self.subTest(name):
                sa, hs20 = free_ports(2)
                self.assert_runs(form.format(sa=sa, hs20=hs20), prints=created(sa, hs20))
        with self.subTest("tokens of 31"):
            sa, hs20 = free_ports(2)
            self.assert_runs(f"{sa}".ljust(31, "x"), f"{hs20}".ljust(31, "x"), prints=created(sa, hs20))

    def test_no_server_on_what_is_no_port(self):
        hotspot, spectral = "create ipc server fail\n", "Create IPC server failed.\n"
        for name, offset in (("negative", -65536), ("above 65535", 65536)):
            with self.subTest(name):
                sa, hs20 = free_ports(2)
                only_hotspot = f"create ipc successfully,port={hs20}\n" + spectral
                self.assert_runs(f"{sa + offset} {hs20}", prints=only_hotspot)
                sa, hs20 = free_ports(2)
                only_spectral = hotspot + f"Create IPC server successfully, port={sa}\n"
                self.assert_runs(f"{sa} {hs20 + offset}", prints=only_spectral)

    def test_a_port_in_any_row_of_the_table_is_busy(self):
        (other,) = free_ports(1)
        with socket.create_server(("127.0.0.1", 0)) as listener:
            port = listener.getsockname()[1]
            with socket.create_connection(("127.0.0.1", port)) as connection, listener.accept()[0]:
                for busy in (port, connection.getsockname()[1]):
                    self.assert_refused(f"{busy}", f"{other}")
                    self.assert_refused(f"{other}", f"{busy}")
                    self.assert_refused(f"{busy + 65536} {other}")

    def test_a_port_in_time_wait_is_busy(self):
        (other,) = free_ports(1)
        with socket.create_server(("127.0.0.1", 0)) as listener:
            connection = socket.create_connection(listener.getsockname())
            accepted, _ = listener.accept()
        port = connection.getsockname()[1]
        connection.close()
        accepted.close()
        wait_until(lambda: busy_ports().get(port) == {"06"}, "a row in TIME_WAIT")
        self.assert_refused(f"{port}", f"{other}")

    def test_a_port_that_only_ipv6_uses_is_free(self):
        if not socket.has_ipv6:
            self.skipTest("no IPv6")
        sa, hs20 = free_ports(2)
        try:
            listener = socket.create_server(("::1", sa), family=socket.AF_INET6)
        except OSError as error:
            self.skipTest(f"no IPv6: {error}")
        with listener:
            self.assert_runs(f"{sa}", f"{hs20}", prints=created(sa, hs20))

    def test_a_table_that_cannot_be_read(self):
        sa, hs20 = free_ports(2)
        # Two listeners, so that the table never fits the first guess.
        with socket.create_server(("127.0.0.1", 0)), socket.create_server(("127.0.0.1", 0)):
            cases = (
                ("the rows of the first check", {"error": 5, "skip": 1}, 5),
                ("the rows of the second check", {"error": 1784, "skip": 3}, 1784),
                ("the size, so that the room is too small for the rows", {"error": 5}, 122),
                ("a size that is not told", {"error": 122}, 122),
            )
            for name, fault, told in cases:
                with self.subTest(name):
                    timeline = [{"atMs": 0, "do": "fail", "call": "GetTcpTable", **fault}]
                    self.assert_refused(
                        f"{sa}",
                        f"{hs20}",
                        scenario={"speed": 20, "timeline": timeline},
                        prints=f"\tGetTcpTable failed with {told}\n",
                    )


class WithParent(unittest.TestCase):
    def test_a_second_instance_leaves_the_first_alone(self):
        with Machine({"speed": 20}) as machine:
            client = machine.sa()
            before = machine.output()
            for arguments in ([], ["nonsense"], [f"{port}" for port in free_ports(2)]):
                second = subprocess.run(
                    [program("vexa-service"), *arguments],
                    env=clean_environment(VEXA_MACHINE=str(machine.folder)),
                    capture_output=True,
                    timeout=STOP_LIMIT,
                    check=False,
                )
                self.assertEqual((second.returncode, second.stdout), (0, b""))
            self.assertEqual(machine.output(), before)
            client.send("GET_CURRENT_CHANNEL")
            client.wait_event("SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA")
            self.assertEqual(machine.stop(), 0)

    def test_a_killed_parent_is_a_normal_stop(self):
        # The orphan becomes a child of this process, which can then ask for its exit code.
        ctypes.CDLL(None, use_errno=True).prctl(PR_SET_CHILD_SUBREAPER, 1, 0, 0, 0)
        with Machine({"speed": 20}) as machine:
            service = machine.service_pid()
            machine.parent.process.kill()
            machine.parent.wait()
            ended = []

            def has_ended():
                pid, status = os.waitpid(service, os.WNOHANG)
                if pid == service:
                    ended.append(status)
                return bool(ended)

            wait_until(has_ended, "the end of the service", STOP_LIMIT)
            self.assertEqual(os.waitstatus_to_exitcode(ended[0]), 0)

    def test_what_it_prints_character_by_character(self):
        with Machine({"speed": 20}) as machine:
            expected = created(machine.sa_port, machine.hs20_port)
            self.assertEqual(machine.output(), expected)
            machine.control.do("notify", source=16, code=10)
            expected += "CurrentChannel=0\nService send CurrentChannelData fail!\n"
            self.assertEqual(machine.output(), expected)
            client = machine.sa()
            for command in ("FULL_SCAN", "no such, \u00e4", "GET_CHANNEL_LIST", "STOP_SCAN", "GET_CURRENT_CHANNEL"):
                client.send(command)
                expected += f"Service request from client : request id = {command}\n"
            client.wait_event("SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA")
            expected += "CurrentChannel=0\nService send CurrentChannelData success!\n"
            wait_until(lambda: len(machine.output()) >= len(expected.encode()), "the last line")
            machine.stop()
            self.assertEqual(machine.output().encode("latin-1").decode(), expected)

    def test_equal_ports_leave_one_channel(self):
        (port,) = free_ports(1)
        with Machine({"speed": 20}, arguments=["--sa-port", f"{port}", "--hs20-port", f"{port}"]) as machine:
            self.assertEqual(machine.output(), f"create ipc successfully,port={port}\nCreate IPC server failed.\n")
            client = machine.hs20()
            machine.control.do("pullAdapter")
            machine.control.do("insertAdapter")
            machine.control.do("notify", source=16, code=4)
            machine.control.do("radio", hardware="on", software="off")
            self.assertEqual(client.next_event()["EventId"], "GET_RADIO")
            client.send("GET_IS_CARD_IN")
            client.wait_event("CARD_PLUG_IN")
            self.assertEqual(machine.stop(), 0)

    def test_a_service_started_without_an_adapter_serves_both_ports(self):
        with Machine({"speed": 20, "adapters": []}) as machine:
            sa, hs20 = machine.sa(), machine.hs20()
            sa.send("GET_CURRENT_CHANNEL")
            self.assertEqual(sa.next_event()["Data"], "0")
            hs20.send("GET_IS_CARD_IN")
            self.assertEqual(hs20.next_event()["EventId"], "CARD_PLUG_OUT")
            self.assertEqual(machine.stop(), 0)


class Stop(unittest.TestCase):
    def assert_stops(self, machine):
        service = machine.service_pid()
        began = time.monotonic()
        self.assertEqual(machine.stop(), 0)
        self.assertLess(time.monotonic() - began, STOP_LIMIT)
        self.assertFalse(is_running(service))
        self.assertNotIn(service, children_of(os.getpid()))

    def test_while_a_scan_runs(self):
        spectrum = {"channels": [1, 6, 11], "scanMs": 3600000, "levels": {"1": {"congestion": 1, "power": 1}}}
        for speed in (0, 1):
            with self.subTest(speed=speed), Machine({"speed": speed, "spectrum": spectrum}) as machine:
                client = machine.sa()
                client.send("FULL_SCAN")
                wait_until(lambda: machine.control.query("calls"), "the request")
                self.assert_stops(machine)

    def test_while_scans_complete_all_the_time(self):
        levels = {f"{channel}": {"congestion": 50, "power": 60, "spread": 20} for channel in range(1, 14)}
        spectrum = {"channels": list(range(1, 14)), "scanMs": 20, "levels": levels}
        with Machine({"speed": 20, "spectrum": spectrum}) as machine:
            client = machine.sa()
            client.send("GET_CHANNEL_LIST")
            client.send("FULL_SCAN")
            client.wait_event("SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION")
            self.assert_stops(machine)

    def test_clients_that_never_read(self):
        spectrum = {"channels": list(range(256))}
        with Machine({"speed": 20, "spectrum": spectrum}) as machine:
            for _ in range(5):
                machine.sa(reads=False, receive_buffer=2048)
                machine.hs20(reads=False, receive_buffer=2048)
            busy = machine.sa()
            for _ in range(100):
                busy.send("GET_CHANNEL_LIST")
            for _ in range(100):
                busy.wait_event("SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G")
            self.assert_stops(machine)

    def test_clients_in_the_middle_of_something(self):
        with Machine({"speed": 20}) as machine:
            silent = [socket.create_connection(("127.0.0.1", machine.sa_port)) for _ in range(3)]
            half = socket.create_connection(("127.0.0.1", machine.hs20_port))
            half.sendall(b"GET / HTTP/1.1\r\nHost: 127")
            frame = machine.sa(reads=False)
            frame.send_frame(1, b'{"CommandId":', final=False)
            frame._socket.sendall(b"\x81\xfe\xff")
            try:
                self.assert_stops(machine)
            finally:
                for connection in (*silent, half):
                    connection.close()

    def test_while_commands_pour_in(self):
        with Machine({"speed": 20}) as machine:
            clients = [machine.sa(), machine.sa(), machine.hs20()]
            for client in clients:
                for _ in range(500):
                    client.send("GET_CURRENT_CHANNEL" if client is not clients[2] else "GET_RADIO")
            self.assert_stops(machine)
            for client in clients:
                self.assertIn(client.wait_closed(), (1001, 1006))

    def test_its_own_signals_do_not_end_it(self):
        with Machine({"speed": 20}) as machine:
            service = machine.service_pid()
            for number in (signal.SIGINT, signal.SIGHUP, signal.SIGPIPE):
                os.kill(service, number)
            client = machine.sa()
            client.send("GET_CURRENT_CHANNEL")
            client.wait_event("SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA")
            self.assert_stops(machine)


if __name__ == "__main__":
    unittest.main()
