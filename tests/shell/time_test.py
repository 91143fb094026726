"""What clocks do while the shell waits: for a line at the prompt, for input
from a pipe, for a key. Nothing here looks at when something happens.

Usage: time_test.py SHELL TREE
"""

import fcntl
import os
import pathlib
import signal
import struct
import subprocess
import sys
import tempfile
import termios
import unittest

from terminal import Terminal

SHELL = os.path.abspath(sys.argv[1])
SECONDS = 20

TICKING = "Beat start; Clock a endless; Clock a every 50 ms do "


class Time(unittest.TestCase):
    def setUp(self):
        self.holder = tempfile.TemporaryDirectory(prefix="zt_time_")
        self.directory = pathlib.Path(self.holder.name).resolve()
        self.addCleanup(self.holder.cleanup)

    def terminal(self, *arguments, columns=80, kind="xterm"):
        environment = {"XDG_STATE_HOME": str(self.directory / "state"),
                       "HOME": str(self.directory), "TERM": kind,
                       "LC_ALL": "C.UTF-8"}
        return Terminal([SHELL, *arguments], self.directory, environment, 24,
                        columns)

    def prompt(self, **kind):
        terminal = self.terminal(**kind)
        terminal.wait_for("ztsh> ")
        return terminal

    def piped(self, *arguments):
        return subprocess.Popen([SHELL, *arguments], cwd=self.directory,
                                stdin=subprocess.PIPE, stdout=subprocess.PIPE,
                                stderr=subprocess.PIPE, text=True)

    def say(self, shell, text):
        shell.stdin.write(text)
        shell.stdin.flush()

    # At the prompt

    def test_the_line_being_typed_comes_back(self):
        terminal = self.prompt()
        terminal.type(TICKING + "Echo tick; Clock a start\r")
        terminal.wait_for("tick\r\n")
        terminal.type("Echo o")
        terminal.wait_for("Echo o")
        for _ in range(3):
            terminal.wait_for("\r\x1b[Jtick\r\n")
            terminal.wait_for("ztsh> Echo o")
        terminal.type("n\r")
        terminal.wait_for("on\r\n")
        terminal.type("Clock a stop; Quit\r")
        self.assertEqual(terminal.end(), 0)

    def test_a_line_of_several_rows_goes_and_comes_back_whole(self):
        terminal = self.prompt(columns=20)
        terminal.type(TICKING + "Echo tick; Clock a start\r")
        terminal.wait_for("tick\r\n")
        terminal.type("Echo 7890123456789012345678901234567890")
        for _ in range(2):
            terminal.wait_for("\x1b[2A\r\x1b[Jtick\r\n")
            terminal.wait_for("ztsh> Echo 789012345")
        terminal.type("\r")
        terminal.wait_for("7890123456789012345678901234567890\r\n")
        terminal.type("Quit\r")
        self.assertEqual(terminal.end(), 0)

    def test_what_cannot_be_redrawn_is_left_behind(self):
        terminal = self.prompt(kind="dumb")
        terminal.type("Beat start; Clock a from 0 to 0.1 s; "
                      "Clock a at 0.1 s do Echo tick; Clock a start\r")
        terminal.wait_for("\ntick\r\n")
        terminal.wait_for("ztsh> ")
        terminal.type("Quit\r")
        self.assertEqual(terminal.end(), 0)
        self.assertNotIn("\x1b[J", terminal.seen)

    def test_a_statement_that_is_due_may_end_the_shell(self):
        terminal = self.prompt()
        terminal.type("Beat start; Clock a from 0 to 0.1 s; "
                      "Clock a at 0.1 s do Quit 9; Clock a start\r")
        self.assertEqual(terminal.end(), 9)

    def test_an_interrupt_ends_a_wait_and_not_the_shell(self):
        terminal = self.prompt()
        terminal.type(TICKING + "Echo tick; Clock a start\r")
        for wait in ("Wait 1 hour", "Wait until a stops"):
            terminal.type(wait + "\r")
            # Without a prompt in between, so it waits by now.
            terminal.wait_for("\ntick\r\ntick\r\n")
            terminal.type("\x03")
            terminal.wait_for("ztsh> ")
        terminal.type("Quit\r")
        self.assertEqual(terminal.end(), 0)

    def test_an_interrupt_ends_what_was_due(self):
        terminal = self.prompt()
        terminal.type("Beat start; Clock a from 0 to 0.1 s\r")
        terminal.wait_for("\nztsh> ")
        terminal.type("Clock a at 0.1 s do begin\r")
        terminal.wait_for("....> ")
        terminal.type("Echo sta''rted; Wait 1 hour\r")
        terminal.wait_for("....> ")
        terminal.type("end; Clock a start\r")
        terminal.wait_for("started\r\n")
        terminal.type("\x03")
        terminal.wait_for("ztsh> ")
        terminal.type("Echo o''n\r")
        terminal.wait_for("\non\r\n")
        terminal.type("Quit\r")
        self.assertEqual(terminal.end(), 0)

    def test_the_window_may_change_while_a_line_is_typed(self):
        terminal = self.prompt(columns=20)
        terminal.type("Echo 78901234567890")
        terminal.wait_for("67890")
        fcntl.ioctl(terminal.master, termios.TIOCSWINSZ,
                    struct.pack("HHHH", 24, 60, 0, 0))
        terminal.type("1\r")
        terminal.wait_for("\n789012345678901\r\n")
        terminal.type("Quit\r")
        self.assertEqual(terminal.end(), 0)

    # A live line

    def test_a_key_ends_the_live_line(self):
        for key in ("x", "\x1b[A"):
            terminal = self.prompt()
            terminal.type("Shuttle a in 0 out 1:00 repeat swing play watch\r")
            terminal.wait_for("no such action")
            terminal.wait_for("ztsh> ")
            terminal.type("Shuttle a in 0 out 1:00 repeat swing play\r")
            terminal.wait_for("\nztsh> ")
            terminal.type("Shuttle a watch\r")
            for _ in range(3):
                terminal.wait_for("\r\x1b[Ka: 00:00:0")
            terminal.type(key)
            terminal.wait_for("swing\r\n")
            terminal.wait_for("ztsh> ")
            terminal.type("Echo o''n\r")
            terminal.wait_for("\non\r\n")
            terminal.type("Quit\r")
            self.assertEqual(terminal.end(), 1)

    def test_the_live_line_ends_with_what_it_shows(self):
        terminal = self.terminal(
            "-c", "Shuttle a out 0:10 play; Shuttle a watch; Echo on; "
            "Beat start; Clock b from 0.2 s to 0; Clock b start; "
            "Clock b watch; Echo still on")
        terminal.wait_for("\r\x1b[Ka: 00:00:00:10 stop, ")
        terminal.wait_for("once\r\non\r\n")
        terminal.wait_for("\r\x1b[Kb: 00:00:00:00 stopped, ")
        terminal.wait_for("\r\nstill on\r\n")
        self.assertEqual(terminal.end(), 0)

    def test_what_is_due_is_run_above_the_live_line(self):
        terminal = self.terminal(
            "-c", TICKING + "Echo tick; Clock a start; Clock a watch; Echo on")
        terminal.wait_for("\r\x1b[Ka: 00:00:")
        for _ in range(3):
            terminal.wait_for("\r\x1b[Ktick\r\n")
            terminal.wait_for("\r\x1b[Ka: 00:00:")
        terminal.type("x")
        terminal.wait_for("running, endless\r\non\r\n")
        self.assertEqual(terminal.end(), 0)

    def test_what_is_watched_may_be_forgotten(self):
        terminal = self.terminal(
            "-c", "Beat start; Clock a from 0 to 0.1 s; Shuttle a in 0 out "
            "1:00 repeat loop play; Clock a at 0.1 s do begin; Shuttle a free; "
            "Clock a free; end; Clock a start; Shuttle a watch; Clock a watch")
        terminal.wait_for("\r\x1b[Ka: forgotten\r\n")
        self.assertEqual(terminal.end(), 1)
        self.assertIn("no clock is named a", terminal.seen)

    def test_an_interrupt_ends_the_live_line(self):
        terminal = self.terminal(
            "-c", "Shuttle a out 1:00 repeat loop play; Shuttle a watch; "
            "Echo no")
        terminal.wait_for("\r\x1b[Ka: ")
        terminal.type("\x03")
        self.assertEqual(terminal.end(), 130)
        self.assertNotIn("no\r", terminal.seen)

    def test_the_terminal_is_given_back(self):
        terminal = self.terminal(
            "-c", "Shuttle a out 1:00 repeat loop play; Shuttle a watch; "
            "System 'stty -a | tr \\; \"\\n\" | grep -o \"..\\?canon\\|.echo \"'")
        terminal.wait_for("\r\x1b[Ka: ")
        terminal.type("x")
        terminal.wait_for(" icanon")
        terminal.wait_for(" echo ")
        self.assertEqual(terminal.end(), 0)

    # On a pipe

    def test_clocks_run_while_a_pipe_says_nothing(self):
        shell = self.piped()
        self.say(shell, TICKING + "Echo tick; Clock a start\nEcho half a")
        for _ in range(3):
            self.assertEqual(shell.stderr.readline(), "tick\n")
        self.say(shell, " statement\nClock a stop; Wait until a stops\n")
        _, errors = shell.communicate(timeout=SECONDS)
        self.assertEqual(errors.replace("tick\n", ""), "half a statement\n")
        self.assertEqual(shell.returncode, 0)

    def test_a_statement_that_is_due_may_end_the_input(self):
        for input_word in ("", "Include - ;"):
            shell = self.piped(*(["-c", "Include -; Echo no"] if input_word
                                 else []))
            self.say(shell, "Beat start; Clock a from 0 to 50 ms\n"
                     "Clock a at 50 ms do Quit 4; Clock a start\nEcho half")
            self.assertEqual(shell.wait(timeout=SECONDS), 4)
            self.assertEqual(shell.stderr.read(), "")
            for stream in (shell.stdin, shell.stdout, shell.stderr):
                try:
                    stream.close()
                except BrokenPipeError:
                    pass

    def test_signals_end_a_wait(self):
        for number in (signal.SIGINT, signal.SIGTERM):
            shell = self.piped("-c", "Beat start; Clock a endless; Clock a "
                               "start; Echo on; Wait until a stops; Echo no")
            self.assertEqual(shell.stderr.readline(), "on\n")
            shell.send_signal(number)
            _, errors = shell.communicate(timeout=SECONDS)
            self.assertEqual((shell.returncode, errors), (128 + number, ""))

    def test_many_beats_lose_no_input(self):
        shell = self.piped()
        statements = "".join(f"Set v{i} {i}; Echo $v{i}\n"
                             for i in range(20000))
        _, errors = shell.communicate(
            "Beat start; Clock a endless; Clock a every 4 ms do Set w 1\n"
            "Clock a start\n" + statements, timeout=SECONDS * 3)
        self.assertEqual(errors, "".join(f"{i}\n" for i in range(20000)))
        self.assertEqual(shell.returncode, 0)

    def test_workers_and_commands_do_not_mind_the_beat(self):
        shell = self.piped("--jobs", "2")
        output, errors = shell.communicate(
            "Beat start; Clock a endless; Clock a start\n"
            "Frames 1 6 begin\n  System sleep 0.05 && echo $frame\n"
            "  Wait 20 ms\nend\n"
            "System sleep 0.1 && echo done\n", timeout=SECONDS)
        self.assertEqual(output, "0001\n0002\n0003\n0004\n0005\n0006\ndone\n")
        self.assertEqual((shell.returncode, errors), (0, ""))


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
