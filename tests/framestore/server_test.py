"""The frame-store server as a program, under clients of every kind.

Usage: server_test.py PROGRAM
"""

import os
import pathlib
import random
import re
import resource
import signal
import socket
import struct
import subprocess
import sys
import tempfile
import threading
import time
import unittest

PROGRAM = os.path.abspath(sys.argv[1])
SECONDS = 60
FRAME = 1440 * 486
OK = b"OK\0\0"
BAD = b"BAD\0"


def frame_of(number):
    """Gives bytes that differ from number to number and from place to place."""
    return random.Random(number).randbytes(FRAME)


def message(number, frame=None, name=b"client"):
    return (name.ljust(64, b"\0") + struct.pack(">i", number) +
            (frame_of(number) if frame is None else frame))


class ServerTest(unittest.TestCase):
    def setUp(self):
        holder = tempfile.TemporaryDirectory(prefix="zt_framestore_")
        self.addCleanup(holder.cleanup)
        self.directory = pathlib.Path(holder.name) / "frames"
        self.directory.mkdir()
        self.lock = pathlib.Path(holder.name) / "lock"
        self.server = None

    def start(self, *arguments, limits=(), log=subprocess.PIPE):
        def limit():
            for what, value in limits:
                resource.setrlimit(what, (value, value))

        self.server = subprocess.Popen(
            [PROGRAM, "--port", "0", "--directory", str(self.directory),
             *arguments],
            stdout=log, stderr=subprocess.PIPE, text=True,
            preexec_fn=limit)
        self.addCleanup(self.end)
        line = self.server.stdout.readline()
        self.assertRegex(line, r"^listening on 127\.0\.0\.1 port \d+\n$")
        self.port = int(line.split()[-1])

    def end(self):
        if self.server.poll() is None:
            self.server.kill()
        self.server.wait()
        for stream in (self.server.stdout, self.server.stderr):
            if stream and not stream.closed:
                stream.close()

    def stop(self, number=signal.SIGTERM):
        """Stops the server and gives the rest of its log."""
        self.server.send_signal(number)
        output, errors = self.server.communicate(timeout=SECONDS)
        self.assertEqual(errors, "")
        self.assertEqual(self.server.returncode, 0)
        return output

    def connect(self):
        client = socket.create_connection(("127.0.0.1", self.port),
                                          timeout=SECONDS)
        self.addCleanup(client.close)
        return client

    def answer_to(self, client):
        """Reads to the end; a reset is an end too."""
        got = b""
        try:
            while part := client.recv(100):
                got += part
        except ConnectionResetError:
            pass
        return got

    def send(self, bytes_to_send):
        """Sends all and gives the answer."""
        with self.connect() as client:
            client.sendall(bytes_to_send)
            return self.answer_to(client)

    def names(self):
        return sorted(os.listdir(self.directory))

    def frame(self, number):
        return (self.directory / f"frame.{number:06}.yuv").read_bytes()

    def log_line(self):
        return self.server.stdout.readline()

    def wait_until(self, happened, what):
        deadline = time.monotonic() + SECONDS
        while not happened():
            self.assertLess(time.monotonic(), deadline, what)
            time.sleep(0.01)

    # One client.

    def test_a_frame_is_written_as_it_came_and_answered(self):
        self.start()
        self.assertEqual(self.send(message(7)), OK)
        self.assertEqual(self.frame(7), frame_of(7))
        self.assertEqual(self.names(), ["frame.000007.yuv"])
        self.assertEqual(
            self.log_line(),
            f"frame 7 from client (127.0.0.1): wrote {self.directory}"
            "/frame.000007.yuv\n")

    def test_files_of_every_kind(self):
        self.start("--png", "--interleave")
        self.assertEqual(self.send(message(7)), OK)
        self.assertEqual(self.names(),
                         ["frame.000007.png", "frame.000007.yuv"])
        lines = [frame_of(7)[i:i + 1440] for i in range(0, FRAME, 1440)]
        fields = zip(lines[243:], lines[:243])
        self.assertEqual(self.frame(7),
                         b"".join(line for pair in fields for line in pair))
        png = (self.directory / "frame.000007.png").read_bytes()
        self.assertEqual(png[:8], b"\x89PNG\r\n\x1a\n")
        self.assertEqual(struct.unpack(">II", png[16:24]), (720, 486))

    def test_a_client_that_sends_byte_by_byte(self):
        self.start()
        with self.connect() as client:
            client.setsockopt(socket.IPPROTO_TCP, socket.TCP_NODELAY, 1)
            for byte in message(7)[:100]:
                client.sendall(bytes([byte]))
            client.sendall(message(7)[100:])
            self.assertEqual(self.answer_to(client), OK)
        self.assertEqual(self.frame(7), frame_of(7))

    def test_a_slow_client_keeps_nobody_waiting(self):
        self.start()
        slow = self.connect()
        for at in range(0, 690000, 69000):
            slow.sendall(message(1)[at:at + 69000])
            self.assertEqual(self.send(message(2)), OK)
        slow.sendall(message(1)[690000:])
        self.assertEqual(self.answer_to(slow), OK)
        self.assertEqual(self.frame(1), frame_of(1))

    def test_bytes_behind_the_frame_do_no_harm(self):
        self.start()
        with self.connect() as client:
            client.sendall(message(7) + b"x" * 5000000)
            client.shutdown(socket.SHUT_WR)
            self.assertEqual(self.answer_to(client), OK)
        self.assertEqual(self.frame(7), frame_of(7))

    def test_a_client_that_closes_its_side_first_is_answered(self):
        self.start()
        with self.connect() as client:
            client.sendall(message(7))
            client.shutdown(socket.SHUT_WR)
            self.assertEqual(self.answer_to(client), OK)

    def test_cut_connections_leave_nothing(self):
        self.start()
        for count in (0, 10, 64, 67, 68, 69, 1000, 699907):
            for reset in (False, True):
                with self.connect() as client:
                    client.sendall(message(7)[:count])
                    if reset:
                        # What has not been read yet is lost with it.
                        self.wait_until(lambda: self.has_read(client), "read")
                        client.setsockopt(socket.SOL_SOCKET, socket.SO_LINGER,
                                          struct.pack("ii", 1, 0))
                self.assertEqual(
                    self.log_line(),
                    f"127.0.0.1: closed after {count} of 699908 bytes\n")
                self.assertEqual(self.names(), [])
        self.assertEqual(self.send(message(8)), OK)

    def has_read(self, client):
        """Tells whether the server has read all that the client has sent."""
        import fcntl
        import termios
        mine = client.getsockname()[1]
        unsent = struct.unpack("i", fcntl.ioctl(client, termios.TIOCOUTQ,
                                                struct.pack("i", 0)))[0]
        for line in pathlib.Path("/proc/net/tcp").read_text().splitlines():
            fields = line.split()
            if fields[2].endswith(f":{mine:04X}") and fields[3] == "01":
                return unsent == 0 and fields[4].endswith(":00000000")
        return False

    def test_garbage_is_a_frame_like_any_other(self):
        self.start()
        noise = random.Random(1).randbytes(699908)
        self.assertEqual(self.send(noise), OK)
        number = struct.unpack(">i", noise[64:68])[0]
        line = self.log_line()
        self.assertTrue(line.startswith(f"frame {number} from "), line)
        self.assertRegex(line, r"^[ -~]+\n$")
        for text in (b"GET / HTTP/1.1\r\n\r\n", b"\0", b"\xff" * 68):
            self.assertEqual(self.send_and_close(text), b"")
            self.assertIn("closed after", self.log_line())
        self.assertEqual(len(self.names()), 1)

    def send_and_close(self, text):
        with self.connect() as client:
            client.sendall(text)
            client.shutdown(socket.SHUT_WR)
            return self.answer_to(client)

    # Many clients.

    def all_at_once(self, numbers):
        answers = {}

        def run(index, number):
            answers[index] = self.send(message(number))

        threads = [threading.Thread(target=run, args=pair)
                   for pair in enumerate(numbers)]
        for thread in threads:
            thread.start()
        for thread in threads:
            thread.join(SECONDS)
        return answers

    def test_a_hundred_clients_at_once(self):
        self.start("--clients", "100")
        answers = self.all_at_once(range(100))
        self.assertEqual(set(answers.values()), {OK})
        self.assertEqual(len(answers), 100)
        for number in range(100):
            self.assertEqual(self.frame(number), frame_of(number))

    def test_more_clients_than_are_served_at_a_time(self):
        self.start("--clients", "3")
        self.assertEqual(set(self.all_at_once(range(40)).values()), {OK})
        self.assertEqual(len(self.names()), 40)

    def test_frames_of_one_number_do_not_mix(self):
        self.start()
        frames = [bytes([i]) * FRAME for i in range(12)]
        threads = [threading.Thread(target=self.send,
                                    args=[message(7, frame)])
                   for frame in frames]
        for thread in threads:
            thread.start()
        for thread in threads:
            thread.join(SECONDS)
        self.assertIn(self.frame(7), frames)
        self.assertEqual(self.names(), ["frame.000007.yuv"])

    def memory(self):
        status = pathlib.Path(f"/proc/{self.server.pid}/status").read_text()
        return int(re.search(r"VmRSS:\s+(\d+) kB", status)[1])

    def test_clients_take_no_memory_to_speak_of(self):
        self.start("--clients", "400")
        self.send(message(1))
        before = self.memory()
        clients = [self.connect() for _ in range(300)]
        for client in clients:
            client.sendall(message(2)[:200000])
        for client in clients:
            self.wait_until(lambda: self.has_read(client), "read")
        if "ZT_SANITIZED" not in os.environ:
            self.assertLess(self.memory() - before, 3000)
        for client in clients:
            client.close()
        for _ in range(301):
            self.log_line()
        self.assertEqual(self.names(), ["frame.000001.yuv"])

    def test_without_descriptors_clients_wait_and_nothing_spins(self):
        self.start("--clients", "100", limits=[(resource.RLIMIT_NOFILE, 12)])
        idle = [self.connect() for _ in range(20)]
        answers = []
        late = threading.Thread(
            target=lambda: answers.append(self.send(message(7))))
        late.start()
        begin = self.processor_seconds()
        time.sleep(1)
        self.assertLess(self.processor_seconds() - begin, 0.5)
        self.assertEqual(answers, [])
        for client in idle:
            client.close()
        late.join(SECONDS)
        self.assertEqual(answers, [OK])

    def processor_seconds(self):
        stat = pathlib.Path(f"/proc/{self.server.pid}/stat").read_text()
        fields = stat.rsplit(")", 1)[1].split()
        return (int(fields[11]) + int(fields[12])) / os.sysconf("SC_CLK_TCK")

    # Time.

    def test_idle_clients_are_given_up(self):
        self.start("--timeout", "0.3", "--clients", "2")
        idle = [self.connect() for _ in range(2)]
        idle[1].sendall(message(7)[:1000])
        for client in idle:
            self.assertEqual(self.answer_to(client), b"")
        self.assertEqual(sorted([self.log_line(), self.log_line()]),
                         ["127.0.0.1: given up after 0 of 699908 bytes, it "
                          "takes too long\n",
                          "127.0.0.1: given up after 1000 of 699908 bytes, it "
                          "takes too long\n"])
        self.assertEqual(self.names(), [])
        self.assertEqual(self.send(message(8)), OK)

    def test_trickling_clients_are_given_up(self):
        self.start("--timeout", "0.5")
        client = self.connect()
        begin = time.monotonic()
        with self.assertRaises(OSError):
            while time.monotonic() < begin + SECONDS:
                client.sendall(b"x")
                time.sleep(0.02)
        self.assertIn("it takes too long", self.log_line())

    def test_clients_that_never_close_are_closed(self):
        self.start("--timeout", "0.5", "--clients", "1")
        client = self.connect()
        client.sendall(message(7))
        self.assertEqual(client.recv(4), OK)
        self.assertEqual(self.send(message(8)), OK)
        self.assertNotIn("given up", self.stop())

    # Disks.

    def test_a_full_disk_is_a_refusal_and_keeps_the_older_frame(self):
        (self.directory / "frame.000007.yuv").write_bytes(b"older")
        self.start(limits=[(resource.RLIMIT_FSIZE, 500000)])
        self.assertEqual(self.send(message(7)), BAD)
        self.assertEqual(self.log_line(), "frame 7 from client (127.0.0.1): "
                         "refused: File too large\n")
        self.assertEqual(self.names(), ["frame.000007.yuv"])
        self.assertEqual(self.frame(7), b"older")
        self.assertEqual(self.send(message(8)), BAD)
        self.assertEqual(self.names(), ["frame.000007.yuv"])

    def test_a_directory_that_goes_is_a_refusal(self):
        self.start()
        self.assertEqual(self.send(message(7)), OK)
        self.directory.rename(self.directory.parent / "elsewhere")
        self.assertEqual(self.send(message(8)), BAD)
        (self.directory.parent / "elsewhere").rename(self.directory)
        self.assertEqual(self.send(message(9)), OK)

    # The lock.

    def test_the_lock_is_there_while_the_server_is_full(self):
        self.start("--clients", "2", "--lock", str(self.lock))
        first = self.connect()
        first.sendall(b"x")
        self.assertEqual(self.send(message(1)), OK)
        self.wait_until(lambda: not self.lock.exists(), "still locked")
        second = self.connect()
        second.sendall(b"x")
        self.wait_until(self.lock.exists, "not locked")
        first.close()
        self.wait_until(lambda: not self.lock.exists(), "still locked")

    def test_the_lock_goes_with_the_server(self):
        self.start("--clients", "1", "--lock", str(self.lock))
        self.connect().sendall(b"x")
        self.wait_until(self.lock.exists, "not locked")
        self.stop()
        self.assertFalse(self.lock.exists())

    def test_a_lock_of_somebody_else_is_left_alone(self):
        self.lock.write_text("theirs")
        self.start("--clients", "1", "--lock", str(self.lock))
        self.assertEqual(self.send(message(1)), OK)
        self.assertEqual(self.send(message(2)), OK)
        self.stop()
        self.assertEqual(self.lock.read_text(), "theirs")

    # The end.

    def test_signals_stop_it_with_nothing_half_written(self):
        for number in (signal.SIGTERM, signal.SIGINT, signal.SIGHUP):
            self.start()
            self.assertEqual(self.send(message(1)), OK)
            client = self.connect()
            client.sendall(message(7)[:300000])
            self.wait_until(lambda: len(self.names()) == 2, "not begun")
            output = self.stop(number)
            self.assertTrue(output.endswith(
                f"stopped by signal {int(number)}, 1 unfinished frames "
                "dropped\n"), output)
            self.assertEqual(self.names(), ["frame.000001.yuv"])
            self.assertEqual(self.answer_to(client), b"")
            self.end()

    def test_a_server_at_rest_takes_no_time_and_stops(self):
        self.start()
        begin = self.processor_seconds()
        time.sleep(0.5)
        self.assertLess(self.processor_seconds() - begin, 0.1)
        self.assertEqual(self.stop(), "stopped by signal 15, 0 unfinished "
                         "frames dropped\n")

    def test_it_goes_on_when_nobody_reads_its_log(self):
        self.start()
        self.server.stdout.close()
        for number in range(3):
            self.assertEqual(self.send(message(number)), OK)
        self.server.send_signal(signal.SIGTERM)
        self.assertEqual(self.server.wait(SECONDS), 0)

    # The beginning.

    def refused(self, *arguments):
        done = subprocess.run([PROGRAM, *arguments], capture_output=True,
                              text=True, timeout=SECONDS)
        self.assertEqual(done.stdout, "")
        return done.returncode, done.stderr

    def test_a_port_in_use(self):
        self.start()
        self.assertEqual(
            self.refused("--port", str(self.port)),
            (1, f"zt-framestore: cannot listen on 127.0.0.1 port {self.port}: "
             "Address already in use\n"))

    def test_what_is_no_address(self):
        for address, why in (("localhost", "it is no address in dotted form"),
                             ("192.0.2.1", "Cannot assign requested address")):
            self.assertEqual(
                self.refused("--listen", address, "--port", "0"),
                (1, f"zt-framestore: cannot listen on {address} port 0: "
                 f"{why}\n"))

    def test_a_directory_that_is_not_there(self):
        self.assertEqual(
            self.refused("--directory", "/no/such"),
            (1, "zt-framestore: cannot write to /no/such: its directory: No "
             "such file or directory\n"))

    def test_a_lock_file_that_cannot_be_made(self):
        for lock, why in ((self.directory / "no/lock",
                           "its directory: No such file or directory"),
                          (self.directory, "it is a directory")):
            code, errors = self.refused("--lock", str(lock))
            self.assertEqual(code, 1)
            self.assertEqual(
                errors, f"zt-framestore: cannot make the lock file {lock}: "
                        f"{why}\n")

    def test_wrong_options(self):
        for arguments in (["--port", "65536"], ["--port", "x"],
                          ["--clients", "0"], ["--timeout", "0"],
                          ["--timeout", "nan"], ["--timeout", "inf"],
                          ["--directory", ""], ["--lock", ""],
                          ["--nothing"], ["word"]):
            code, errors = self.refused(*arguments)
            self.assertEqual(code, 2, arguments)
            self.assertRegex(errors,
                             r"^zt-framestore: .*; see zt-framestore --help\n$")

    def test_the_usual_port(self):
        # At an address of its own, where nobody else listens.
        address = f"127.{random.randrange(1, 250)}.{random.randrange(250)}.9"
        server = subprocess.Popen(
            [PROGRAM, "--listen", address, "--directory",
             str(self.directory)], stdout=subprocess.PIPE, text=True)
        self.assertEqual(server.stdout.readline(),
                         f"listening on {address} port 5333\n")
        server.terminate()
        server.communicate(timeout=SECONDS)
        self.assertEqual(server.returncode, 0)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
