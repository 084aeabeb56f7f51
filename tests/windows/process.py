"""The Windows service as a process: its command line, its parent, its end."""

import ctypes
import os
import socket
import tempfile
import unittest

import wine
from harness import is_running, wait_until
from wine import Machine, Parent, free_port, run, service

# The thread that connects may be in a sleep of ten seconds, which nothing ends early.
STOP_LIMIT = 25
PR_SET_CHILD_SUBREAPER = 36


def created(sa, hs20):
    return f"create ipc successfully,port={hs20}\nCreate IPC server successfully, port={sa}\n"


class Alone(unittest.TestCase):
    """Without a parent that holds the stop mutex."""

    @classmethod
    def setUpClass(cls):
        folder = tempfile.TemporaryDirectory()
        cls.addClassCleanup(folder.cleanup)
        cls.folder = folder.name
        wine.forget_machine()

    def run_service(self, *arguments, scenario=None, text=None):
        path = wine.scenario_file(scenario or {}, self.folder)
        if text is not None:
            path = os.path.join(self.folder, "text.json")
            with open(path, "w", encoding="utf-8") as file:
                file.write(text)
            path = wine.windows_path(path)
        done = run(service(), *arguments, timeout=STOP_LIMIT, VEXA_SCENARIO=path)
        return done.returncode, done.stdout, done.stderr

    def test_what_is_no_command_line(self):
        free = f"{free_port()}"
        for arguments in ((), (free,), ("0", free), (free, "0"), ("abc", free), (free, "x"), ("", free), (free, "")):
            with self.subTest(arguments):
                self.assertEqual(self.run_service(*arguments), (1, "", ""))

    def test_a_port_in_use(self):
        with socket.create_server(("127.0.0.1", 0)) as server:
            busy, free = f"{server.getsockname()[1]}", f"{free_port()}"
            for arguments in ((busy, free), (free, busy)):
                with self.subTest(arguments):
                    self.assertEqual(self.run_service(*arguments), (1, "", ""))

    def test_a_table_that_cannot_be_read(self):
        fault = {"atMs": 0, "do": "fail", "call": "GetTcpTable", "error": 5, "skip": 1}
        done = self.run_service(f"{free_port()}", f"{free_port()}", scenario={"timeline": [fault]})
        self.assertEqual(done, (1, "\tGetTcpTable failed with 5\n", ""))

    def test_it_stops_at_once_after_a_full_start(self):
        sa, hs20 = free_port(), free_port()
        done = self.run_service(f"{sa}", f"{hs20}", scenario={"adapters": []})
        self.assertEqual(done, (0, created(sa, hs20), ""))

    def test_a_scenario_that_asks_for_what_is_out_of_reach(self):
        advance = '{"timeline":[{"atMs":5,"do":"advance","ms":1}]}'
        full_disk = '{"timeline":[{"atMs":5,"do":"fail","call":"write","error":112}]}'
        for text, member in (('{"speed":20}', "speed"), (advance, "timeline[0].do"), (full_disk, "timeline[0].call"),
                             ('{"speedy":1}', "speedy"), ("{", "scenario")):
            with self.subTest(text):
                code, output, errors = self.run_service("1", "2", text=text)
                self.assertEqual((code, output), (2, ""))
                self.assertEqual((errors.count("\n"), errors[: len(member)]), (1, member))


    def test_the_built_in_scenario_is_within_reach(self):
        done = run(service(), timeout=STOP_LIMIT)
        self.assertEqual((done.returncode, done.stdout, done.stderr), (1, "", ""))


class WithParent(unittest.TestCase):
    def test_an_action_that_is_out_of_reach_is_refused(self):
        with Machine({"adapters": []}) as machine:
            for action, member in (
                ({"do": "advance", "ms": 1}, "do"),
                ({"do": "shiftTime", "ms": 1}, "do"),
                ({"do": "fail", "call": "rename", "error": 32}, "call"),
            ):
                answer = machine.control.ask(**action)
                self.assertEqual((answer["ok"], answer["error"].partition(":")[0]), (False, member))
            self.assertTrue(machine.control.ask(do="fail", call="GetPerAdapterInfo", error=111)["ok"])

    def test_stop_and_what_it_prints(self):
        with Machine({"adapters": []}) as machine:
            sa, hs20 = machine.sa_port, machine.hs20_port
            pid = machine.service_pid()
            self.assertEqual(machine.stop(), 0)
            self.assertEqual(machine.output(), created(sa, hs20))
            self.assertFalse(is_running(pid))

    def test_stop_while_a_scan_runs_and_a_client_waits(self):
        with Machine({"spectrum": {"channels": [1, 6], "scanMs": 3600000}}) as machine:
            client = machine.sa()
            client.send("FULL_SCAN")
            wait_until(lambda: any(c["type"] == 1 for c in machine.control.query("calls") if "type" in c), "the request")
            self.assertEqual(machine.parent.stop(timeout=STOP_LIMIT), 0)
            self.assertIn(client.wait_closed(), (1001, 1006))

    def test_a_second_instance_leaves_the_first_alone(self):
        with Machine({"config": "<configurations></configurations>", "adapters": []}) as machine:
            config = wine.store() / "config.xml"
            written = config.read_bytes()
            config.write_bytes(written + b"<!-- the first one's -->")
            known = config.read_bytes()
            for arguments in ((), ("nonsense",), (f"{free_port()}", f"{free_port()}")):
                path = wine.scenario_file({"config": "<other></other>", "registryClass": []}, machine.folder)
                done = run(service(), *arguments, VEXA_SCENARIO=path)
                self.assertEqual((done.returncode, done.stdout, done.stderr), (0, "", ""))
            self.assertEqual(config.read_bytes(), known)
            client = machine.sa()
            client.send("GET_CURRENT_CHANNEL")
            client.wait_event("SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA")
            second = Parent()
            self.assertEqual(second.wait(), 3)
            second.end()
            self.assertEqual(machine.stop(), 0)

    def test_a_killed_parent_is_a_normal_stop(self):
        # The orphan becomes a child of this process, which can then ask for its exit code.
        libc = ctypes.CDLL(None, use_errno=True)
        libc.prctl(PR_SET_CHILD_SUBREAPER, 1, 0, 0, 0)
        self.addCleanup(libc.prctl, PR_SET_CHILD_SUBREAPER, 0, 0, 0, 0)
        with Machine({"adapters": []}) as machine:
            pid = machine.service_pid()
            machine.parent.process.kill()
            machine.parent.process.wait()
            wait_until(lambda: not is_running(pid), "the end of the service", STOP_LIMIT)
            self.assertEqual(os.waitstatus_to_exitcode(os.waitpid(pid, 0)[1]), 0)
            self.assertIn(f"port={machine.sa_port}\n", machine.output())


if __name__ == "__main__":
    unittest.main()
