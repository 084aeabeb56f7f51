"""The service as a process: its command line, its parent, its end."""

import ctypes
import json
import os
import signal
import socket
import subprocess
import time

from harness import CHANNEL, CHANNEL_LIST, Story, clean_environment, free_ports, is_running, program, wait_until

# The thread that connects may be in a sleep of ten seconds, which nothing ends early; the rest takes a moment.
STOP_LIMIT = 11.5
PR_SET_CHILD_SUBREAPER = 36
HOTSPOT, SPECTRAL = "create ipc successfully,port={}\n", "Create IPC server successfully, port={}\n"
NO_HOTSPOT, NO_SPECTRAL = "create ipc server fail\n", "Create IPC server failed.\n"


def run_service(*arguments, **variables):
    done = subprocess.run(
        [program("vexa-service"), *map(str, arguments)],
        env=clean_environment(**variables),
        stdin=subprocess.DEVNULL,
        capture_output=True,
        text=True,
        timeout=STOP_LIMIT,
    )
    return done.returncode, done.stdout, done.stderr


def created(sa, hs20):
    return HOTSPOT.format(hs20) + SPECTRAL.format(sa)


class Alone(Story):
    """Without a parent that holds the stop mutex: what starts ends at once."""

    def setUp(self):
        self.folder = self.new_folder()

    def run_service(self, *arguments, **scenario):
        path = self.folder / "scenario.json"
        path.write_text(json.dumps({"speed": 20, **scenario}))
        return run_service(*arguments, VEXA_MACHINE=str(self.folder), VEXA_SCENARIO=str(path))

    def assert_refused(self, *arguments):
        with self.subTest(arguments):
            self.assertEqual(self.run_service(*arguments), (1, "", ""))

    def assert_runs(self, *arguments, prints):
        with self.subTest(arguments):
            self.assertEqual(self.run_service(*arguments), (0, prints, ""))

    def test_command_lines_that_are_refused(self):
        sa, hs20 = map(str, free_ports(2))
        for arguments in (
            [], [""], [" "], [sa], [f" {sa} {hs20}"], [f"{sa} "], ["abc", hs20], [sa, "abc"], ["0", hs20], [sa, "0"],
            [f"{sa}\t{hs20}"], [sa.ljust(32, "x"), hs20], [sa, hs20.ljust(32, "x")],
            [f"{sa} {hs20} ".ljust(len(sa) + 33, "x")], [sa, hs20.ljust(10000, "x")],
        ):  # fmt: skip
            self.assert_refused(*arguments)

    def test_command_lines_that_are_taken(self):
        forms = "{0} {1}", "{0} {1} rest", "{0}  {1}", "+{0} +{1}", "\t{0} \t{1}", "{0}x {1}.5", "{0:x<31} {1:x<31}"
        for form in forms:
            sa, hs20 = free_ports(2)
            self.assert_runs(form.format(str(sa), str(hs20)), prints=created(sa, hs20))

    def test_no_server_on_what_is_no_port(self):
        for offset in (-65536, 65536):
            sa, hs20 = free_ports(2)
            self.assert_runs(f"{sa + offset} {hs20}", prints=HOTSPOT.format(hs20) + NO_SPECTRAL)
            sa, hs20 = free_ports(2)
            self.assert_runs(f"{sa} {hs20 + offset}", prints=NO_HOTSPOT + SPECTRAL.format(sa))

    def test_a_port_in_any_row_of_the_table_is_busy(self):
        (other,) = free_ports(1)
        with socket.create_server(("127.0.0.1", 0)) as listener:
            port = listener.getsockname()[1]
            with socket.create_connection(("127.0.0.1", port)) as connection, listener.accept()[0]:
                for busy in (port, connection.getsockname()[1]):
                    self.assert_refused(busy, other)
                    self.assert_refused(other, busy)
                    self.assert_refused(f"{busy + 65536} {other}")

    def test_a_port_that_only_ipv6_uses_is_free(self):
        sa, hs20 = free_ports(2)
        try:
            listener = socket.create_server(("::1", sa), family=socket.AF_INET6)
        except OSError as error:
            self.skipTest(f"no IPv6: {error}")
        with listener:
            self.assert_runs(sa, hs20, prints=created(sa, hs20))

    def test_a_table_that_cannot_be_read(self):
        ports = free_ports(2)
        # Two listeners, so that the table never fits the first guess.
        with socket.create_server(("127.0.0.1", 0)), socket.create_server(("127.0.0.1", 0)):
            for name, fault, told in (
                ("the rows of the first check", {"error": 5, "skip": 1}, 5),
                ("the rows of the second check", {"error": 1784, "skip": 3}, 1784),
                ("the size, so that the room is too small for the rows", {"error": 5}, 122),
                ("a table that grows at each question", {"error": 122, "times": 20}, 122),
            ):
                with self.subTest(name):
                    timeline = [{"atMs": 0, "do": "fail", "call": "GetTcpTable", **fault}]
                    result = self.run_service(*ports, timeline=timeline)
                    self.assertEqual(result, (1, f"\tGetTcpTable failed with {told}\n", ""))

    def test_a_table_that_grows_meanwhile_is_asked_for_again(self):
        fault = {"atMs": 0, "do": "fail", "call": "GetTcpTable", "error": 122, "times": 5}
        sa, hs20 = free_ports(2)
        self.assertEqual(self.run_service(sa, hs20, timeline=[fault]), (0, created(sa, hs20), ""))


class WithParent(Story):
    def test_a_second_instance_leaves_the_first_alone(self):
        machine = self.start()
        before = machine.output()
        for arguments in ([], ["nonsense"], free_ports(2)):
            self.assertEqual(run_service(*arguments, VEXA_MACHINE=str(machine.folder)), (0, "", ""))
        self.assertEqual(machine.output(), before)
        machine.sa().ask("GET_CURRENT_CHANNEL")
        self.assertEqual(machine.stop(), 0)

    def test_a_killed_parent_is_a_normal_stop(self):
        # The orphan becomes a child of this process, which can then ask for its exit code.
        ctypes.CDLL(None, use_errno=True).prctl(PR_SET_CHILD_SUBREAPER, 1, 0, 0, 0)
        machine = self.start()
        service = machine.service_pid()
        machine.parent.process.kill()
        machine.parent.wait()
        wait_until(lambda: not is_running(service), "the end of the service", STOP_LIMIT)
        self.assertEqual(os.waitstatus_to_exitcode(os.waitpid(service, 0)[1]), 0)

    def test_what_it_prints_character_by_character(self):
        machine = self.start()
        expected = created(machine.sa_port, machine.hs20_port)
        self.assertEqual(machine.output(), expected)
        self.control.do("notify", source=16, code=10)
        expected += "CurrentChannel=0\nService send CurrentChannelData fail!\n"
        self.assertEqual(machine.output(), expected)
        client = machine.sa()
        for command in ("FULL_SCAN", "no such, \u00e4", "GET_CHANNEL_LIST", "STOP_SCAN", "GET_CURRENT_CHANNEL"):
            client.send(command)
            expected += f"Service request from client : request id = {command}\n"
        client.wait_event(CHANNEL)
        expected += "CurrentChannel=0\nService send CurrentChannelData success!\n"
        wait_until(lambda: len(machine.output()) >= len(expected.encode()), "the last line")
        machine.stop()
        self.assertEqual(machine.output().encode("latin-1").decode(), expected)

    def test_equal_ports_leave_one_channel(self):
        (port,) = free_ports(1)
        machine = self.start(arguments=["--sa-port", f"{port}", "--hs20-port", f"{port}"])
        expected = HOTSPOT.format(port) + NO_SPECTRAL
        wait_until(lambda: len(machine.output()) >= len(expected), "what comes of both ports")
        self.assertEqual(machine.output(), expected)
        told = [f"vexa: both halves have the port {port}: the spectral analyser cannot be reached"]
        self.assertEqual(machine.parent.errors, told)
        client = machine.hs20()
        self.control.do("pullAdapter")
        self.control.do("insertAdapter")
        self.control.do("notify", source=16, code=4)
        self.control.do("radio", hardware="on", software="off")
        self.assertEqual(client.next_event()["EventId"], "GET_RADIO")
        client.ask("GET_IS_CARD_IN")
        self.assertEqual(machine.stop(), 0)


class Stop(Story):
    def assert_stops(self):
        service = self.machine.service_pid()
        began = time.monotonic()
        self.assertEqual(self.machine.stop(), 0)
        self.assertLess(time.monotonic() - began, STOP_LIMIT)
        self.assertFalse(is_running(service))

    def test_while_a_scan_runs(self):
        spectrum = {"channels": [1, 6, 11], "scanMs": 3600000, "levels": {"1": {"congestion": 1, "power": 1}}}
        for speed in (0, 1):
            with self.subTest(speed=speed):
                self.start(speed=speed, spectrum=spectrum).sa().send("FULL_SCAN")
                wait_until(lambda: self.control.query("calls"), "the request")
                self.assert_stops()

    def test_clients_that_never_read_or_are_in_the_middle_of_something(self):
        machine = self.start(spectrum={"channels": list(range(256))})
        for _ in range(5):
            machine.sa(reads=False, receive_buffer=2048)
            machine.hs20(reads=False, receive_buffer=2048)
            self.enterContext(socket.create_connection(("127.0.0.1", machine.sa_port)))
        half = self.enterContext(socket.create_connection(("127.0.0.1", machine.hs20_port)))
        half.sendall(b"GET / HTTP/1.1\r\nHost: 127")
        frame = machine.sa(reads=False)
        frame.send_frame(1, b'{"CommandId":', final=False)
        frame.socket.sendall(b"\x81\xfe\xff")
        busy = machine.sa()
        for _ in range(100):
            busy.send("GET_CHANNEL_LIST")
        for _ in range(100):
            busy.wait_event(CHANNEL_LIST)
        self.assert_stops()

    def test_while_commands_pour_in_and_scans_complete_all_the_time(self):
        levels = {f"{channel}": {"congestion": 50, "power": 60, "spread": 20} for channel in range(1, 14)}
        machine = self.start(spectrum={"channels": list(range(1, 14)), "scanMs": 20, "levels": levels})
        clients = [machine.sa(), machine.sa(), machine.hs20()]
        clients[0].send("GET_CHANNEL_LIST")
        clients[0].ask("FULL_SCAN", answer="SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION")
        for client in clients:
            for _ in range(500):
                client.send("GET_RADIO" if client is clients[2] else "GET_CURRENT_CHANNEL")
        self.assert_stops()
        for client in clients:
            self.assertIn(client.wait_closed(), (1001, 1006))

    def test_its_own_signals_do_not_end_it(self):
        service = self.start().service_pid()
        for number in (signal.SIGINT, signal.SIGHUP, signal.SIGPIPE):
            os.kill(service, number)
        self.machine.sa().ask("GET_CURRENT_CHANNEL")
        self.assert_stops()
