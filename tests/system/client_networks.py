"""`vexa networks`, `status`, `enable`, `disable` and `refresh` on a running service."""

import json
import re
import signal

from client_credentials import CredentialStory
from harness import network, wait_until

ANNA = {"eapMethod": 21, "username": "anna"}
NETWORKS = [
    network(1, "Airport Free", {"roam.example": [21], "corp.example": [13]}, accepts=[ANNA]),
    network(2, "Café", {}, internetAccess=0),
    network(3, "Later", {}, anqp="never"),
]
REPORT = [{"atMs": 1, "do": "reportNetworks"}]


class NetworkStory(CredentialStory):
    scenario = {"connectMs": 100, "networks": NETWORKS, "timeline": REPORT}

    def networks(self):
        return self.told("networks")

    def status(self):
        return self.told("status")

    def all_reported(self):
        def are_listed():
            self.control.do("reportNetworks")
            listed = self.networks()
            return len(listed) == len(self.scenario["networks"]) and listed[0]["realms"]

        wait_until(are_listed, "all networks")

    def hide(self, bssid):
        self.control.do("hide", bssid=bssid)
        self.control.do("reportNetworks")


class Looking(NetworkStory):
    def setUp(self):
        super().setUp()
        self.all_reported()

    def test_networks_are_listed_in_order_with_their_realms(self):
        methods = [{"name": "roam.example", "method": "TTLS"}, {"name": "corp.example", "method": "TLS"}]
        expected = [("Airport Free", methods, "offered"), ("Café", [], "none"), ("Later", None, "offered")]
        networks = self.networks()
        self.assertEqual([(n["name"], n["realms"], n["internet"]) for n in networks], expected)
        self.assertFalse(any(n["connected"] for n in networks))
        heading, first, second, third = self.done("networks").splitlines()
        self.assertEqual(heading.split(), ["Network", "Connected", "Internet", "Realms"])
        self.assertRegex(first, r"^   Airport Free  no +offered +.*roam\.example \(TTLS\)")
        self.assertRegex(second, r"^   Café +no +none +none$")
        self.assertRegex(third, r"^   Later +no +offered +not known yet$")

    def test_a_connection_shows(self):
        self.hide(NETWORKS[2]["bssid"])  # one that never tells its realms keeps the service from joining any
        self.add_user("Roam", realm="roam.example")
        wait_until(lambda: self.status()["credential"] == "Roam", "the connection with the credential's name")
        shown = [(n["name"], n["internet"]) for n in self.networks() if n["connected"]]
        self.assertEqual(shown, [("Airport Free", "reached")])
        self.assertRegex(self.done("status"), r"Credential +Roam\n(.*\n)*Channel +36\n")
        self.assertRegex(self.done("networks"), r"\n\*  Airport Free  yes .*\n   ")
        status = self.status()
        self.assertEqual([status[k] for k in ("connection", "internet", "channel")], ["Airport Free", True, 36])
        self.control.do("setDns", dns=[])
        self.assertFalse(self.status()["internet"])
        self.assertEqual([n["internet"] for n in self.networks() if n["connected"]], ["missing"])

    def test_watching_tells_each_list_that_differs(self):
        watch = self.running("networks", "--watch", "--json", "--machine", self.machine.folder)
        watch.wait_line("")
        self.control.do("reportNetworks")
        self.hide(NETWORKS[1]["bssid"])
        watch.wait_line("", count=2)
        names = [[n["name"] for n in json.loads(line)] for line in watch.lines]
        self.assertEqual(names, [["Airport Free", "Café", "Later"], ["Airport Free", "Later"]])
        self.assertEqual((watch.stop(signal.SIGINT), watch.errors), (130, []))

    def test_in_a_terminal_the_list_is_drawn_anew(self):
        for locale, rest in (("C.UTF-8", "…"), ("C", "...")):
            command = "networks", "--watch", "--machine", self.machine.folder
            terminal = self.terminal(*command, columns=99, rows=4, LC_ALL=locale)
            terminal.read_until(rb"(?s)3 networks .*Airport Free.*2 below; arrows, ")
            terminal.resize(28, 6)
            terminal.read_until(f"(?s)Airport Free +no +[a-z]*{re.escape(rest)}\r.*Later".encode())
            self.hide(NETWORKS[1]["bssid"])
            terminal.read_until(b"2 networks")
            terminal.press(b"q")
            self.assertEqual((terminal.finish(), terminal.last_line().split()[0]), (0, "Later"))
            self.control.do("show", bssid=NETWORKS[1]["bssid"])
            self.all_reported()

    def test_keys_move_what_does_not_fit_below_the_heading(self):
        terminal = self.terminal("networks", "--watch", "--machine", self.machine.folder, columns=99, rows=4)
        terminal.read_until(b"2 below; arrows, PageUp")
        first, second, third = "Airport Free .*\\x1b\\[J2 below; ", "Café .*\\x1b\\[J1 above, 1 below; ", "Later .*\\x1b\\[J2 above; "
        for key, shown in (
            ("[B", second), ("[1;5B", third), ("OB", third), ("[A", second), ("OA", first), ("[A", first),
            ("[F", third), ("[H", first), ("OF", third), ("OH", first), ("[4~", third), ("[1~", first),
            ("[8~", third), ("[7~", first), ("[6~", second), ("[6;2~", third), ("[5~", second), ("[20~\x1b[Zx\x1b[5~", first),
        ):  # fmt: skip
            terminal.screen = b""
            terminal.press(b"\x1b" + key.encode())
            terminal.read_until(rf"(?s)\x1b\[H\x1b\[K3 networks [^\n]*\n\x1b\[K   Network [^\n]*\n\x1b\[K...{shown}".encode())
        terminal.press(b"q")
        self.assertEqual(terminal.finish(), 0)

    def test_watching_waits_for_an_adapter(self):
        self.control.do("pullAdapter")
        watch = self.running("networks", "--watch", "--json", "--machine", self.machine.folder)
        wait_until(lambda: watch.errors, "a word about the adapter")
        self.control.do("insertAdapter")
        wait_until(lambda: self.control.do("reportNetworks") or watch.lines, "a list")
        self.assertEqual(watch.stop(signal.SIGTERM), 143)

    def test_why_there_are_none(self):
        def none_listed():
            result = self.vexa("networks")
            self.assertEqual(result.returncode, 0)
            return result if result.stdout == "No hotspot networks.\n" else None

        self.control.do("radio", software="off")
        self.assertIn("the radio is off", wait_until(none_listed, "an empty list").stderr)
        self.control.do("radio", software="on")
        self.done("disable")
        self.assertIn("disabled", none_listed().stderr)

    def test_a_refresh_asks_the_networks_again(self):
        before = len(self.control.calls("WlanIhvControl"))
        self.assertIn("asked for again", self.done("refresh"))
        wait_until(lambda: len(self.control.calls("WlanIhvControl")) > before, "an ANQP query")


class Status(NetworkStory):
    def test_it_follows_what_happens(self):
        self.all_reported()
        expected = {"adapter": True, "radio": True, "hotspot": True, "networks": 3, "connection": None}
        expected |= {"internet": False, "credential": None, "possibleCredentials": [], "channel": 0}
        expected |= {"ports": {"sa": self.machine.sa_port, "hs20": self.machine.hs20_port}}
        expected |= {"machine": str(self.machine.folder), "version": self.done("--version").split()[1]}
        self.assertEqual(self.status(), expected)
        port = self.machine.hs20_port
        elsewhere = json.loads(self.done("status", "--json", "--hs20-port", port, VEXA_MACHINE="/nonexistent"))
        told = [elsewhere[k] for k in ("hotspot", "channel", "machine", "ports")]
        self.assertEqual(told, [None, None, None, {"sa": None, "hs20": port}], "of a machine that is not known")
        self.control.do("radio", software="off")
        expected |= {"radio": False, "networks": 0}
        self.assertEqual(self.status(), expected)
        self.control.do("pullAdapter")
        self.assertEqual(self.status(), {**expected, "adapter": False})

    def test_in_words(self):
        words = [line.split()[:2] for line in self.done("status").splitlines()]
        self.assertEqual(words[:3], [["Adapter", "in"], ["Radio", "on"], ["Hotspot", "enabled"]])
        names = ["Networks", "Connection", "Credential", "Internet", "Channel", "Ports", "Machine", "Version"]
        self.assertEqual([name for name, _ in words[3:]], names)


class Switching(NetworkStory):
    def test_the_switch_takes_the_networks_away_and_gives_them_back(self):
        self.all_reported()
        self.assertEqual(self.done("disable"), "Hotspot networks are disabled.\n")
        self.assertEqual((self.status()["hotspot"], self.networks()), (False, []))
        self.assertEqual(self.told("enable"), {"hotspot": True})
        self.assertEqual((self.status()["hotspot"], len(self.networks())), (True, 3))

    def test_it_outlives_the_service(self):
        self.done("disable")
        self.machine.stop()
        self.start(folder=self.machine.folder, **self.scenario)
        self.control.do("reportNetworks")
        self.control.do("reportNetworks")
        self.assertEqual((self.status()["hotspot"], self.networks()), (False, []))
        self.done("enable")
        self.all_reported()

    def test_it_is_on_unless_the_registry_says_false_and_leaves_the_rest_alone(self):
        path, key = self.machine.folder / "registry.json", "HKEY_CURRENT_USER\\Software\\Korvane\\Vexa"
        other = {"HKEY_CURRENT_USER\\Other": {"a": 1}}
        switches = (({"IsHotSpotAutoConnect": value}, value != "False") for value in (7, "False", "false "))
        for values, is_on in ((7, True), ({}, True), *switches):
            path.write_text(json.dumps({key: values}))
            self.assertEqual(self.status()["hotspot"], is_on, values)
        for before, command, after in (({}, "disable", "false"), ({"IsHotSpotAutoConnect": "fAlse"}, "enable", "true")):
            path.write_text(json.dumps({**other, key: {"b": "c", **before}}))
            self.done(command)
            self.assertEqual(json.loads(path.read_text()), {**other, key: {"IsHotSpotAutoConnect": after, "b": "c"}})
        path.write_text("nonsense")
        self.assertTrue(self.status()["hotspot"])
