"""Playing with somebody at the terminal, and playing that is interrupted.

Usage: playing_test.py SHELL TREE
"""

import os
import pathlib
import signal
import subprocess
import sys
import tempfile
import time
import unittest

from terminal import Terminal

SHELL = os.path.abspath(sys.argv[1])
SECONDS = 20


class Playing(unittest.TestCase):
    def setUp(self):
        self.holder = tempfile.TemporaryDirectory(prefix="zt_playing_")
        self.directory = pathlib.Path(self.holder.name).resolve()
        self.addCleanup(self.holder.cleanup)

    def prompt(self, kind="xterm"):
        environment = {"XDG_STATE_HOME": str(self.directory / "state"),
                       "HOME": str(self.directory), "TERM": kind,
                       "ZT_AUDIO": "null", "LC_ALL": "C.UTF-8"}
        terminal = Terminal([SHELL], self.directory, environment)
        terminal.wait_for("ztsh> ")
        return terminal

    def test_a_bar_shows_where_the_sound_stands(self):
        terminal = self.prompt()
        terminal.type("Sound s = leader 0.5 s pad 0.25 s; Play s\r")
        terminal.wait_for("\r\x1b[Ks: [")
        terminal.wait_for("of 00:00:01:00")
        terminal.wait_for("s: [##")
        terminal.wait_for("s: [" + 30 * "#" + "] 00:00:01:00 of 00:00:01:00\r\n")
        terminal.wait_for("ztsh> ")
        terminal.type("Quit\r")
        self.assertEqual(terminal.end(), 0)

    def test_a_key_ends_the_sound(self):
        terminal = self.prompt()
        terminal.type("Sound s = leader 1 h pad 1 s; Play s\r")
        terminal.wait_for("s: [")
        terminal.type(" ")
        terminal.wait_for("\r\n")
        terminal.wait_for("ztsh> ")
        terminal.type("Quit\r")
        self.assertEqual(terminal.end(), 0)

    def test_a_terminal_that_cannot_redraw_waits_for_the_end(self):
        terminal = self.prompt(kind="dumb")
        terminal.type("Sound s = leader 0.2 s pad 0.1 s; Play s; Echo heard\r")
        terminal.wait_for("heard\r\n")
        terminal.type("Quit\r")
        self.assertEqual(terminal.end(), 0)

    def test_an_interrupt_ends_the_sound_and_the_script(self):
        (self.directory / "a.zt").write_text(
            "Sound s = leader 1 h pad 1 s\nSystem touch started\nPlay s\n"
            "System touch over\n")
        shell = subprocess.Popen(
            [SHELL, "a.zt"], cwd=self.directory, stdin=subprocess.DEVNULL,
            env=dict(os.environ, ZT_AUDIO="file:out.aifc"))
        deadline = time.monotonic() + SECONDS
        while not (self.directory / "started").exists():
            self.assertLess(time.monotonic(), deadline)
            time.sleep(0.01)
        shell.send_signal(signal.SIGINT)
        self.assertEqual(shell.wait(SECONDS), 128 + signal.SIGINT)
        self.assertFalse((self.directory / "over").exists())
        self.assertEqual(
            [name for name in os.listdir(self.directory)
             if name.startswith(".zt_new_")], [])


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
