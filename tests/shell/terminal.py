"""A program in a pseudo-terminal, driven as a person would: type, and wait for
what is expected to appear. Nothing ever sleeps for a fixed time."""

import fcntl
import os
import pty
import select
import signal
import struct
import termios
import time

SECONDS = 20


class Terminal:
    def __init__(self, command, directory, environment=None, rows=24,
                 columns=80):
        self.seen = ""
        self.mark = 0
        self.pid, self.master = pty.fork()
        if self.pid == 0:
            os.chdir(directory)
            os.environ.update(environment or {})
            os.execv(command[0], command)
        fcntl.ioctl(self.master, termios.TIOCSWINSZ,
                    struct.pack("HHHH", rows, columns, 0, 0))

    def type(self, text):
        os.write(self.master, text.encode())

    def read_some(self, seconds):
        ready, _, _ = select.select([self.master], [], [], seconds)
        if not ready:
            return False
        try:
            got = os.read(self.master, 65536)
        except OSError:
            got = b""
        self.seen += got.decode(errors="replace")
        return bool(got)

    def wait_for(self, text):
        """Waits until `text` appears behind what was waited for before."""
        deadline = time.monotonic() + SECONDS
        while True:
            place = self.seen.find(text, self.mark)
            if place >= 0:
                self.mark = place + len(text)
                return
            left = deadline - time.monotonic()
            if left <= 0 or not self.read_some(left):
                raise AssertionError(
                    f"{text!r} did not appear; seen so far:\n{self.seen!r}")

    def end(self):
        """Waits for the program's end and gives its exit code."""
        deadline = time.monotonic() + SECONDS
        while self.read_some(max(0, deadline - time.monotonic())):
            pass
        if time.monotonic() >= deadline:
            os.kill(self.pid, signal.SIGKILL)
        _, status = os.waitpid(self.pid, 0)
        os.close(self.master)
        if time.monotonic() >= deadline:
            raise AssertionError(f"no end; seen so far:\n{self.seen!r}")
        return os.waitstatus_to_exitcode(status)
