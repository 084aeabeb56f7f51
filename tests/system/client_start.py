"""`vexa start`: the parent of a service; and wrong use of any command."""

import json
import os
import signal
import socket
import stat
import subprocess

from harness import STORE, Story, clean_environment, free_ports, is_running, run_client, tcp_rows, wait_until

LISTENING = [("0100007F", "0A")]  # on the loopback address alone


class RunningService(Story):
    def test_it_tells_its_ports_and_leaves_them_for_other_commands_while_it_runs(self):
        machine = self.start()
        machine.control.close()
        sa, hs20, control = machine.sa_port, machine.hs20_port, machine.control_port
        self.assertEqual(len({sa, hs20, control, 0}), 4)
        self.assertEqual([tcp_rows(sa), tcp_rows(hs20)], [LISTENING, LISTENING], "nothing has touched them")
        path = machine.folder / "ports.json"
        self.assertEqual(json.loads(path.read_text()), {"sa": sa, "hs20": hs20, "control": control})
        for file in (path, machine.folder / "stdout.log"):
            self.assertEqual(stat.S_IMODE(file.stat().st_mode), 0o600)
        service = machine.service_pid()
        self.assertEqual(machine.stop(signal.SIGINT), 0)
        self.assertFalse(is_running(service) or path.exists())
        told = [f"ready sa={sa} hs20={hs20} control={control}"]
        self.assertEqual((machine.parent.lines, machine.parent.errors), (told, []))

    def test_ports_that_were_asked_for_are_used(self):
        ports = free_ports(2)
        machine = self.start(arguments=["--sa-port", str(ports[0]), "--hs20-port", str(ports[1])])
        self.assertEqual([machine.sa_port, machine.hs20_port], ports)
        for port in ports:
            self.assertIn(f"port={port}\n", machine.output())

    def test_a_service_that_is_killed_is_told(self):
        machine = self.start()
        os.kill(machine.service_pid(), signal.SIGKILL)
        told = ["vexa: the service was killed by signal 9, without being asked to stop"]
        self.assertEqual((machine.parent.wait(), machine.parent.errors), (128 + 9, told))

    def test_it_stops_with_its_input_and_opens_no_control_channel_if_asked_to(self):
        command = ["start", "--json", "--stop-on-eof", "--machine", self.new_folder()]
        parent = self.running(*command, environment=clean_environment(VEXA_CONTROL_PORT="1"), stdin=subprocess.PIPE)
        ports = json.loads(parent.wait_line("{"))
        self.assertEqual((set(ports), ports["control"]), ({"sa", "hs20", "control"}, 0))
        self.assertEqual(tcp_rows(ports["sa"]), LISTENING)
        parent.process.stdin.write("what comes before the end means nothing\n")
        parent.process.stdin.close()
        self.assertEqual(parent.wait(), 0)

    def test_a_second_parent_is_turned_away(self):
        machine = self.start()
        second = self.running("start", "--machine", machine.folder)
        self.assertEqual((second.wait(), second.lines, len(second.errors)), (3, [], 1), second.errors)
        self.assertEqual(self.start().stop(), 0, "one in another folder is not")
        machine.sa().ask("GET_CURRENT_CHANNEL")
        self.assertTrue((machine.folder / "ports.json").exists())
        self.assertEqual(machine.stop(), 0)


class ServiceThatDoesNotCome(Story):
    def setUp(self):
        self.folder = self.new_folder()

    def begin(self, *arguments):
        return self.running("start", "--machine", self.folder / "machine", *arguments)

    def stand_in(self, body):
        path = self.folder / "stand-in"
        path.write_text("#!/bin/sh\n" + body)
        path.chmod(0o700)
        return "--service", path

    def assert_ends(self, parent, code, *errors):
        """With this exit code and lines that hold these texts."""
        self.assertEqual((parent.wait(), parent.lines), (code, []))
        self.assertEqual(len(parent.errors), len(errors), parent.errors)
        for line, text in zip(parent.errors, errors):
            self.assertIn(text, line)

    def test_a_refused_scenario_gives_2_and_its_reason(self):
        scenario = self.folder / "scenario.json"
        scenario.write_text('{"speeed": 1}')
        self.assert_ends(self.begin("--scenario", scenario), 2, "speeed")

    def test_a_busy_port_gives_1_and_is_named(self):
        with socket.create_server(("127.0.0.1", 0)) as taken:
            port = str(taken.getsockname()[1])
            self.assert_ends(self.begin("--sa-port", port), 1, port)

    def test_a_configuration_that_cannot_be_read_gives_1_and_is_named(self):
        file = self.folder / "machine" / STORE / "config.xml"
        file.parent.mkdir(parents=True)
        for make in (file.mkdir, file.touch, lambda: file.write_text("<configurations>")):
            make()
            self.assert_ends(self.begin(), 1, f"{file} cannot be read")
            file.rmdir() if file.is_dir() else file.unlink()

    def test_a_table_of_ports_that_cannot_be_read_gives_1_and_leads_to_what_the_service_says(self):
        scenario = self.folder / "scenario.json"
        scenario.write_text('{"timeline": [{"atMs": 0, "do": "fail", "call": "GetTcpTable", "error": 5, "skip": 1}]}')
        output = self.folder / "machine" / "stdout.log"
        self.assert_ends(self.begin("--scenario", scenario), 1, str(output))
        self.assertIn("GetTcpTable failed with 5", output.read_text())

    def test_its_exit_code_is_passed_on(self):
        for code in (0, 1, 77):
            with self.subTest(code):
                self.assert_ends(self.begin(*self.stand_in(f"exit {code}\n")), code, "vexa: ")
        told = "killed by signal 9 before it was ready: its output is in"
        self.assert_ends(self.begin(*self.stand_in("kill -9 $$\n")), 128 + 9, told)
        refusing = self.stand_in("echo speed: negative >&2\nexit 2\n")
        self.assert_ends(self.begin(*refusing), 2, "speed: negative")
        self.assert_ends(self.begin("--service", self.folder / "none"), 3, "vexa: ")

    def test_one_that_listens_to_nothing_is_ended(self):
        service = self.stand_in(f'echo $$ >"{self.folder}/pids"\nsleep 600 & echo $! >>"{self.folder}/pids"\nwait\n')
        self.assert_ends(self.begin(*service), 3, "vexa: ")
        for pid in (self.folder / "pids").read_text().split():
            wait_until(lambda: not is_running(int(pid)), f"the end of process {pid}")
        self.assertFalse((self.folder / "machine" / "ports.json").exists())

    def test_a_listener_of_somebody_else_makes_nobody_ready(self):
        with socket.create_server(("127.0.0.1", 0)) as one, socket.create_server(("127.0.0.1", 0)) as other:
            ports = ["--sa-port", one.getsockname()[1], "--hs20-port", other.getsockname()[1]]
            self.assert_ends(self.begin(*self.stand_in("sleep 1\nexit 7\n"), *ports), 7, "vexa: ")

    def test_it_can_be_stopped_before_it_is_ready(self):
        started = self.folder / "started"
        parent = self.begin(*self.stand_in(f'trap "exit 5" TERM\n: >"{started}"\nsleep 1\nexit 6\n'))
        wait_until(started.exists, "the start of the stand-in")
        told = ["vexa: the service ended with exit code 6 when it was asked to stop"]
        self.assertEqual((parent.stop(), parent.lines, parent.errors), (6, [], told))

    def test_it_inherits_neither_the_input_nor_the_mutex(self):
        seen = self.folder / "open"
        service = self.stand_in(f'open=$(readlink /proc/$$/fd/*)\necho "$open" >"{seen}"\nexit 9\n')
        self.assert_ends(self.begin(*service), 9, "vexa: ")
        targets = seen.read_text().splitlines()
        self.assertEqual(targets[:2], ["/dev/null", str(self.folder / "machine" / "stdout.log")])
        self.assertEqual([target for target in targets if "mutexes" in target], [])


class Use(Story):
    def vexa(self, *arguments, **_):
        return run_client(*arguments)

    def test_wrong_use_ends_with_2_and_a_hint(self):
        for command in (
            "", "nonsense", "start --sa-port 70000", "start --sa-port -1", "start --hs20-port abc",
            "start --control-port", "start extra", "demo --seconds 0", "scan --port 0", "scan --timeout no", "send",
            *(f"start --{half}-port 9 --control-port 9" for half in ("sa", "hs20")),
            "send 80", "send 0 GET_RADIO", "listen", "listen 65536", "log -n", "log -n x", "log -n -1",
            "log --nonsense", "log more",
        ):  # fmt: skip
            with self.subTest(command):
                self.refused(2, *command.split())

    def test_every_command_has_help(self):
        for command in ("start", "demo", "scan", "channels", "send", "listen"):
            with self.subTest(command):
                self.assertRegex(self.done(command, "--help"), rf"(?s)vexa {command}.*--json")
