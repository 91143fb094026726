"""Pictures sent from the shell to a frame store, good and bad ones.

Usage: frame_store_test.py SHELL TREE SERVER
"""

import os
import pathlib
import random
import signal
import socket
import subprocess
import sys
import tempfile
import threading
import time
import unittest

from terminal import Terminal

SHELL = os.path.abspath(sys.argv[1])
TREE = pathlib.Path(sys.argv[2])
SERVER = os.path.abspath(sys.argv[3])
SECONDS = 30
PORT = 5333
MESSAGE = 699908

# The picture that all send, and where to.
START = (f"Preference QUARN_DDR_HOST %s\n"
         f"Load p {TREE}/examples/pictures/hills.rgb\n"
         "ScaleBest p 648 486\n")


def any_address():
    """Gives an address of this machine that nobody else is likely to use."""
    return (f"127.{random.randrange(1, 250)}.{random.randrange(250)}."
            f"{random.randrange(1, 250)}")


class FakeServer:
    """Accepts one client after the other and has a function treat it."""

    def __init__(self, treat):
        self.address = any_address()
        self.listener = socket.create_server((self.address, PORT))
        self.treat = treat
        threading.Thread(target=self.serve, daemon=True).start()

    def serve(self):
        while True:
            try:
                client, _ = self.listener.accept()
            except OSError:
                return
            with client:
                try:
                    self.treat(client)
                except OSError:
                    pass

    def close(self):
        self.listener.shutdown(socket.SHUT_RDWR)
        self.listener.close()


def read_all(client):
    left = MESSAGE
    while left > 0:
        left -= len(client.recv(min(left, 65536))) or left


class FrameStoreTest(unittest.TestCase):
    def setUp(self):
        holder = tempfile.TemporaryDirectory(prefix="zt_send_")
        self.addCleanup(holder.cleanup)
        self.directory = pathlib.Path(holder.name)
        self.frames = self.directory / "frames"
        self.frames.mkdir()

    def start_server(self):
        address = any_address()
        server = subprocess.Popen([SERVER, "--listen", address, "--directory",
                                   str(self.frames)],
                                  stdout=subprocess.PIPE, text=True)
        self.assertEqual(server.stdout.readline(),
                         f"listening on {address} port {PORT}\n")

        def end():
            server.terminate()
            server.communicate(timeout=SECONDS)

        self.addCleanup(end)
        return address

    def fake(self, treat):
        server = FakeServer(treat)
        self.addCleanup(server.close)
        return server.address

    def run_shell(self, address, text, *arguments):
        done = subprocess.run([SHELL, *arguments, "-c",
                               START % address + text], cwd=self.directory,
                              text=True, capture_output=True, timeout=SECONDS)
        return done.returncode, done.stderr

    def received(self):
        self.assertTrue(all(f.stat().st_size == 699840
                            for f in self.frames.iterdir()))
        return sorted(f.name for f in self.frames.iterdir())

    def test_one_picture(self):
        self.assertEqual(self.run_shell(self.start_server(), "SendFrame p 7\n"
                                        "SendFrame p -1\n"),
                         (0, "Writing to ddr frame 7\n"
                          "Writing to ddr frame -1\n"))
        self.assertEqual(self.received(),
                         ["frame.-000001.yuv", "frame.000007.yuv"])

    def test_a_sequence(self):
        text = "".join(f"Store p in.{i:03}.rgb\n" for i in range(2, 9, 2))
        self.assertEqual(
            self.run_shell(self.start_server(), text +
                           "SendFrames 2 8 2 pad 3 in.#.rgb\n"), (0, ""))
        self.assertEqual(self.received(),
                         [f"frame.{i:06}.yuv" for i in range(2, 9, 2)])

    def test_a_sequence_on_a_terminal_shows_how_far_it_is(self):
        address = self.start_server()
        self.run_shell(address, "".join(f"Store p in.{i:04}.rgb\n"
                                        for i in range(1, 5)))
        (self.directory / "send.zt").write_text(
            START % address + "SendFrames 1 4 in.#.rgb\nEcho re''ady\n")
        shell = Terminal([SHELL, "send.zt"], self.directory)
        shell.wait_for("0/4")
        shell.wait_for("ready")
        self.assertNotIn("Writing", shell.seen)
        self.assertEqual(len(self.received()), 4)

    def test_frames_side_by_side(self):
        code, errors = self.run_shell(
            self.start_server(),
            "Frames 1 12 begin\nSendFrame p $frame\nend\n", "--jobs", "4")
        self.assertEqual(code, 0)
        self.assertEqual(errors, "".join(f"Writing to ddr frame {i}\n"
                                         for i in range(1, 13)))
        self.assertEqual(len(self.received()), 12)

    def test_the_example(self):
        done = subprocess.run(
            [SHELL, "--ddr-timeout", "20", TREE / "examples/frame_store.zt"],
            cwd=self.directory, text=True, capture_output=True,
            timeout=SECONDS,
            env=dict(os.environ, QUARN_DDR_HOST=self.start_server()))
        self.assertEqual((done.returncode, done.stdout, done.stderr),
                         (0, "", "".join(f"Writing to ddr frame {i}\n"
                                         for i in range(1, 11))))
        self.assertEqual(len(self.received()), 10)
        # Coarse blocks first, the picture itself last.
        frames = [f.read_bytes() for f in sorted(self.frames.iterdir())]
        self.assertEqual(len(set(frames)), 10)
        self.assertLess(len(set(frames[0][i:i + 4] for i in
                                range(0, 699840, 4))),
                        len(set(frames[9][i:i + 4] for i in
                                range(0, 699840, 4))))

    def test_a_frame_that_is_refused_is_the_last(self):
        seen = []

        def refuse_the_second(client):
            read_all(client)
            seen.append(client)
            client.sendall(b"BAD\0" if len(seen) == 2 else b"OK\0\0")

        text = "".join(f"Store p in.{i:04}.rgb\n" for i in range(1, 5))
        code, errors = self.run_shell(self.fake(refuse_the_second), text +
                                      "SendFrames 1 4 in.#.rgb\n")
        self.assertEqual(code, 1)
        self.assertIn("ERROR: QuickFrame write error.\n"
                      "Error: SendFrames: frame 2 was not sent: the line "
                      "above says why\n", errors)
        self.assertIn("SendFrames: stopped after 1 of 4 frames\n", errors)
        self.assertEqual(len(seen), 2)

    def test_nobody_is_there(self):
        code, errors = self.run_shell(any_address(), "SendFrame p 7\n")
        self.assertEqual(code, 1)
        self.assertTrue(errors.startswith(
            "Writing to ddr frame 7\n"
            "ERROR: Failed to connect to server\n"
            "Error: SendFrame: frame 7 was not sent: the line above says "
            "why\n"), errors)

    def test_a_time_limit(self):
        address = self.fake(lambda client: time.sleep(SECONDS))
        begin = time.monotonic()
        code, errors = self.run_shell(address, "SendFrame p 7\nEcho on\n",
                                      "--ddr-timeout", "0.5")
        self.assertLess(time.monotonic() - begin, SECONDS / 2)
        self.assertEqual(code, 1)
        self.assertIn("Error: SendFrame: frame 7 was not sent: it took longer "
                      "than 0.5 seconds (--ddr-timeout)\n", errors)

    def test_a_beat_does_not_disturb_a_slow_server(self):
        def answer_slowly(client):
            read_all(client)
            for byte in b"OK\0\0":
                time.sleep(0.05)
                client.sendall(bytes([byte]))

        self.assertEqual(
            self.run_shell(self.fake(answer_slowly),
                           "Beat start\nSendFrame p 7\nBeat stop\n"),
            (0, "Writing to ddr frame 7\n"))

    def children_of(self, pid):
        tasks = pathlib.Path(f"/proc/{pid}/task/{pid}/children")
        return tasks.read_text().split()

    def test_signals_end_a_wait_for_an_answer(self):
        for number in (signal.SIGINT, signal.SIGTERM):
            connected = threading.Event()

            def never_answer(client):
                read_all(client)
                connected.set()
                client.recv(1)

            address = self.fake(never_answer)
            shell = subprocess.Popen(
                [SHELL, "-c", START % address + "SendFrame p 7\nEcho on\n"],
                stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True)
            self.assertTrue(connected.wait(SECONDS))
            children = self.children_of(shell.pid)
            self.assertEqual(len(children), 1)
            shell.send_signal(number)
            output, errors = shell.communicate(timeout=SECONDS)
            self.assertEqual((shell.returncode, output, errors),
                             (128 + number, "", "Writing to ddr frame 7\n"))
            self.assertFalse(pathlib.Path(f"/proc/{children[0]}").exists())

    def test_the_key_for_interrupts_brings_the_prompt_back(self):
        address = self.fake(lambda client: client.recv(MESSAGE) and
                            time.sleep(SECONDS))
        shell = Terminal([SHELL], self.directory)
        shell.wait_for("ztsh>")
        shell.type(START % address + "SendFrame p 7\n")
        shell.wait_for("Writing to ddr frame 7")
        shell.type("\x03")
        shell.type("Echo still he''re\n")
        shell.wait_for("still here")

    def test_a_safe_shell_sends_nothing(self):
        code, errors = self.run_shell("127.0.0.1", "SendFrame p 7\n"
                                      "SendFrames 1 2 in.#.rgb\n", "--safe")
        self.assertEqual(code, 1)
        self.assertIn("Error: SendFrame: not allowed in a safe shell "
                      "(--safe)\n", errors)
        self.assertIn("Error: SendFrames: not allowed in a safe shell "
                      "(--safe)\n", errors)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
