"""What `vexa` prints for scripts: JSON as docs/json.md describes it, terse lines, chosen fields, nothing at all."""

import json
import pathlib
import re
import signal

from client_connect import CAFE, MANUAL, ConnectStory
from client_record import WRITTEN, text_of
from client_watch import CHANNELS
from harness import STORE, network, wait_until

PAGE = pathlib.Path(__file__).parents[2] / "docs" / "json.md"
NAMES = {
    bool: "true or false",
    str: "text",
    int: "number",
    float: "number",
    list: "list",
    dict: "object",
    type(None): "null",
}
ODD = network(3, "Gate: B\\2", {"b:c": [21], "d": [13]})
CAFE_REALMS = "cafe.example (TTLS), cafe.example (TLS)"
PASSWORD = "--username anna --password-stdin"
CAFE_CARD = "--realm cafe.example --method tls --client-cert Anna --ca-cert Root"


def pages():
    """Of each group of commands on the page: their names, and their members by their paths, each with its types and
    whether it may lack."""
    for heading, body in re.findall(r"^## (`vexa.*)\n((?:(?!## ).*\n?)*)", PAGE.read_text(), re.M):
        rows = re.findall(r"^\| `(\S+)`(\??) \| ([^|]*) \|", body, re.M)
        yield re.findall("`vexa ([^`]*)`", heading), {path: (types, lacks) for path, lacks, types in rows}


def differences(value, form, seen, path=""):
    """How the value differs from the form; `seen` gets the paths that it has."""
    seen.add(path)
    kind = NAMES[type(value)]
    faults = [] if kind in form.get(path, (kind,))[0] else [f"{path} is {value!r}"]
    if isinstance(value, list) and any(known.startswith(path + "[]") for known in form):
        faults += [fault for part in value for fault in differences(part, form, seen, path + "[]")]
    dot = path + "." if path else ""
    if isinstance(value, dict) and any(known.startswith(dot) for known in form):
        names = {re.split(r"[.[]", known[len(dot) :])[0] for known in form if known.startswith(dot)}
        needed = {name for name in names if not form.get(dot + name, ("", ""))[1]}
        faults += [f"{path}: {name}" for name in (needed - value.keys()) | (value.keys() - names)]
        faults += [fault for name, part in value.items() for fault in differences(part, form, seen, dot + name)]
    return faults


class Forms(ConnectStory):
    scenario = {**ConnectStory.scenario, "networks": [CAFE, ODD], "spectrum": CHANNELS}

    def commands(self):
        folder = self.machine.folder / STORE / "Dump"
        folder.mkdir(parents=True, exist_ok=True)
        (folder / "log.txt").write_text("a line\nanother: line\n")
        yield from ("status", "doctor", "networks", "scan", "channels", "enable", "refresh", "watch --for 1", "log")
        yield f"credential add --name A:\\ --realm r {PASSWORD}"
        yield f"credential add {CAFE_CARD} {MANUAL}"
        yield from ("credential edit 1 --name B:\\", "credential edit 1 --name B:\\", "credential move 1 1")
        yield from ("credentials", "credentials --show-passwords", "connect Café", "connect Café --no-wait", "status")
        yield from ("networks", "disconnect", "credential delete 1", "reload", "disable", "credential list")
        yield from (f"credential export {folder}/own.json", f"credential import {folder}/own.json {PASSWORD}")
        yield f"send {self.machine.hs20_port} GET_IS_CARD_IN"
        (folder / "case.rec").write_text(text_of(WRITTEN))
        yield from (f"record {folder}/new.rec --for 1", f"stats {folder}/case.rec", f"scenario from {folder}/case.rec")

    def told_until_stopped(self):
        """Of the commands that go on by themselves."""
        port, folder = self.machine.hs20_port, self.new_folder()
        for words, texts in (
            (("listen", port), ["EventId"]),
            (("start", "--machine", folder), ["control"]),
            (("panel", "--no-open", "--machine", self.machine.folder), ["url"]),
            (("demo",), ["CommandId", '"file"']),
        ):
            program = self.running(*words, "--json")
            wait_until(lambda: self.vexa("send", port, "GET_IS_CARD_IN") and program.lines, words[0])
            for text in texts:
                program.wait_line(text)
            program.stop(signal.SIGINT)
            yield words[0], program.lines
        (folder / "case.rec").write_text(text_of(WRITTEN))
        replay = self.running("replay", folder / "case.rec", "--speed", 20, "--json")
        self.vexa("send", json.loads(replay.wait_line("hs20"))["hs20"], "SET_HOTSPOT_AUTO_CONNECT", "true")
        replay.wait_line("events")
        replay.wait()
        yield "replay", replay.lines

    def test_the_page_tells_the_members_of_all_commands(self):
        told = [(line, self.vexa(*line.split(), "--json", stdin="secret")) for line in self.commands()]
        told = [(line, result.stdout.splitlines()) for line, result in told] + [*self.told_until_stopped()]
        named = [name for names, _ in pages() for name in names]
        script = self.done("completion", "fish")
        self.assertEqual(set(re.findall(r'__vexa_at "([^"]+)".* -l json ', script)), set(named))
        for names, form in pages():
            seen = set()
            for line, values in told:
                if max((name for name in named if line.startswith(name)), key=len) in names:
                    self.assertTrue(values, line)
                    faults = [fault for value in values for fault in differences(json.loads(value), form, seen)]
                    self.assertEqual(faults, [], line)
            self.assertEqual(form.keys() - seen, set(), names)
        self.assertEqual(self.done("--json-version"), "1\n")

    def test_terse_lines_and_chosen_fields(self):
        card = self.done("credential", "add", *CAFE_CARD.split(), MANUAL, "--terse", "--fields", "credential.id")
        self.assertEqual(card, "1\n")
        for line, told in (
            ("networks --terse", [f"Café:no:offered:{CAFE_REALMS}", "Gate\\: B\\\\2:no:offered:b\\:c (TTLS), d (TLS)"]),
            ("networks --terse --fields realms,name", [f"{CAFE_REALMS}:Café", "b\\:c (TTLS), d (TLS):Gate\\: B\\\\2"]),
            ("networks --fields internet,name", ["Internet  Network", "offered   Café", "offered   Gate: B\\2"]),
            ("networks --json --fields name", ['[{"name":"Café"},{"name":"Gate: B\\\\2"}]']),
            ("status --terse --fields networks,credential,ports.hs20", [f"2::{self.machine.hs20_port}"]),
            ("status --fields radio,connection", ["Radio       yes", "Connection  -"]),
            ("credentials --terse", ["1:1:cafe.example:cafe.example:TLS:all users:no:KORVANE-PC\\\\user::Anna:Root:"]),
            (
                "credential edit 1 --name B --json --fields credential.id,done",
                ['{"credential":{"id":1},"done":"edited"}'],
            ),
            ("connect Café --terse", ["connected:Café:B:yes"]),
            ("channels --terse --fields order", ["1", "2"]),
        ):
            self.assertEqual(self.done(*line.split()).splitlines(), told, line)
        refused = self.refused(2, "networks", "--fields", "name,nonsense")
        self.assertIn("nonsense, there is name, connected, internet, realms", refused)

    def test_quiet_leaves_the_exit_code(self):
        for line, code in (("status", 0), ("networks --json", 0), ("connect Nowhere", 1), ("status --nonsense", 2)):
            result = self.vexa(*line.split(), "-q")
            self.assertEqual((result.returncode, result.stdout, result.stderr), (code, "", ""), line)
