"""Signals to the shell: a clean stop and the exit code 128 + n.

Usage: signal_test.py SHELL TREE
"""

import os
import pathlib
import signal
import subprocess
import sys
import tempfile
import time
import unittest

SHELL = os.path.abspath(sys.argv[1])
SECONDS = 20

# A command that says when it runs and surely ends at an interrupt: a plain
# shell may lose one that comes between two of its commands.
ENDLESS = ("System 'trap \"exit 130\" INT; touch started; "
           "while :; do sleep 0.05; done'")


class Signals(unittest.TestCase):
    def setUp(self):
        self.holder = tempfile.TemporaryDirectory(prefix="zt_signal_")
        self.directory = pathlib.Path(self.holder.name)
        self.addCleanup(self.holder.cleanup)

    def start(self, *arguments):
        return subprocess.Popen([SHELL, *arguments], cwd=self.directory,
                                stdin=subprocess.PIPE, stdout=subprocess.PIPE,
                                stderr=subprocess.PIPE, text=True,
                                start_new_session=True)

    def wait_for_file(self, name):
        deadline = time.monotonic() + SECONDS
        while not (self.directory / name).exists():
            self.assertLess(time.monotonic(), deadline, f"no {name}")
            time.sleep(0.01)

    def no_process_of_its_session_is_left(self, session):
        deadline = time.monotonic() + SECONDS
        while True:
            left = []
            for entry in pathlib.Path("/proc").iterdir():
                try:
                    if entry.name.isdigit() and \
                            os.getsid(int(entry.name)) == session:
                        left.append(entry.name)
                except ProcessLookupError:
                    pass
            if not left:
                return
            self.assertLess(time.monotonic(), deadline, f"left: {left}")
            time.sleep(0.01)

    def test_a_script_that_runs_is_stopped(self):
        for number in (signal.SIGINT, signal.SIGTERM, signal.SIGHUP):
            (self.directory / "loop.zt").write_text(
                "System touch started\nInclude loop.zt\nInclude loop.zt\n" +
                "Set x y\n" * 1000)
            shell = self.start("--max-depth", "60", "loop.zt")
            self.wait_for_file("started")
            shell.send_signal(number)
            output, errors = shell.communicate(timeout=SECONDS)
            self.assertEqual(shell.returncode, 128 + number)
            self.assertEqual(output, "")
            (self.directory / "started").unlink()

    def test_a_shell_that_waits_for_input_is_stopped(self):
        for number in (signal.SIGINT, signal.SIGTERM):
            shell = self.start("-c", "System touch started", "-")
            self.wait_for_file("started")
            shell.send_signal(number)
            self.assertEqual(shell.wait(timeout=SECONDS), 128 + number)
            self.assertEqual(shell.stderr.read(), "")
            for stream in (shell.stdin, shell.stdout, shell.stderr):
                stream.close()
            (self.directory / "started").unlink()

    def test_a_pipe_that_nobody_writes_to_is_given_up(self):
        os.mkfifo(self.directory / "pipe")
        for arguments in (["pipe"], ["-c", "Include pipe; Echo no"]):
            shell = self.start(*arguments)
            # Long enough to come to the pipe; what comes before ends as well.
            time.sleep(0.5)
            shell.send_signal(signal.SIGINT)
            output, errors = shell.communicate(timeout=SECONDS)
            self.assertEqual((shell.returncode, output, errors),
                             (130, "", ""))

    def test_interrupting_a_command_ends_the_script(self):
        shell = self.start("-c", ENDLESS + "; Echo no")
        self.wait_for_file("started")
        os.killpg(shell.pid, signal.SIGINT)
        _, errors = shell.communicate(timeout=SECONDS)
        self.assertEqual(shell.returncode, 130)
        self.assertEqual(errors, "")

    def test_a_sequence_stops_with_its_workers(self):
        for jobs in ("1", "3"):
            for number in (signal.SIGINT, signal.SIGTERM):
                if jobs == "1" and number == signal.SIGTERM:
                    continue  # the shell ends at once and leaves its command
                shell = self.start(
                    "--jobs", jobs, "-c",
                    f"Frames 1 20 begin; {ENDLESS}; end; Echo no")
                self.wait_for_file("started")
                if jobs == "1":
                    os.killpg(shell.pid, number)
                else:
                    shell.send_signal(number)
                _, errors = shell.communicate(timeout=SECONDS)
                self.assertEqual(shell.returncode, 128 + number)
                self.assertEqual(errors,
                                 "Frames: stopped after 0 of 20 frames\n")
                self.no_process_of_its_session_is_left(shell.pid)
                (self.directory / "started").unlink()

    def test_termination_does_not_wait_for_a_command(self):
        shell = self.start("-c", "System touch started && exec sleep 100")
        self.wait_for_file("started")
        shell.send_signal(signal.SIGTERM)
        self.assertEqual(shell.wait(timeout=SECONDS), 143)
        os.killpg(shell.pid, signal.SIGKILL)
        shell.communicate()

    def test_an_ignored_interrupt_stays_ignored(self):
        script = ("trap '' INT; exec \"$0\" -c 'System touch started; "
                  "Include -; Echo on'")
        shell = subprocess.Popen(["/bin/sh", "-c", script, SHELL],
                                 cwd=self.directory, stdin=subprocess.PIPE,
                                 stdout=subprocess.PIPE,
                                 stderr=subprocess.PIPE, text=True)
        self.wait_for_file("started")
        shell.send_signal(signal.SIGINT)
        _, errors = shell.communicate("", timeout=SECONDS)
        self.assertEqual(shell.returncode, 0)
        self.assertEqual(errors, "on\n")

    def test_a_second_signal_ends_it_on_the_spot(self):
        (self.directory / "loop.zt").write_text(
            "Frames 1 1 begin; System touch started && sleep 100; end\n")
        shell = self.start("--jobs", "1", "loop.zt")
        self.wait_for_file("started")
        shell.send_signal(signal.SIGINT)  # kept until the command ends
        shell.send_signal(signal.SIGTERM)
        self.assertEqual(shell.wait(timeout=SECONDS), 143)
        os.killpg(shell.pid, signal.SIGKILL)
        shell.communicate()


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
