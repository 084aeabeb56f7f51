"""What `vexa` gives to shells: completion in the shells themselves, and the manual pages."""

import re
import shutil
import socket
import subprocess

from client_credentials import CredentialStory
from harness import Story, Terminal, clean_environment, network, program, run_client, wait_until

ODD = "Gate: B's $HOME \\2"
FUNCTION = """vexa() { if [ "$1" = __complete ]; then command vexa "$@"; else printf '<%s>' "$@"; echo; fi; }"""
IN_FISH = """function vexa; test "$argv[1]" = __complete; and command vexa $argv; or begin; printf '<%s>' $argv; echo; end; end"""
SHELLS = {
    "bash": (["bash", "--norc", "--noprofile", "-i"], FUNCTION),
    "zsh": (["zsh", "-f", "-i"], "autoload -Uz compinit; compinit -D -u; " + FUNCTION),
    "fish": (["fish", "--no-config", "-i"], IN_FISH),
}
# What is typed, and the arguments that the program gets.
LINES = [
    ("con\tCaf\t", ["connect", "Café"]),
    ("connect Air\t", ["connect", "Airport Free"]),
    ("connect Airport\\ F\t", ["connect", "Airport Free"]),
    ('connect "Air\t', ["connect", "Airport Free"]),
    ("connect 'Airport F\t", ["connect", "Airport Free"]),
    ("connect Gat\t", ["connect", ODD]),
    ("connect Gate:\t", ["connect", ODD]),
    ('connect "Gate:\t', ["connect", ODD]),
    ("connect 'Gat\t", ["connect", ODD]),
    ("disconnect --timeout 5 Gat\t", ["disconnect", "--timeout", "5", ODD]),
    ("credential del\tTwo\t", ["credential", "delete", "Two words"]),
    ("credential add --meth\ttt\t", ["credential", "add", "--method", "ttls"]),
    ("status --mach\t/de\t", ["status", "--machine", "/dev"]),
    ("credential add --realm /de\t", ["credential", "add", "--realm", "/de"]),
    ("completion po\t", ["completion", "powershell"]),
]


class InShells(CredentialStory):
    scenario = {"networks": [network(i, name, {}) for i, name in enumerate(("Airport Free", "Café", ODD))]}

    def shell(self, name):
        arguments, function = SHELLS[name]
        path = self.new_folder() / "script"
        path.write_text(self.done("completion", name))
        bin_folder = program("vexa").rpartition("/")[0]
        environment = clean_environment(VEXA_MACHINE=str(self.machine.folder), LC_ALL="C.UTF-8", TERM="xterm")
        environment |= {"PATH": f"{bin_folder}:{environment['PATH']}", "HOME": str(path.parent)}
        terminal = Terminal(arguments, environment, columns=200)
        self.addCleanup(terminal.close)
        terminal.press(f"{function}; source {path}; echo REA''DY\n".encode())
        terminal.read_until(b"READY")
        return terminal

    def completed(self, shell, typed):
        """The arguments that come of what is typed, an option and its value apart; None if the line is not at its end."""
        shell.screen = b""
        shell.press(f"vexa {typed}\n".encode())
        try:
            shell.read_until(rb"<[^\r\n]*>\r?\n", timeout=5)
        except AssertionError:
            return None
        (line,) = re.findall(r"<([^\r\n]*)>\r?\n", shell.screen.decode())
        return re.sub(r"><(--\w+)=", r"><\1><", line).rstrip("/").split("><")

    def test_lines_are_completed_by_the_shells_themselves(self):
        wait_until(lambda: self.control.do("reportNetworks") or len(self.told("networks")) == 3, "the networks")
        self.add_user("Two words")
        for name in SHELLS:
            if not shutil.which(name):
                self.skipTest(f"there is no {name} here")
            shell = self.shell(name)
            for typed, arguments in LINES:
                # On a busy machine the service may answer too late, which may leave a quote open.
                if self.completed(shell, typed) != arguments:
                    shell = self.shell(name)
                    self.assertEqual(self.completed(shell, typed), arguments, (name, typed))


class PowerShell(Story):
    def test_it_can_read_the_tables(self):
        """It isn't here to be asked. Two keys that differ in case alone are one too many for it, and some versions read
        what isn't ASCII in a code page."""
        script = self.done("completion", "powershell", VEXA_MACHINE=None)
        self.assertTrue(script.isascii())
        tables = [re.findall(r"[{;] '([^']+)' = '", line.lower()) for line in script.splitlines() if "[ordered]@{" in line]
        self.assertTrue(any("--machine" in keys for keys in tables))
        self.assertEqual([keys for keys in tables if len(keys) > len(set(keys))], [])


class Asking(Story):
    def test_names_are_not_waited_for(self):
        with socket.create_server(("127.0.0.1", 0)) as mute:
            for port in ((), ("--hs20-port", mute.getsockname()[1])):
                told = run_client("__complete", "networks", "connect", *port, VEXA_MACHINE="/nonexistent")
                self.assertEqual((told.returncode, told.stdout, told.stderr), (0, "", ""))


class Pages(Story):
    def test_each_command_has_a_page_that_troff_takes_and_that_names_its_options(self):
        folder = self.new_folder()
        self.done("__shell-files", folder, VEXA_MACHINE=None)
        pages = {path.stem: path for path in (folder / "man" / "man1").iterdir()}
        checks = [["mandoc", "-T", "lint", "-W", "warning"], ["groff", "-man", "-ww", "-z", "-K", "utf8", "-T", "utf8"]]
        for check in checks:
            told = subprocess.run([*check, *pages.values()], capture_output=True, text=True)
            self.assertEqual((told.stdout, told.stderr), ("", ""))
        script = (folder / "fish/vendor_completions.d/vexa.fish").read_text()
        options = re.findall(r"__vexa_at \"([^\"]*)\"'.* -l (\S+) ", script)
        self.assertEqual(set(pages), {"vexa", *("vexa-" + path.replace(" ", "-") for path, _ in options if path)})
        for path, option in options:
            text = pages["-".join(["vexa", *path.split()])].read_text()
            self.assertIn("\\-\\-" + option.replace("-", "\\-"), text, path)
        self.assertEqual(self.done("man", "credential", "add", VEXA_MACHINE=None), pages["vexa-credential-add"].read_text())
        self.assertIn('no command "nonsense"', self.refused(2, "man", "nonsense", VEXA_MACHINE=None))
