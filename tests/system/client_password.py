"""The password prompt of `vexa credential`, in a terminal."""

import json
import os
import signal
import subprocess
import termios
import unittest

from client_demo import Terminal, process_state
from harness import Machine, clean_environment, program, wait_until


class PasswordTest(unittest.TestCase):
    def setUp(self):
        self.machine = self.enterContext(Machine({"speed": 20}))

    def terminal(self, *arguments):
        command = [program("vexa"), "credential", *arguments, "--machine", str(self.machine.folder)]
        terminal = Terminal(command, clean_environment())
        self.addCleanup(terminal.close)
        return terminal

    def adding(self):
        return self.terminal("add", "--realm", "r", "--username", "u")

    def answer(self, terminal, prompt, text):
        terminal.read_until(prompt)
        wait_until(lambda: not self.echoes(terminal), "a silent terminal")
        terminal.press(text + b"\n")

    @staticmethod
    def echoes(terminal):
        return bool(terminal.settings()[3] & termios.ECHO)

    def passwords(self):
        command = [program("vexa"), "credentials", "--json", "--show-passwords"]
        output = subprocess.check_output([*command, "--machine", str(self.machine.folder)], env=clean_environment())
        return [entry["password"] for entry in json.loads(output)]

    def assert_end(self, terminal, exit_code, words):
        self.assertEqual(terminal.finish(), exit_code, terminal.screen)
        self.assertIn(words, terminal.last_line())
        self.assertEqual(terminal.settings(), terminal.before)

    def test_it_is_asked_for_twice_and_not_shown(self):
        terminal = self.adding()
        self.answer(terminal, b"Password: $", "hüsch".encode())
        self.answer(terminal, b"Again: $", "hüsch".encode())
        self.assert_end(terminal, 0, "Added credential 1")
        self.assertNotIn("hüsch".encode(), terminal.screen)
        self.assertEqual(self.passwords(), ["hüsch"])

    def test_it_can_be_mended_while_it_is_typed(self):
        terminal = self.adding()
        self.answer(terminal, b"Password: $", b"secrex\x7ft")
        self.answer(terminal, b"Again: $", b"secret")
        self.assert_end(terminal, 0, "Added credential 1")
        self.assertEqual(self.passwords(), ["secret"])

    def test_answers_that_differ_store_nothing(self):
        terminal = self.adding()
        self.answer(terminal, b"Password: $", b"one")
        self.answer(terminal, b"Again: $", b"two")
        self.assert_end(terminal, 1, "differ")
        self.assertEqual(self.passwords(), [])

    def test_no_answer_stores_nothing(self):
        for keys in (b"", b"\x04"):
            terminal = self.adding()
            self.answer(terminal, b"Password: $", keys)
            self.assert_end(terminal, 1, "no password")
        self.assertEqual(self.passwords(), [])

    def test_ctrl_c_gives_the_terminal_back(self):
        for typed in (b"", b"half a pass"):
            terminal = self.adding()
            terminal.read_until(b"Password: $")
            wait_until(lambda: not self.echoes(terminal), "a silent terminal")
            terminal.press(typed + b"\x03")
            self.assert_end(terminal, 1, "stopped")
            self.assertNotIn(b"half", terminal.screen)
        self.assertEqual(self.passwords(), [])

    def test_so_does_every_signal_that_asks_for_the_end(self):
        for number in (signal.SIGTERM, signal.SIGHUP):
            terminal = self.adding()
            terminal.read_until(b"Password: $")
            wait_until(lambda: not self.echoes(terminal), "a silent terminal")
            terminal.process.send_signal(number)
            self.assert_end(terminal, 1, "stopped")

    def test_a_suspended_one_gives_the_terminal_back_and_asks_again(self):
        terminal = self.adding()
        terminal.read_until(b"Password: $")
        wait_until(lambda: not self.echoes(terminal), "a silent terminal")
        terminal.press(b"\x1a")
        wait_until(lambda: process_state(terminal.process.pid) == "T", "the stop")
        self.assertEqual(terminal.settings(), terminal.before)
        terminal.process.send_signal(signal.SIGCONT)
        self.answer(terminal, rb"Password: [^P]*Password: $", b"again")
        self.answer(terminal, b"Again: $", b"again")
        self.assert_end(terminal, 0, "Added credential 1")
        self.assertEqual(self.passwords(), ["again"])

    def test_a_new_password_is_asked_for_when_told(self):
        self.test_it_is_asked_for_twice_and_not_shown()
        terminal = self.terminal("edit", "r", "--ask-password")
        self.answer(terminal, b"Password: $", b"new")
        self.answer(terminal, b"Again: $", b"new")
        self.assert_end(terminal, 0, 'Changed credential 1 "r": password.')
        self.assertEqual(self.passwords(), ["new"])

    def test_a_service_that_dies_meanwhile_is_told(self):
        terminal = self.adding()
        self.answer(terminal, b"Password: $", b"x")
        terminal.read_until(b"Again: $")
        os.kill(self.machine.service_pid(), signal.SIGKILL)
        self.answer(terminal, b"Again: $", b"x")
        self.assert_end(terminal, 1, "no service answers")


if __name__ == "__main__":
    unittest.main()
