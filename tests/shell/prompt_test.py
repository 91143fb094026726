"""The prompt in a pseudo-terminal.

Usage: prompt_test.py SHELL TREE
"""

import os
import pathlib
import stat
import sys
import tempfile
import unittest

from terminal import Terminal

SHELL = os.path.abspath(sys.argv[1])


class Prompt(unittest.TestCase):
    def setUp(self):
        self.holder = tempfile.TemporaryDirectory(prefix="zt_prompt_")
        self.directory = pathlib.Path(self.holder.name).resolve()
        self.addCleanup(self.holder.cleanup)

    def start(self, *arguments, rows=24, columns=80, kind="xterm"):
        environment = {"XDG_STATE_HOME": str(self.directory / "state"),
                       "HOME": str(self.directory), "TERM": kind,
                       "LC_ALL": "C.UTF-8"}
        return Terminal([SHELL, *arguments], self.directory, environment, rows,
                        columns)

    def test_statements_run_one_by_one(self):
        terminal = self.start()
        terminal.wait_for("ztsh> ")
        terminal.type("Echo a'b'c; Echo d\r")
        terminal.wait_for("\nabc\r\n")
        terminal.wait_for("d\r\n")
        terminal.wait_for("ztsh> ")
        terminal.type("\x04")
        self.assertEqual(terminal.end(), 0)

    def test_reports_name_no_line_and_count(self):
        terminal = self.start()
        terminal.wait_for("ztsh> ")
        terminal.type("Nosuch\r")
        terminal.wait_for("Unknown command: Nosuch\r\n")
        terminal.wait_for("ztsh> ")
        terminal.type("\x04")
        self.assertEqual(terminal.end(), 1)
        self.assertNotIn(" at ", terminal.seen)

    def test_an_open_quote_asks_on(self):
        terminal = self.start()
        terminal.wait_for("ztsh> ")
        terminal.type("Echo 'one\r")
        terminal.wait_for("....> ")
        terminal.type("two'\r")
        terminal.wait_for("\none\r\ntwo\r\n")
        terminal.wait_for("ztsh> ")
        terminal.type("Echo one \\\r")
        terminal.wait_for("....> ")
        terminal.type(" two\r")
        terminal.wait_for("\none two\r\n")
        terminal.type("Quit 5\r")
        self.assertEqual(terminal.end(), 5)

    def test_the_end_may_be_typed_ahead(self):
        terminal = self.start()
        terminal.wait_for("ztsh> ")
        terminal.type("System echo running\\; sleep 0.2\r")
        terminal.wait_for("\nrunning")
        terminal.type("Echo too\r\x04")
        terminal.wait_for("\ntoo")
        self.assertEqual(terminal.end(), 0)

    def test_a_block_asks_on(self):
        terminal = self.start("--jobs", "1")
        terminal.wait_for("ztsh> ")
        terminal.type("Frames 1 2 begin\r")
        terminal.wait_for("....> ")
        terminal.type("Echo frame$frame\r")
        terminal.wait_for("....> ")
        terminal.type("end\r")
        terminal.wait_for("frame0001\r\n")
        terminal.wait_for("frame0002\r\n")
        terminal.wait_for("ztsh> ")
        terminal.type("\x04")
        self.assertEqual(terminal.end(), 0)

    def test_interrupt_takes_back_the_line_only(self):
        terminal = self.start()
        terminal.wait_for("ztsh> ")
        terminal.type("Echo no")
        terminal.wait_for("no")
        terminal.type("\x03")
        terminal.wait_for("ztsh> ")
        terminal.type("Echo 'open\r")
        terminal.wait_for("....> ")
        terminal.type("\x03")
        terminal.wait_for("ztsh> ")
        terminal.type("Echo still$here\r")
        terminal.wait_for("\nstill" + str(self.directory))
        terminal.wait_for("ztsh> ")
        terminal.type("\x04")
        self.assertEqual(terminal.end(), 0)
        self.assertNotIn("\nno", terminal.seen)

    def test_interrupt_takes_back_a_block(self):
        terminal = self.start()
        terminal.wait_for("ztsh> ")
        terminal.type("Frames 1 2 begin\r")
        terminal.wait_for("....> ")
        terminal.type("\x03")
        terminal.wait_for("ztsh> ")
        terminal.type("Echo on\r")
        terminal.wait_for("\non\r\n")
        terminal.type("\x04")
        self.assertEqual(terminal.end(), 0)

    def test_interrupt_ends_the_statement_that_runs(self):
        terminal = self.start()
        terminal.wait_for("ztsh> ")
        terminal.type("System 'trap \"exit 1\" INT; echo started; "
                      "while :; do sleep 0.05; done'\r")
        terminal.wait_for("\nstarted")
        terminal.type("\x03")
        terminal.wait_for("ztsh> ")
        terminal.type("Echo on\r")
        terminal.wait_for("\non\r\n")
        terminal.type("\x04")
        self.assertEqual(terminal.end(), 0)

    def test_history_is_kept_for_its_owner(self):
        terminal = self.start()
        terminal.wait_for("ztsh> ")
        terminal.type("Echo first\r")
        terminal.wait_for("\nfirst")
        terminal.wait_for("ztsh> ")
        terminal.type("\x04")
        terminal.end()
        history = self.directory / "state/ztsh/history"
        self.assertEqual(history.read_text(), "Echo first\n")
        self.assertEqual(stat.S_IMODE(history.stat().st_mode), 0o600)
        self.assertEqual(stat.S_IMODE(history.parent.stat().st_mode), 0o700)

        terminal = self.start()
        terminal.wait_for("ztsh> ")
        terminal.type("\x1b[A")
        terminal.wait_for("Echo first")
        terminal.type(" again\r")
        terminal.wait_for("\nfirst again\r\n")
        terminal.type("\x04")
        terminal.end()
        self.assertEqual(history.read_text(), "Echo first\nEcho first again\n")

    def test_lines_are_edited(self):
        terminal = self.start()
        terminal.wait_for("ztsh> ")
        terminal.type("cho a\u00e9\x01E\r")
        terminal.wait_for("\na\u00e9\r\n")
        terminal.type("\x04")
        self.assertEqual(terminal.end(), 0)

    def test_tab_completes_words_and_files(self):
        (self.directory / "only one").write_text("")
        terminal = self.start()
        terminal.wait_for("ztsh> ")
        terminal.type("ec\tx o\t\r")
        terminal.wait_for("\nx only one\r\n")
        terminal.wait_for("ztsh> ")
        terminal.type("Resi\t")
        terminal.wait_for("ze")  # only what is new is drawn
        terminal.type("\t")
        terminal.wait_for("Resize      ResizeBest\r\n")
        terminal.wait_for("ztsh> Resize")
        terminal.type("\x15Quit 6\r")
        self.assertEqual(terminal.end(), 6)

    def test_show_fills_the_window(self):
        header = bytes.fromhex("01da0001000300040002000300000000000000ff")
        (self.directory / "a.rgb").write_bytes(
            header.ljust(512, b"\0") + bytes(8) + b"\x40" * 8 + b"\x80" * 8)
        terminal = self.start(rows=6, columns=20)
        terminal.wait_for("ztsh> ")
        terminal.type("Load a a.rgb; Show a\r")
        terminal.wait_for("\x1b[38;2;0;64;128m\x1b[48;2;0;64;128m" +
                          "\u2580" * 20 + "\x1b[0m\r\n")
        terminal.wait_for("ztsh> ")
        terminal.type("\x04")
        self.assertEqual(terminal.end(), 0)
        self.assertEqual(terminal.seen.count("\u2580"), 20 * 5)

    def test_a_sequence_shows_how_far_it_is(self):
        # Each frame ends when it may, so that however slow the machine is the
        # line can be seen; the sleep outlasts the pause between two lines.
        frame = ('System "sleep 0.15; until test -e go.$frame; '
                 'do sleep 0.02; done"; Echo done $frame; ')
        for jobs in ("1", "2"):
            terminal = self.start("--jobs", jobs, "-c",
                                  "Frames 1 3 begin; " + frame + "end")
            terminal.wait_for("0/3")
            self.let_end("0001")
            terminal.wait_for("done 0001\r\n")
            terminal.wait_for("left\x1b[K")
            self.let_end("0002")
            terminal.wait_for("\r\x1b[Kdone 0002\r\n")
            terminal.wait_for("left\x1b[K")
            self.let_end("0003")
            terminal.wait_for("\r\x1b[Kdone 0003\r\n")
            self.assertEqual(terminal.end(), 0)
            for go in self.directory.glob("go.*"):
                go.unlink()

    def let_end(self, frame):
        (self.directory / f"go.{frame}").touch()

    def test_the_line_of_a_silent_sequence_stays(self):
        for jobs in ("1", "2"):
            terminal = self.start("--jobs", jobs, "-c", "Frames 1 5 begin; "
                                  "System sleep 0.15; end")
            terminal.wait_for("0/5")
            self.assertEqual(terminal.end(), 0)
            self.assertEqual(terminal.seen.count("\r\x1b[K"), 1)
            self.assertTrue(terminal.seen.endswith("\r\x1b[K"))

    def test_a_plain_terminal_shows_no_line(self):
        terminal = self.start("-c", "Frames 1 3 begin; Echo $frame; end",
                              kind="dumb")
        self.assertEqual(terminal.end(), 0)
        self.assertEqual(terminal.seen, "0001\r\n0002\r\n0003\r\n")

    def test_standard_input_is_read_from_the_terminal(self):
        terminal = self.start()
        terminal.wait_for("ztsh> ")
        terminal.type("Include -\r")
        # What is typed before the editor has let go of the terminal is read
        # but not echoed.
        terminal.wait_for("Include -\r")
        terminal.type("Echo in\r")
        terminal.wait_for("\nin\r\n")
        terminal.type("\x04")
        terminal.wait_for("ztsh> ")
        terminal.type("Echo out\r")
        terminal.wait_for("\nout\r\n")
        terminal.type("\x04")
        self.assertEqual(terminal.end(), 0)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
