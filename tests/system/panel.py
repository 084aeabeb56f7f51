"""`vexa panel`: who gets in, what passes between a page and the service, and how it ends."""

import gzip
import json
import os
import random
import re
import signal
import socket
import unittest
import urllib.parse

from client_log import config
from harness import (CHANNEL_LIST, TEXT, Story, WebSocket, clean_environment, frame, network, open_connection,
                     read_head, tcp_rows, wait_until)  # fmt: skip
from service_strangers import Stranger

ESTABLISHED = "01"
MASK = "********"
SECRET = "Zwölf-5ecret"
NETWORKS = [network(1, "Airport", {"roam.example": [21]})]
CHANNELS = {"channels": [36, 6], "levels": {"6": {"congestion": 30, "power": 30}, "36": {"congestion": 60, "power": 60}}}
TYPES = {"/": "text/html; charset=utf-8", "/panel.css": "text/css; charset=utf-8",
         "/panel.js": "text/javascript; charset=utf-8"}  # fmt: skip


def user(name, password, **members):
    return {"Type": 1, "CredentialEapMethod": 2, "RealName": "roam.example", "CredentialName": name, "Username": "anna",
            "Password": password, "AutoConnect": False, **members}  # fmt: skip


class Browser:
    """A browser at a panel: it keeps the cookie, and can be made to say anything."""

    def __init__(self, url):
        parts = urllib.parse.urlsplit(url)
        self.port, self.host, self.entry, self.cookie = parts.port, parts.netloc, f"{parts.path}?{parts.query}", None
        self.origin = f"http://{self.host}"

    def fields(self, **fields):
        """As header lines; a list is a field more than once, None is none of it."""
        told = {"Host": self.host, "Cookie": self.cookie, **{name.replace("_", "-"): value for name, value in fields.items()}}
        lines = ((name, line) for name, value in told.items() for line in (value if isinstance(value, list) else [value]))
        return "".join(f"{name}: {line}\r\n" for name, line in lines if line is not None)

    def ask(self, target="/", method="GET", **fields):
        return self.send(f"{method} {target} HTTP/1.1\r\n{self.fields(**fields)}\r\n".encode())

    def send(self, request):
        """Gives the status, the headers and the body of the answer."""
        with open_connection(self.port) as connection, connection.makefile("rb") as stream:
            connection.sendall(request)
            status, headers = read_head(stream)
            return int(status.split()[1]), {k.decode(): v.decode() for k, v in headers.items()}, stream.read()

    def status(self, *arguments, **fields):
        return self.ask(*arguments, **fields)[0]

    def enter(self):
        status, headers, _ = self.ask(self.entry)
        assert status == 303, status
        self.cookie = headers["set-cookie"].partition(";")[0]
        return headers


class Page(WebSocket):
    """A page that is open in a browser."""

    def __init__(self, browser, **options):
        headers = f"Origin: {browser.origin}\r\nCookie: {browser.cookie}\r\n"
        self.heard = []
        super().__init__(browser.port, target="/socket", headers=headers, **options)

    def say(self, port, **message):
        self.send_frame(TEXT, json.dumps({"port": port, "message": message}).encode())

    def command(self, port, command, data=None):
        self.say(port, CommandId=command, **({} if data is None else {"Data": json.dumps(data)}))

    def wait(self, port, name, where=lambda message: True):
        """The next message of the port with this name; those before it are passed over."""
        while True:
            told = json.loads(self.take())
            message = told["message"]
            if (told["port"], message.get("event", message.get("EventId"))) == (port, name) and where(message):
                return message

    def take(self):
        self.heard.append(super().take())
        return self.heard[-1]

    def credentials(self, command="GET_ALL_CREDENTIAL_LIST", data=None):
        self.command("hotspot", command, data)
        return json.loads(self.wait("hotspot", "GET_ALL_CREDENTIAL_LIST")["Data"]) or []


class PanelStory(Story):
    scenario = {"networks": NETWORKS, "spectrum": CHANNELS, "config": config("true")}

    def panel(self, *options, machine=None, **variables):
        environment = clean_environment(VEXA_MACHINE=str(machine or self.machine.folder), **variables)
        self.folder = self.new_folder()
        self.process = self.running("panel", "--recordings", self.folder, *options, environment=environment)
        return Browser(self.process.wait_line("http://"))

    def entered(self, *options):
        browser = self.panel("--no-open", *options)
        browser.enter()
        return browser

    def page(self, browser, **options):
        page = Page(browser, **options)
        self.addCleanup(page.close)
        return page


class Door(PanelStory):
    def setUp(self):
        self.browser = self.panel("--no-open", machine="/nonexistent")

    def test_the_token_lets_in_once(self):
        browser, path = self.browser, self.browser.entry
        self.assertRegex(path, r"\A/\?token=[0-9a-f]{32}\Z")
        for wrong in ("/", "/?token=", path[:-1], path + "0", path + "&a=b", path[:-1] + "x", path.upper(),
                      path.replace("?", "?a=b&"), "/panel.js" + path[1:]):  # fmt: skip
            self.assertEqual(browser.status(wrong), 403, wrong)
        for method in ("HEAD", "POST"):
            self.assertEqual(browser.status(path, method), 403)
        headers = browser.enter()
        self.assertEqual(headers["location"], "/")
        name = f"vexa-panel-{browser.port}"
        self.assertRegex(headers["set-cookie"], rf"\A{name}=[0-9a-f]{{32}}; HttpOnly; SameSite=Strict; Path=/\Z")
        self.assertNotIn(path[-32:], headers["set-cookie"])
        status, again, _ = browser.ask(path)
        self.assertEqual((status, "set-cookie" in again), (303, False))
        self.assertEqual(browser.status(path, Cookie=None), 403)
        for target, kind in TYPES.items():
            status, headers, body = browser.ask(target)
            self.assertEqual((status, headers["content-type"], len(body)), (200, kind, int(headers["content-length"])))
            self.assertTrue(body)

    def test_nothing_without_the_cookie(self):
        browser, other = self.browser, self.panel("--no-open", machine="/nonexistent")
        browser.enter(), other.enter()
        good, bad = browser.cookie, browser.cookie[:-1] + ("0" if browser.cookie[-1] != "0" else "1")
        for cookie in (None, "", bad, good[:-1], good + "0", other.cookie, good.replace("vexa", "Vexa"), good.split("=")[1],
                       f"{other.cookie.split('=')[0]}={good.split('=')[1]}"):  # fmt: skip
            for target in (*TYPES, "/socket", "/recordings/vexa-1.jsonl.gz", "/nothing"):
                self.assertEqual(browser.status(target, Cookie=cookie), 403, (cookie, target))
            with self.assertRaises(ConnectionError):
                self.page_with(cookie)
        for cookie in (f"a=b; {good}", f"{good};c=d", [bad, good], f"{bad}; {good}"):
            self.assertEqual(browser.status(Cookie=cookie), 200, cookie)

    def page_with(self, cookie, **fields):
        asked = Browser(f"{self.browser.origin}/")
        headers = asked.fields(Host=None, **{"Origin": asked.origin, "Cookie": cookie, **fields})
        page = WebSocket(asked.port, target="/socket", headers=headers)
        self.addCleanup(page.close)
        return page

    def test_names_and_pages_of_others(self):
        browser, port = self.browser, self.browser.port
        browser.enter()
        hosts = ["evil.example", f"evil.example:{port}", f"localhost:{port}", "127.0.0.1", f"127.0.0.1:{port + 1}",
                 f"[::1]:{port}", f"127.0.0.1:{port}.", f"0x7f000001:{port}", f"127.1:{port}", "", None,
                 [browser.host, browser.host], [browser.host, "evil.example"]]  # fmt: skip
        for host in hosts:
            self.assertIn(browser.status(Host=host), (400, 403), host)
            self.assertIn(browser.status(browser.entry, Host=host, Cookie=None), (400, 403), host)
        strangers = ["null", "http://evil.example", f"http://localhost:{port}", f"https://{browser.host}",
                     f"http://127.0.0.1:{port + 1}", browser.origin + "/", browser.origin + ".evil.example", "", [browser.origin] * 2]  # fmt: skip
        for origin in strangers:
            self.assertEqual(browser.status(Origin=origin), 403, origin)
        for origin in (*strangers, None):
            with self.assertRaises(ConnectionError, msg=origin):
                self.page_with(browser.cookie, Origin=origin)
        for site, status in {"cross-site": 403, "same-site": 403, "same-origin": 200, "none": 200}.items():
            self.assertEqual(browser.status(Sec_Fetch_Site=site), status)
        self.page_with(browser.cookie)

    def test_every_answer_shuts_the_browser_to_others(self):
        browser = self.browser
        policy = ("default-src 'none'; script-src 'self'; style-src 'self'; img-src 'self' data: blob:; "
                  f"connect-src 'self' ws://{browser.host}; base-uri 'none'; form-action 'none'; frame-ancestors 'none'")  # fmt: skip
        wanted = {
            "content-security-policy": policy, "x-content-type-options": "nosniff", "referrer-policy": "no-referrer",
            "cross-origin-opener-policy": "same-origin", "cross-origin-resource-policy": "same-origin",
            "cache-control": "no-store",
        }  # fmt: skip
        (self.folder / "vexa-1.jsonl.gz").write_bytes(b"recorded")
        answers = [(303, browser.enter())]
        answers += [browser.ask(target)[:2] for target in ("/", "/panel.js", "/recordings/vexa-1.jsonl.gz", "/nothing")]
        answers += [browser.ask("/", "POST")[:2], browser.ask(Cookie=None)[:2], browser.send(b"nonsense\r\n\r\n")[:2]]
        answers += [browser.ask("/" + "x" * 9000)[:2], browser.ask(X="x" * 9000)[:2], browser.ask("/", Content_Length="3")[:2]]
        self.assertEqual([status for status, _ in answers], [303, 200, 200, 200, 404, 405, 403, 400, 431, 431, 400])
        answers.append((101, {k.decode(): v.decode() for k, v in self.page(browser).headers.items()}))
        for status, headers in answers:
            self.assertEqual({name: headers.get(name) for name in wanted}, wanted, status)
            self.assertFalse({name for name in headers if name.startswith("access-control")})
            self.assertIn(headers.get("server", "vexa"), "vexa")

    def test_methods_and_paths(self):
        self.browser.enter()
        for method in ("HEAD", "POST", "PUT", "DELETE", "OPTIONS", "PATCH", "TRACE"):
            status, headers, _ = self.browser.ask("/", method)
            self.assertEqual((status, headers["allow"]), (405, "GET"), method)
        content = random.randbytes(1 << 20)
        (self.folder / "vexa-20260102-030405-2.jsonl.gz").write_bytes(content)
        (self.folder / "vexa-7.jsonl.gz").symlink_to("/etc/passwd")
        (self.folder / "vexa-8.jsonl.gz").mkdir()
        (self.folder / "other.jsonl.gz").write_text("x")
        status, headers, body = self.browser.ask("/recordings/vexa-20260102-030405-2.jsonl.gz")
        self.assertEqual((status, body, headers["content-type"]), (200, content, "application/gzip"))
        self.assertEqual(headers["content-disposition"], 'attachment; filename="vexa-20260102-030405-2.jsonl.gz"')
        inside = urllib.parse.quote(f"../{self.folder.name}/vexa-20260102-030405-2.jsonl.gz", safe="")
        for path in ("", "..", "../etc/passwd", "/etc/passwd", "..%2f..%2fetc%2fpasswd", "vexa-7.jsonl.gz", "vexa-8.jsonl.gz",
                     "other.jsonl.gz", "vexa-.jsonl.gz", "vexa-1.jsonl.gz", "vexa-/../../x.jsonl.gz", "vexa-1%00.jsonl.gz",
                     "vexa-20260102-030405-2.jsonl.gz?a", inside):  # fmt: skip
            self.assertEqual(self.browser.status("/recordings/" + path), 404, path)
        for path in ("/recordings", "//", "/index.html", "/panel.js/", "/%2e%2e/etc/passwd", "/../etc/passwd", "*", "/?a=b"):
            self.assertEqual(self.browser.status(path), 404, path)

    @unittest.skipUnless(os.geteuid() == 0, "only root can be somebody else")
    def test_another_account_gets_nothing(self):
        def enter():
            with self.assertRaises((ConnectionError, OSError)):
                self.browser.enter()
            return True

        with Stranger(enter):
            self.browser.enter()

    def test_it_serves_on_whatever_is_sent(self):
        browser, seeded = self.browser, random.Random(7)
        browser.enter()
        slow = open_connection(browser.port)
        self.addCleanup(slow.close)
        slow.sendall(b"GET / HTTP/1.1\r\nHost: ")
        good = f"GET / HTTP/1.1\r\n{browser.fields()}Upgrade: websocket\r\nConnection: upgrade\r\n\r\n".encode()
        for number in range(2000):
            garbage = bytearray(good if number % 2 else seeded.randbytes(seeded.randrange(200)))
            for _ in range(seeded.randrange(1, 8) if garbage else 0):
                garbage[seeded.randrange(len(garbage))] = seeded.randrange(256)
            with open_connection(browser.port) as connection:
                connection.sendall(garbage)
        crowd = [open_connection(browser.port) for _ in range(300)]
        self.assertEqual(browser.status(), 200)
        for connection in crowd:
            connection.close()
        self.assertEqual(slow.recv(1), b"")  # its time is over, or it had to go
        self.assertEqual(self.process.errors, [])


class Relay(PanelStory):
    def setUp(self):
        self.start(**self.scenario)

    def wait_running(self, page, is_running=True):
        page.wait("panel", "service", lambda message: message["running"] == is_running)

    def open(self, *options):
        browser = self.entered(*options)
        page = self.page(browser)
        first = json.loads(page.take())["message"]
        self.assertEqual(first["event"], "service")
        if not first["running"]:
            self.wait_running(page)
        return browser, page

    def test_events_of_both_ports_come_as_they_are(self):
        browser, page = self.open()
        running = {"event": "service", "running": True, "hotspot": True}
        self.assertEqual(json.loads(self.page(browser).take())["message"], running)
        page.command("spectral", "GET_CHANNEL_LIST")
        listed = page.wait("spectral", CHANNEL_LIST)
        self.assertEqual({entry["Channel"] for entry in json.loads(listed["Data"])}, {6, 36})
        self.assertEqual(set(listed), {"EventId", "Data", "Source", "Timestamp"})
        page.command("spectral", "FULL_SCAN")
        page.wait("spectral", "SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE")
        page.command("hotspot", "GET_RADIO")
        self.assertEqual(page.wait("hotspot", "GET_RADIO")["Data"], "true\n")
        page.command("spectral", "STOP_SCAN")

    def test_no_password_reaches_a_page(self):
        browser, page = self.open()
        for name, password in (("Roam", SECRET), ("Lines", f"one\n{SECRET}\n"), ("None", "")):
            data = user(name, password, RealName="roam.example" if name == "Lines" else name)
            page.credentials("ADD_CREDENTIAL", data)
        self.assertIn(SECRET, str(self.machine.hs20().credentials()))
        self.assertEqual({entry["CredentialName"]: entry["Password"] for entry in page.credentials()},
                         {"Roam": MASK, "Lines": MASK, "None": ""})  # fmt: skip
        self.control.do("reportNetworks")
        page.command("hotspot", "CONNECT_NETWORK", {"NetWorkName": "Airport"})
        seen = page.wait("panel", "log", lambda message: any("password=" in line for line in message["lines"]))
        self.assertTrue(any(line.endswith("password=" + MASK) for line in seen["lines"]), seen)
        self.assertIn(SECRET, self.done("log", "--no-redact"))
        late = self.page(browser)
        log = late.wait("panel", "log")
        self.assertTrue(log["on"])
        self.assertIn("password=" + MASK, str(log["lines"]))
        for heard in page.heard + late.heard:
            self.assertNotIn("5ecret", heard.decode())

    def test_an_edit_keeps_a_password_that_it_does_not_know(self):
        _, page = self.open()
        (stored,) = page.credentials("ADD_CREDENTIAL", user("Roam", SECRET))
        page.credentials("EDIT_CREDENTIAL", {**user("Other", MASK), "Id": stored["Id"]})
        page.credentials("EDIT_CREDENTIAL", {**user("Third", MASK), "Id": stored["Id"]})
        (edited,) = self.machine.hs20().credentials()
        self.assertEqual((edited["CredentialName"], edited["Password"]), ("Third", SECRET))
        page.command("hotspot", "EDIT_CREDENTIAL", {**user("Fourth", MASK), "Id": 99})
        self.assertIn("password is not known", page.wait("panel", "failure")["text"])
        page.credentials("EDIT_CREDENTIAL", {**user("Fifth", "new"), "Id": stored["Id"]})
        (edited,) = self.machine.hs20().credentials()
        self.assertEqual((edited["CredentialName"], edited["Password"]), ("Fifth", "new"))

    def test_only_commands_that_the_port_knows_pass(self):
        _, page = self.open()
        before = self.machine.output()
        for message in ({"CommandId": "FORMAT"}, {"CommandId": "GET_RADIO"}, {"CommandId": 7}, {"CommandId": "full_scan"},
                        {"CommandId": "STOP_SCAN", "Data": {"a": 1}}, {"commandid": "STOP_SCAN"}, {}):  # fmt: skip
            page.say("spectral", **message)
        page.say("control", CommandId="STOP_SCAN")
        page.say("panel", command="stop")
        for text in (b"", b"[", b"[]", b"null", b'{"port":"spectral"}', b'{"port":7,"message":{"CommandId":"STOP_SCAN"}}',
                     b'{"port":"spectral","message":[]}', b"[" * 5000, b"\0"):  # fmt: skip
            page.send_frame(TEXT, text)
        page.say("spectral", CommandId="GET_CURRENT_CHANNEL", More="x")
        page.wait("spectral", "SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA")
        told = re.findall("request id = (.*)\n", self.machine.output()[len(before) :])
        self.assertEqual(told, ["GET_CURRENT_CHANNEL"])
        # The head alone: one who still sends may be cut off before he has read why.
        head = len(frame(TEXT, b"", True, bytes(4))) + 8  # of a length that takes 8 bytes more
        page.socket.sendall(frame(TEXT, bytes((1 << 20) + 1), True, bytes(4))[:head])
        self.assertEqual(page.wait_closed(), 1009)

    def test_a_service_that_goes_and_comes_back(self):
        _, page = self.open()
        os.kill(self.machine.service_pid(), signal.SIGKILL)
        self.wait_running(page, False)
        page.command("hotspot", "GET_RADIO")
        self.machine.parent.wait()
        self.start(folder=self.machine.folder, **self.scenario)
        self.wait_running(page)
        page.command("hotspot", "GET_RADIO")
        page.wait("hotspot", "GET_RADIO")

    def test_each_page_of_each_panel_hears_everything(self):
        browser, page = self.open()
        second = self.page(browser)
        other, third = self.open()
        self.assertNotEqual(other.port, browser.port)
        self.assertNotEqual(other.cookie.split("=")[0], browser.cookie.split("=")[0])
        third.command("hotspot", "GET_RADIO")
        for each in (page, second, third):
            each.wait("hotspot", "GET_RADIO")

    def test_a_recording(self):
        browser, page = self.open()
        page.credentials("ADD_CREDENTIAL", user("Roam", SECRET))
        page.say("panel", command="startRecording")
        name = page.wait("panel", "recording")["name"]
        self.assertRegex(name, r"\Avexa-\d{8}-\d{6}\.jsonl\.gz\Z")
        told = page.wait("panel", "recording", lambda message: message["events"] > 5 and message["elapsed"] >= 1000)
        self.assertTrue(told["active"])
        late = self.page(browser)
        self.assertEqual(late.wait("panel", "recording")["name"], name)
        page.say("panel", command="startRecording")
        page.say("panel", command="stopRecording")
        self.assertFalse(late.wait("panel", "recording", lambda message: not message["active"])["events"])
        (file,) = late.wait("panel", "recordings", lambda message: message["files"])["files"]
        content = browser.ask(f"/recordings/{name}")[2]
        self.assertEqual((file["name"], file["bytes"]), (name, len(content)))
        path = self.folder / name
        self.assertEqual((path.read_bytes(), path.stat().st_mode & 0o777), (content, 0o600))
        told = json.loads(self.done("stats", path, "--json"))["channels"]
        self.assertEqual([entry["channel"] for entry in told], [6, 36])
        self.assertNotIn("5ecret", gzip.decompress(path.read_bytes()).decode())
        self.folder.joinpath(name).unlink()
        os.rmdir(self.folder)
        page.say("panel", command="startRecording")
        self.assertIn("cannot be written", page.wait("panel", "failure")["text"])


class End(PanelStory):
    def test_by_the_user_with_a_recording_that_is_whole(self):
        self.start(**self.scenario)
        page = self.page(self.entered())
        page.wait("panel", "recordings")
        page.say("panel", command="startRecording")
        page.wait("panel", "recording", lambda message: message["events"])
        self.assertEqual(self.process.stop(signal.SIGINT), 130)
        self.assertEqual(page.wait_closed(), 1001)
        (path,) = self.folder.iterdir()
        self.assertIn('"end":true', gzip.decompress(path.read_bytes()).decode())

    def test_when_the_last_page_has_been_away_for_a_while(self):
        browser = self.panel("--no-open", "--linger", "1", machine="/nonexistent")
        browser.enter()
        for _ in range(2):
            first, second = Page(browser), Page(browser)
            first.close()
            second.take()
            second.close()
        self.assertEqual((self.process.wait(), self.process.errors), (0, []))

    def test_not_while_a_page_sleeps_which_is_cut_off(self):
        self.start(**self.scenario)
        browser = self.entered("--linger", "0")
        asleep, theirs = self.page(browser, reads=False, receive_buffer=4096), self.machine.hs20()
        for number in range(60):
            theirs.credentials("ADD_CREDENTIAL", user(f"{number}".ljust(120), "x" * 60, RealName=f"{number}".ljust(120)))
        wait_until(lambda: theirs.credentials() and ESTABLISHED not in [state for _, state in tcp_rows(browser.port)],
                   "the end of the connection", timeout=20)  # fmt: skip
        awake = self.page(browser)
        awake.wait("panel", "recordings")
        awake.close()
        self.assertEqual((self.process.wait(), self.process.errors), (0, []))

    def test_what_is_wrong_is_told(self):
        with socket.create_server(("127.0.0.1", 0)) as taken:
            port = taken.getsockname()[1]
            told = self.refused(1, "panel", "--no-open", "--port", port, VEXA_MACHINE="/nonexistent")
            self.assertEqual(told, f"vexa: the port {port} is not free")
        told = self.refused(1, "panel", "--recordings", "/nonexistent", VEXA_MACHINE="/nonexistent")
        self.assertEqual(told, 'vexa: there is no folder "/nonexistent"')


class Opening(PanelStory):
    def test_the_machine_of_the_demo(self):
        temporary = self.new_folder()
        process = self.running("panel", "--demo", "--no-open", environment=clean_environment(TMPDIR=str(temporary)))
        browser = Browser(process.wait_line("http://"))
        browser.enter()
        page = self.page(browser)
        wait_until(lambda: len(page.credentials()) == 3, "the credentials")
        self.assertEqual((process.stop(signal.SIGINT), process.errors, [*temporary.iterdir()]), (130, [], []))

    def test_the_browser_gets_the_address(self):
        folder = self.new_folder()
        opener = folder / "xdg-open"
        opener.write_text(f'#!/bin/sh\necho "$#" "$1" >{folder}/new\nmv {folder}/new {folder}/opened\n')
        opener.chmod(0o700)
        browser = self.panel(machine="/nonexistent", PATH=f"{folder}:{os.environ['PATH']}")
        wait_until((folder / "opened").exists, "the browser")
        self.assertEqual((folder / "opened").read_text(), f"1 {browser.origin}{browser.entry}\n")
        self.process.wait_line("It opens in the browser")
        self.panel(machine="/nonexistent", PATH=str(self.new_folder()))
        self.process.wait_line("Open this address in a browser")
