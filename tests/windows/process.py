"""The Windows service as a process: its command line, its parent, its end."""

import ctypes
import os
import socket

import wine
from harness import Story, free_ports, is_running, wait_until
from service_process import PR_SET_CHILD_SUBREAPER, created

# The thread that connects may be in a sleep of ten seconds, which nothing ends early.
STOP_LIMIT = 25


def run_service(*arguments, **variables):
    done = wine.run(wine.service(), *arguments, timeout=STOP_LIMIT, **variables)
    return done.returncode, done.stdout, done.stderr


class Alone(Story):
    """Without a parent that holds the stop mutex."""

    @classmethod
    def setUpClass(cls):
        wine.forget_machine()

    def run_service(self, *arguments, **scenario):
        return run_service(*arguments, VEXA_SCENARIO=wine.scenario_file(scenario, self.new_folder()))

    def test_what_is_no_command_line_or_names_a_port_in_use(self):
        with socket.create_server(("127.0.0.1", 0)) as server:
            busy, (free,) = server.getsockname()[1], free_ports(1)
            for arguments in ((), (free,), (0, free), (free, 0), ("abc", free), (free, "x"), ("", free), (free, ""),
                              (busy, free), (free, busy)):  # fmt: skip
                with self.subTest(arguments):
                    self.assertEqual(self.run_service(*arguments), (1, "", ""))

    def test_a_table_that_cannot_be_read(self):
        fault = {"atMs": 0, "do": "fail", "call": "GetTcpTable", "error": 5, "skip": 1}
        done = self.run_service(*free_ports(2), timeline=[fault])
        self.assertEqual(done, (1, "\tGetTcpTable failed with 5\n", ""))

    def test_it_stops_at_once_after_a_full_start(self):
        ports = free_ports(2)
        self.assertEqual(self.run_service(*ports, adapters=[]), (0, created(*ports), ""))

    def test_a_scenario_that_asks_for_what_is_out_of_reach(self):
        path = self.new_folder() / "text.json"
        for text, member in (
            ('{"speed":20}', "speed"),
            ('{"timeline":[{"atMs":5,"do":"advance","ms":1}]}', "timeline[0].do"),
            ('{"timeline":[{"atMs":5,"do":"fail","call":"write","error":112}]}', "timeline[0].call"),
            ('{"speedy":1}', "speedy"),
            ("{", "scenario"),
        ):
            with self.subTest(text):
                path.write_text(text)
                code, output, errors = run_service("1", "2", VEXA_SCENARIO=wine.windows_path(path))
                self.assertEqual((code, output), (2, ""))
                self.assertEqual((errors.count("\n"), errors[: len(member)]), (1, member))

    def test_the_built_in_scenario_is_within_reach(self):
        self.assertEqual(run_service(), (1, "", ""))


class WithParent(Story):
    def test_an_action_that_is_out_of_reach_is_refused(self):
        self.start(adapters=[])
        for action, member in (
            ({"do": "advance", "ms": 1}, "do"),
            ({"do": "shiftTime", "ms": 1}, "do"),
            ({"do": "fail", "call": "rename", "error": 32}, "call"),
        ):
            answer = self.control.ask(**action)
            self.assertEqual((answer["ok"], answer["error"].partition(":")[0]), (False, member))
        self.assertTrue(self.control.ask(do="fail", call="GetPerAdapterInfo", error=111)["ok"])

    def test_stop_and_what_it_prints(self):
        machine = self.start(adapters=[])
        pid = machine.service_pid()
        self.assertEqual(machine.stop(), 0)
        self.assertEqual(machine.output(), created(machine.sa_port, machine.hs20_port))
        # Its exit code is known a moment before its host process is gone.
        wait_until(lambda: not is_running(pid), "the end of the service", STOP_LIMIT)

    def test_stop_while_a_scan_runs_and_a_client_waits(self):
        client = self.start(spectrum={"channels": [1, 6], "scanMs": 3600000}).sa()
        client.send("FULL_SCAN")
        wait_until(lambda: any(c.get("type") == 1 for c in self.control.query("calls")), "the request")
        self.assertEqual(self.machine.parent.stop(timeout=STOP_LIMIT), 0)
        self.assertIn(client.wait_closed(), (1001, 1006))

    def test_a_second_instance_leaves_the_first_alone(self):
        machine = self.start(config="<configurations></configurations>", adapters=[])
        config = machine.config()
        config.write_bytes(config.read_bytes() + b"<!-- the first one's -->")
        known = config.read_bytes()
        path = wine.scenario_file({"config": "<other></other>", "registryClass": []}, machine.folder)
        for arguments in ((), ("nonsense",), free_ports(2)):
            self.assertEqual(run_service(*arguments, VEXA_SCENARIO=path), (0, "", ""))
        self.assertEqual(config.read_bytes(), known)
        machine.sa().ask("GET_CURRENT_CHANNEL")
        second = wine.Parent()
        self.assertEqual(second.wait(), 3)
        second.end()
        self.assertEqual(machine.stop(), 0)

    def test_a_killed_parent_is_a_normal_stop(self):
        # The orphan becomes a child of this process, which can then ask for its exit code.
        libc = ctypes.CDLL(None, use_errno=True)
        libc.prctl(PR_SET_CHILD_SUBREAPER, 1, 0, 0, 0)
        self.addCleanup(libc.prctl, PR_SET_CHILD_SUBREAPER, 0, 0, 0, 0)
        machine = self.start(adapters=[])
        pid = machine.service_pid()
        machine.parent.process.kill()
        machine.parent.process.wait()
        wait_until(lambda: not is_running(pid), "the end of the service", STOP_LIMIT)
        self.assertEqual(os.waitstatus_to_exitcode(os.waitpid(pid, 0)[1]), 0)
        self.assertIn(f"port={machine.sa_port}\n", machine.output())
