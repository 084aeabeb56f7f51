"""`vexa` as a client of a running service: scan, channels, send, listen; and each command without one."""

import json
import re
import signal
import subprocess

from harness import Machine, Story, clean_environment, program, run_client, wait_until

LEVELS = {
    "1": {"congestion": 30, "power": 60, "spread": 0},
    "36": {"congestion": 70, "power": 96, "spread": 0},
    "149": {"congestion": 5, "power": 20, "spread": 0},
}
SPECTRUM = {"channels": [36, 1, 36, 149], "levels": LEVELS}
# A level of equal bins is 10 log10(1/56) + power - 96 dB, above a floor of -120.
EXPECTED = [
    {"channel": 1, "order": 2, "congestion": 30, "interference": 67},
    {"channel": 36, "order": 1, "congestion": 70, "interference": 100},
    {"channel": 149, "order": 3, "congestion": 5, "interference": 27},
]


class WithService(Story):
    def setUp(self):
        self.start(spectrum=SPECTRUM)

    def scan_requests(self, enable):
        """The start (1) or stop (0) requests that the spectral module got."""
        head = re.compile("^01000000" + "0b00a3ff" + ".{32}" + f"{enable:02x}000000")
        return [call for call in self.control.calls("WlanIhvControl") if head.match(call["inHex"])]

    def test_a_scan_gives_the_values_of_every_channel_and_is_stopped(self):
        self.assertEqual(self.told("scan"), {"channels": EXPECTED})
        self.assertTrue(self.scan_requests(1))
        wait_until(lambda: self.scan_requests(0), "a stop request")
        heading, *rows = self.done("scan").splitlines()
        self.assertEqual(heading.split(), ["Channel", "Congestion", "Interference"])
        wanted = [[row["channel"], row["congestion"], row["interference"]] for row in EXPECTED]
        self.assertEqual([list(map(int, row.split())) for row in rows], wanted)
        self.assertEqual(self.done("channels").split(), ["Channel", "1", "36", "149"])

    def test_watching_goes_on_until_it_is_asked_to_end(self):
        watch = self.running("scan", "--watch", "--machine", self.machine.folder)
        watch.wait_line("channel 36: congestion 70")
        self.control.do("levels", levels={"36": {"congestion": 0, "power": 96, "spread": 0}})
        watch.wait_line("channel 36: congestion 28")
        self.assertEqual(watch.stop(signal.SIGINT), 130)
        wait_until(lambda: self.scan_requests(0), "a stop request")

    def test_a_scan_that_another_client_has_stopped_is_asked_for_again(self):
        watch = self.running("scan", "--watch", "--machine", self.machine.folder)
        watch.wait_line("channel 36: congestion 70")
        self.machine.sa().send("STOP_SCAN")
        wait_until(lambda: self.scan_requests(0), "a stop request")
        self.control.do("levels", levels={"36": {"congestion": 0, "power": 96, "spread": 0}})
        watch.wait_line("channel 36: congestion 28")
        (told,) = wait_until(lambda: watch.errors, "a word about it")
        self.assertRegex(told, "another client may have stopped the scan")

    def test_the_port_can_come_from_option_environment_and_machine(self):
        port = str(self.machine.sa_port)
        expected = [{"channel": row["channel"], "order": row["order"]} for row in EXPECTED]
        for options, variables in (
            (["--sa-port", port], {"VEXA_MACHINE": None}),
            (["--port", port], {"VEXA_MACHINE": None}),
            ([], {"VEXA_MACHINE": None, "VEXA_SA_PORT": port}),
            (["--machine", self.machine.folder], {"VEXA_MACHINE": None}),
            ([], {}),
            (["--sa-port", port], {"VEXA_SA_PORT": "1", "VEXA_MACHINE": "/nonexistent"}),
        ):
            with self.subTest(options=options, variables=variables):
                self.assertEqual(json.loads(self.done("channels", "--json", *options, **variables)), expected)

    def test_what_is_sent_is_answered_an_event_a_line(self):
        answer = self.done("send", self.machine.hs20_port, "GET_IS_CARD_IN", "--wait", 2000)
        events = list(map(json.loads, answer.splitlines()))
        self.assertEqual([(event["EventId"], event["Data"]) for event in events], [("CARD_PLUG_IN", "")])
        self.assertEqual(self.done("send", "sa", "FULL_SCAN", "--wait", 0), "")
        wait_until(lambda: self.scan_requests(1), "a scan request")
        event = json.loads(self.done("send", "hs20", "SET_HOTSPOT_AUTO_CONNECT", "-", stdin="true").splitlines()[-1])
        self.assertEqual((event["EventId"], event["Data"]), ("SET_HOTSPOT_AUTO_CONNECT", "true\n"))

    def test_what_can_not_be_printed_has_failed(self):
        environment = clean_environment(VEXA_MACHINE=str(self.machine.folder))
        for command in ("status", "scan", "scan --watch", "channels --json", "networks", "networks --watch", "watch",
                        "credentials", "credential export", "send sa GET_CHANNEL_LIST", "--version", "scan --help"):  # fmt: skip
            with self.subTest(command), open("/dev/full", "w") as full:
                arguments = [program("vexa"), *command.split()]
                told = subprocess.run(arguments, env=environment, stdout=full, stderr=subprocess.PIPE, timeout=60)
                self.assertEqual((told.returncode, told.stderr), (1, b"vexa: standard output cannot be written\n"))

    def listener(self, *command):
        """It has heard something."""
        listener = self.running(*command, "--machine", self.machine.folder)
        wait_until(lambda: self.control.do("pullAdapter") or listener.lines, "an event")
        return listener

    def test_listening_shows_events_as_they_come(self):
        listener = self.listener("listen", "sa")
        self.assertEqual(json.loads(listener.lines[0])["EventId"], "CARD_PLUG_OUT")
        self.assertEqual(listener.stop(signal.SIGINT), 130)

    def test_a_service_that_goes_is_told(self):
        listeners = [self.listener("listen", "sa"), self.listener("scan", "--watch")]
        self.machine.stop()
        for listener in listeners:
            self.assertEqual(listener.wait(), 1)
            self.assertEqual(listener.errors, ["vexa: the service has closed the connection"])

    def test_without_an_adapter_each_command_says_so_at_once(self):
        self.control.do("pullAdapter")
        for command in ("scan", "credentials", "reload", "credential delete A", "networks", "enable", "disable", "refresh",
                        "credential add --realm r --method tls --client-cert c"):  # fmt: skip
            with self.subTest(command):
                self.assertIn("no adapter", self.refused(1, *command.split(), "--timeout", "3600"))


class WithoutService(Story):
    def test_a_word_that_is_no_command_is_named(self):
        for words, told in (
            ("stauts", '"stauts": did you mean "status", "stats" or "start"?'),
            ("help Netwroks", '"Netwroks": did you mean "networks"?'),
            ("dis --json", '"dis": did you mean "disable" or "disconnect"?'),
            ("credential mov 1 2", '"credential mov": did you mean "credential move"?'),
            ("spectrum", '"spectrum"'),
        ):
            self.assertEqual(self.refused(2, *words.split(), VEXA_MACHINE=""), f"vexa: there is no command {told}")
        for words in ([], ["scan"], ["credential", "add"]):
            self.assertEqual(run_client("help", *words).stdout, run_client(*words, "--help").stdout)

    def test_help_is_as_wide_as_the_terminal(self):
        for columns, *words in ((60, "log"), (80, "credential", "add"), (40, "scan"), (80,)):
            whole, terminal = run_client(*words, "--help").stdout, self.terminal(*words, "--help", columns=columns)
            self.assertEqual(terminal.finish(), 0)
            shown = terminal.screen.decode()
            self.assertLessEqual(max(map(len, shown.splitlines())), columns)
            self.assertEqual(shown.split(), whole.split())
            self.assertNotIn("{false}", whole)

    def test_each_command_says_so(self):
        folder = str(self.new_folder())
        for command in (
            "scan", "scan --watch", "channels --json", "scan --sa-port 1", "channels --sa-port 1", "send 1 GET_RADIO",
            "listen 1", "watch", "credentials", "credentials --hs20-port 1", "reload", "credential delete 1",
            "credential move 1 1", "credential edit 1 --name x",
            "credential add --realm r --method tls --client-cert c",
            "credential add --realm r --username u --password-stdin",
        ):  # fmt: skip
            with self.subTest(command):
                self.refused(1, *command.split(), stdin="p", VEXA_MACHINE=folder)

    def test_ports_that_a_dead_parent_has_left_are_no_service(self):
        with Machine({"speed": 20}) as self.machine:
            self.machine.parent.process.kill()
            wait_until(lambda: self.vexa("channels").returncode == 1, "the end")
            self.assertTrue((self.machine.folder / "ports.json").exists())
            self.assertIn(str(self.machine.sa_port), self.refused(1, "channels"))
