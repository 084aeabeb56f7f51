"""The password prompt of `vexa credential`, in a terminal."""

import os
import signal
import termios

from harness import Story, wait_until

PROMPT, AGAIN = b"Password: $", b"Again: $"


class PasswordStory(Story):
    def setUp(self):
        self.start()

    def asking(self, *command):
        """It waits for the password."""
        command = command or ("add", "--realm", "r", "--username", "u")
        terminal = self.terminal("credential", *command, "--machine", self.machine.folder)
        self.wait_prompt(terminal, PROMPT)
        return terminal

    def wait_prompt(self, terminal, prompt):
        terminal.read_until(prompt)
        wait_until(lambda: not terminal.settings()[3] & termios.ECHO, "a silent terminal")

    def answer(self, terminal, *answers):
        """To the first prompt, which is there, and to those that follow."""
        for number, text in enumerate(answers):
            if number:
                self.wait_prompt(terminal, AGAIN)
            terminal.press(text + b"\n")

    def assert_end(self, terminal, exit_code, words, password=""):
        """With this last line, and this one stored; None for a service that can't be asked."""
        self.assertEqual(terminal.finish(), exit_code, terminal.screen)
        self.assertIn(words, terminal.last_line())
        self.assertEqual(terminal.settings(), terminal.before)
        if password is not None:
            stored = [entry["password"] for entry in self.told("credentials", "--show-passwords")]
            self.assertEqual(stored, [password] if password else [])

    def test_it_is_asked_for_twice_and_not_shown(self):
        terminal = self.asking()
        self.answer(terminal, "hüsch".encode(), "hüsch".encode())
        self.assert_end(terminal, 0, "Added credential 1", "hüsch")
        self.assertNotIn("hüsch".encode(), terminal.screen)
        terminal = self.asking("edit", "r", "--ask-password")
        self.answer(terminal, b"new", b"new")
        self.assert_end(terminal, 0, 'Changed credential 1 "r": password.', "new")

    def test_it_can_be_mended_while_it_is_typed(self):
        terminal = self.asking()
        self.answer(terminal, b"secrex\x7ft", b"secret")
        self.assert_end(terminal, 0, "Added credential 1", "secret")

    def test_what_stores_nothing(self):
        for answers, words in (((b"one", b"two"), "differ"), ((b"",), "no password"), ((b"\x04",), "no password")):
            with self.subTest(answers):
                terminal = self.asking()
                self.answer(terminal, *answers)
                self.assert_end(terminal, 1, words)

    def test_ctrl_c_and_every_signal_that_asks_for_the_end_give_the_terminal_back(self):
        for typed in (b"\x03", b"half a pass\x03"):
            terminal = self.asking()
            terminal.press(typed)
            self.assert_end(terminal, 130, "stopped")
            self.assertNotIn(b"half", terminal.screen)
        for number in (signal.SIGTERM, signal.SIGHUP):
            terminal = self.asking()
            terminal.process.send_signal(number)
            self.assert_end(terminal, 128 + number, "stopped")

    def test_a_suspended_one_gives_the_terminal_back_and_asks_again(self):
        terminal = self.asking()
        terminal.suspend_and_resume()
        self.wait_prompt(terminal, rb"Password: [^P]*Password: $")
        self.answer(terminal, b"again", b"again")
        self.assert_end(terminal, 0, "Added credential 1", "again")

    def test_a_service_that_dies_meanwhile_is_told(self):
        terminal = self.asking()
        self.answer(terminal, b"x")
        self.wait_prompt(terminal, AGAIN)
        os.kill(self.machine.service_pid(), signal.SIGKILL)
        self.answer(terminal, b"x")
        self.assert_end(terminal, 1, "no service answers", None)
