"""`vexa start`: the parent of a service."""

import json
import os
import pathlib
import signal
import socket
import stat
import subprocess
import tempfile
import unittest

from harness import Machine, Program, busy_ports, clean_environment, is_running, program, wait_until

LISTEN = "0A"
QUICK = {"speed": 20}


class RunningService(unittest.TestCase):
    def test_the_ready_line_is_all_that_it_prints(self):
        with Machine(QUICK) as machine:
            self.assertEqual(machine.stop(), 0)
            self.assertEqual(
                machine.parent.lines,
                [f"ready sa={machine.sa_port} hs20={machine.hs20_port} control={machine.control_port}"],
            )
            self.assertEqual(machine.parent.errors, [])

    def test_chosen_ports_differ_and_listen_and_nothing_has_touched_them(self):
        with Machine(QUICK) as machine:
            machine.control.close()
            ports = {machine.sa_port, machine.hs20_port, machine.control_port}
            self.assertEqual(len(ports), 3)
            self.assertNotIn(0, ports)
            table = busy_ports()
            self.assertEqual(table[machine.sa_port], {LISTEN})
            self.assertEqual(table[machine.hs20_port], {LISTEN})

    def test_without_the_option_there_is_no_control_channel(self):
        with tempfile.TemporaryDirectory() as folder:
            parent = Program(
                [program("vexa"), "start", "--machine", folder], clean_environment(VEXA_CONTROL_PORT="1")
            )
            self.addCleanup(parent.end)
            self.assertTrue(parent.wait_line("ready ").endswith(" control=0"))
            self.assertEqual(parent.stop(), 0)

    def test_ports_that_were_asked_for_are_used(self):
        first, second = free_ports(2)
        with Machine(QUICK, arguments=["--sa-port", str(first), "--hs20-port", str(second)]) as machine:
            self.assertEqual((machine.sa_port, machine.hs20_port), (first, second))
            self.assertIn(f"port={first}\n", machine.output())
            self.assertIn(f"port={second}\n", machine.output())

    def test_json_announces_the_same_ports(self):
        with tempfile.TemporaryDirectory() as folder:
            parent = Program([program("vexa"), "start", "--json", "--machine", folder])
            self.addCleanup(parent.end)
            ports = json.loads(parent.wait_line("{"))
            self.assertEqual(set(ports), {"sa", "hs20", "control"})
            self.assertEqual(busy_ports()[ports["sa"]], {LISTEN})

    def test_either_signal_stops_it(self):
        for number in (signal.SIGINT, signal.SIGTERM):
            with self.subTest(number.name), Machine(QUICK) as machine:
                service = machine.service_pid()
                self.assertEqual(machine.stop(number), 0)
                self.assertFalse(is_running(service))

    def test_the_end_of_its_input_stops_it_if_asked_to(self):
        with tempfile.TemporaryDirectory() as folder:
            command = [program("vexa"), "start", "--machine", folder, "--stop-on-eof"]
            parent = Program(command, stdin=subprocess.PIPE)
            self.addCleanup(parent.end)
            parent.wait_line("ready ")
            parent.process.stdin.write("what comes before the end means nothing\n")
            parent.process.stdin.close()
            self.assertEqual(parent.wait(), 0)

    def test_the_ports_are_left_for_other_commands_while_it_runs(self):
        with Machine(QUICK) as machine:
            path = machine.folder / "ports.json"
            self.assertEqual(
                json.loads(path.read_text()),
                {"sa": machine.sa_port, "hs20": machine.hs20_port, "control": machine.control_port},
            )
            self.assertEqual(stat.S_IMODE(path.stat().st_mode), 0o600)
            self.assertEqual(stat.S_IMODE((machine.folder / "stdout.log").stat().st_mode), 0o600)
            machine.stop()
            self.assertFalse(path.exists())

    def test_a_killed_service_gives_128_and_the_signal(self):
        with Machine(QUICK) as machine:
            signal_service(machine, signal.SIGKILL)
            self.assertEqual(machine.parent.wait(), 128 + signal.SIGKILL)

    def test_the_service_follows_a_killed_parent(self):
        with Machine(QUICK) as machine:
            service = machine.service_pid()
            machine.parent.process.kill()
            wait_until(lambda: not is_running(service), "the end of the service")

    def test_a_second_parent_is_turned_away(self):
        with Machine(QUICK) as machine:
            second = Program([program("vexa"), "start", "--machine", str(machine.folder)])
            self.addCleanup(second.end)
            self.assertEqual(second.wait(), 3)
            self.assertEqual(second.lines, [])
            self.assertEqual(len(second.errors), 1, second.errors)
            machine.sa().send("GET_CURRENT_CHANNEL")
            self.assertTrue((machine.folder / "ports.json").exists())
            self.assertEqual(machine.stop(), 0)

    def test_a_machine_can_be_started_again(self):
        with tempfile.TemporaryDirectory() as folder:
            for _ in range(2):
                with Machine(QUICK, folder=folder) as machine:
                    self.assertEqual(machine.stop(), 0)

    def test_machines_in_different_folders_run_side_by_side(self):
        with Machine(QUICK) as one, Machine(QUICK) as other:
            self.assertNotEqual(one.sa_port, other.sa_port)
            self.assertEqual(one.stop(), 0)
            other.sa().send("GET_CURRENT_CHANNEL")
            self.assertEqual(other.stop(), 0)


class ServiceThatDoesNotCome(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = pathlib.Path(folder.name)

    def start(self, *arguments):
        parent = Program([program("vexa"), "start", "--machine", str(self.folder / "machine"), *arguments])
        self.addCleanup(parent.end)
        return parent

    def stand_in(self, body):
        path = self.folder / "stand-in"
        path.write_text("#!/bin/sh\n" + body)
        path.chmod(0o700)
        return str(path)

    def test_a_refused_scenario_gives_2_and_its_reason(self):
        scenario = self.folder / "scenario.json"
        scenario.write_text('{"speeed": 1}')
        parent = self.start("--scenario", str(scenario))
        self.assertEqual(parent.wait(), 2)
        self.assertEqual(parent.lines, [])
        self.assertIn("speeed", "\n".join(parent.errors))

    def test_a_busy_port_gives_1_and_is_named(self):
        with socket.create_server(("127.0.0.1", 0)) as taken:
            port = str(taken.getsockname()[1])
            parent = self.start("--sa-port", port)
            self.assertEqual(parent.wait(), 1)
        self.assertEqual(parent.lines, [])
        self.assertEqual(len(parent.errors), 1, parent.errors)
        self.assertIn(port, parent.errors[0])

    def test_its_exit_code_is_passed_on(self):
        for code in (0, 1, 2, 77):
            with self.subTest(code):
                parent = self.start("--service", self.stand_in(f"exit {code}\n"))
                self.assertEqual(parent.wait(), code)
                self.assertEqual(parent.lines, [])
                self.assertEqual(len(parent.errors), 0 if code == 2 else 1, parent.errors)

    def test_one_that_refuses_has_said_so_itself(self):
        parent = self.start("--service", self.stand_in("echo speed: negative >&2\nexit 2\n"))
        self.assertEqual(parent.wait(), 2)
        self.assertEqual(parent.errors, ["speed: negative"])

    def test_one_that_listens_to_nothing_is_ended(self):
        service = self.stand_in(f'echo $$ >"{self.folder}/pids"\nsleep 600 & echo $! >>"{self.folder}/pids"\nwait\n')
        parent = self.start("--service", service)
        self.assertEqual(parent.wait(), 3)
        self.assertEqual(parent.lines, [])
        self.assertEqual(len(parent.errors), 1, parent.errors)
        for pid in (self.folder / "pids").read_text().split():
            wait_until(lambda: not is_running(int(pid)), f"the end of process {pid}")
        self.assertFalse((self.folder / "machine" / "ports.json").exists())

    def test_a_listener_of_somebody_else_makes_nobody_ready(self):
        with socket.create_server(("127.0.0.1", 0)) as one, socket.create_server(("127.0.0.1", 0)) as other:
            ports = ["--sa-port", str(one.getsockname()[1]), "--hs20-port", str(other.getsockname()[1])]
            parent = self.start("--service", self.stand_in("sleep 1\nexit 7\n"), *ports)
            self.assertEqual(parent.wait(), 7)
        self.assertEqual(parent.lines, [])

    def test_it_can_be_stopped_before_it_is_ready(self):
        ready = self.folder / "started"
        parent = self.start("--service", self.stand_in(f'trap "exit 5" TERM\n: >"{ready}"\nsleep 1\nexit 6\n'))
        wait_until(ready.exists, "the start of the stand-in")
        self.assertEqual(parent.stop(), 6)
        self.assertEqual(parent.lines, [])

    def test_a_program_that_does_not_exist(self):
        parent = self.start("--service", str(self.folder / "none"))
        self.assertEqual(parent.wait(), 3)
        self.assertEqual(len(parent.errors), 1, parent.errors)

    def test_it_inherits_neither_the_input_nor_the_mutex(self):
        seen = self.folder / "open"
        parent = self.start("--service", self.stand_in(f'open=$(readlink /proc/$$/fd/*)\necho "$open" >"{seen}"\nexit 9\n'))
        self.assertEqual(parent.wait(), 9)
        targets = seen.read_text().splitlines()
        self.assertEqual(targets[0], "/dev/null")
        self.assertEqual(targets[1], str(self.folder / "machine" / "stdout.log"))
        self.assertEqual([target for target in targets if "mutexes" in target], [])


class WrongUse(unittest.TestCase):
    def test_it_ends_with_2_and_a_hint(self):
        for arguments in (
            [],
            ["nonsense"],
            ["start", "--sa-port", "70000"],
            ["start", "--sa-port", "-1"],
            ["start", "--hs20-port", "abc"],
            ["start", "--control-port"],
            ["start", "extra"],
            ["demo", "--seconds", "0"],
            ["scan", "--port", "0"],
            ["scan", "--timeout", "no"],
            ["send"],
            ["send", "80"],
            ["send", "0", "GET_RADIO"],
            ["listen"],
            ["listen", "65536"],
        ):
            with self.subTest(arguments):
                result = run_client(*arguments)
                self.assertEqual(result.returncode, 2, result.stderr)
                self.assertEqual(result.stdout, "")
                self.assertIn("vexa: ", result.stderr)

    def test_every_command_has_help(self):
        for command in ("start", "demo", "scan", "channels", "send", "listen"):
            with self.subTest(command):
                result = run_client(command, "--help")
                self.assertEqual(result.returncode, 0)
                self.assertIn(f"vexa {command}", result.stdout)
                self.assertIn("--json", result.stdout)


def run_client(*arguments):
    return subprocess.run(
        [program("vexa"), *arguments], env=clean_environment(), capture_output=True, text=True, timeout=30
    )


def signal_service(machine, number):
    os.kill(machine.service_pid(), number)


def free_ports(count):
    """Ports that nobody has, all different. Bound all at once, so that none comes twice."""
    sockets = [socket.socket() for _ in range(count)]
    try:
        for bound in sockets:
            bound.bind(("127.0.0.1", 0))
        return [bound.getsockname()[1] for bound in sockets]
    finally:
        for bound in sockets:
            bound.close()


if __name__ == "__main__":
    unittest.main()
