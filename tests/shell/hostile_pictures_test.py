"""Broken and malicious picture files given to the shell: no crash, no hang, one
second and 64 MiB each at most, and the script goes on.

Usage: hostile_pictures_test.py SHELL TREE
"""

import os
import pathlib
import struct
import subprocess
import sys
import tempfile
import unittest

SHELL = os.path.abspath(sys.argv[1])
SECONDS = 60
MOST_KIB = 64 * 1024
SANITIZED = os.environ.get("ZT_SANITIZED")  # slower and larger by design

SCRIPT = """
Load a {file} {kind}
Info a
Copy a b
Resize a 3 5
ScaleBest b 4 4
Store a out.rgb
Png b out.png
Free a
Echo on
"""


def header(storage=1, bytes_each=1, dimensions=3, x=4, y=4, z=3,
           magic=0x01DA, colormap=0):
    fixed = struct.pack(">HBBHHHHii", magic, storage, bytes_each, dimensions,
                        x, y, z, 0, 255)
    return (fixed + bytes(4) + b"no name".ljust(80, b"\0") +
            struct.pack(">i", colormap)).ljust(512, b"\0")


def rows(row=None, lengths=None, starts=None, tail=b"", y=4, z=3):
    """Tables and rows; `row` is the bytes of every row."""
    bodies = [row if row is not None else bytes([4, 0x40 + i % z, 0])
              for i in range(y * z)]
    offset = 512 + 8 * y * z
    table_starts, table_lengths = [0] * (y * z), [0] * (y * z)
    for i, body in enumerate(bodies):
        entry = i // z + i % z * y
        table_starts[entry] = offset
        table_lengths[entry] = len(body)
        offset += len(body)
    if starts is not None:
        table_starts = starts(table_starts)
    if lengths is not None:
        table_lengths = lengths(table_lengths)
    words = table_starts + table_lengths
    return struct.pack(f">{len(words)}I", *words) + b"".join(bodies) + tail


def last(value):
    return lambda table: table[:-1] + [value]


def every(value):
    return lambda table: [value] * len(table)


SGI = {
    "sound": header() + rows(),
    "empty": b"",
    "magic_only": b"\x01\xda",
    "short_header": header()[:511],
    "no_tables": header(),
    "cut_in_the_tables": (header() + rows())[:552],
    "last_bytes_cut": (header() + rows())[:-5],
    "two_bytes_a_channel": header(bytes_each=2) + rows(),
    "no_bytes_a_channel": header(bytes_each=0) + rows(),
    "unknown_storage": header(storage=2) + rows(),
    "no_channels": header(z=0) + rows(),
    "five_channels": header(z=5) + rows(),
    "many_channels": header(x=1, y=1, z=65535) + bytes(64),
    "no_width": header(x=0) + rows(),
    "no_height": header(y=0) + rows(),
    "huge_verbatim": header(storage=0, x=65535, y=65535, z=4),
    "huge_run_length": header(x=65535, y=65535, z=4) + bytes(64),
    "runs_too_long": header() + rows(b"\xff" + b"\x41" * 127 + b"\0"),
    "repeats_too_long": header() + rows(b"\x7f\x41" * 40 + b"\0"),
    "no_end": header() + rows(b"\x04\x09"),
    "literal_cut": header() + rows(b"\x84\x01"),
    "last_length_huge": header() + rows(lengths=last(0x7FFFFFFF)),
    "all_lengths_huge": header() + rows(lengths=every(0xFFFFFFFF)),
    "out_of_order_length_15": header() + rows(
        starts=lambda t: t[::-1], lengths=lambda t: [15] + t[1:],
        tail=bytes(64)),
    "out_of_order_length_14": header() + rows(
        starts=lambda t: t[::-1], lengths=lambda t: [14] + t[1:],
        tail=bytes(64)),
    "starts_beyond_the_file": header() + rows(starts=every(0xFFFFFFFF)),
    "starts_zero": header() + rows(starts=every(0)),
    "starts_far": header() + rows(starts=every(0x7FFFFFFF)),
    "huge_grey": header(x=65535, y=65535, z=1) + bytes(64),
    "short_rows": header() + rows(b"\x02\x07\x00"),
    "lengths_zero": header() + rows(lengths=every(0)),
    "verbatim_cut": header(storage=0) + bytes(10),
    "dimension_1": header(dimensions=1) + rows(),
    "dimension_9": header(dimensions=9) + rows(),
    "colormap_3": header(colormap=3) + rows(),
    "magic_swapped": header(magic=0xDA01) + rows(),
    "wide": header(x=65535, y=1, z=1) + rows(y=1, z=1),
    "high": header(x=1, y=65535, z=1) + bytes(64),
}


def pix(width, height, bits, body=b""):
    return struct.pack(">HHHHH", width, height, 0, 0, bits) + body


PIX = {
    "run_into_one_pixel": pix(1, 1, 24, b"\xff\1\2\3"),
    "counts_of_zero": pix(2, 2, 24, bytes(4 * 65536)),
    "too_wide": pix(8193, 1, 24),
    "no_width": pix(0, 1, 24),
    "too_high": pix(1, 8193, 24),
    "eight_bits": pix(1, 1, 8, b"\1\1\2\3"),
    "header_short": pix(1, 1, 24)[:9],
    "packet_cut": pix(4, 4, 24, b"\1\1\2"),
    "runs_over_the_rows": pix(4, 2, 24, b"\3\1\2\3\3\4\5\6\xff\1\1\1"),
    "header_alone": pix(2000, 2000, 24),
}

YUV = {
    "empty": b"",
    "one_byte": b"\x80",
    "one_byte_short": b"\x80" * 699839,
    "all_zero": bytes(699840),
    "all_ones": b"\xff" * 699840,
    "luma_0_chroma_255": b"\xff\0" * 349920,
    "too_long": b"\x10" * 700000,
}


class Hostile(unittest.TestCase):
    def setUp(self):
        self.holder = tempfile.TemporaryDirectory(prefix="zt_hostile_")
        self.directory = pathlib.Path(self.holder.name)
        self.addCleanup(self.holder.cleanup)

    def give(self, name, kind, data, script=SCRIPT):
        (self.directory / "picture").write_bytes(data)
        (self.directory / "a.zt").write_text(
            script.format(file="picture", kind=kind))
        with open(self.directory / "errors", "w+", encoding="utf-8") as errors:
            shell = subprocess.Popen([SHELL, "a.zt"], cwd=self.directory,
                                     stdin=subprocess.DEVNULL,
                                     stdout=subprocess.DEVNULL, stderr=errors)
            _, status, used = os.wait4(shell.pid, 0)
            shell.returncode = os.waitstatus_to_exitcode(status)
            errors.seek(0)
            text = errors.read()
        seconds = used.ru_utime + used.ru_stime
        self.assertIn(shell.returncode, (0, 1), f"{name}: {text}")
        self.assertTrue(text.endswith("\non\n") or text == "on\n",
                        f"{name}: {text}")
        if not SANITIZED:
            self.assertLess(seconds, 1, name)
            self.assertLess(used.ru_maxrss, MOST_KIB, name)
        return shell.returncode

    def test_sgi_pictures(self):
        refused = {name for name, data in SGI.items()
                   if self.give(name, "sgi", data) != 0}
        self.assertEqual(refused, {
            "empty", "magic_only", "two_bytes_a_channel",
            "no_bytes_a_channel", "five_channels", "many_channels",
            "huge_verbatim", "huge_run_length",
            "out_of_order_length_15", "huge_grey", "magic_swapped"})

    def test_pix_pictures(self):
        refused = {name for name, data in PIX.items()
                   if self.give(name, "pix", data) != 0}
        self.assertEqual(refused, {
            "too_wide", "no_width", "too_high", "eight_bits", "header_short",
            "packet_cut"})

    def test_a_picture_that_its_file_only_promises(self):
        code = self.give("largest_header_alone", "pix", pix(8192, 8192, 24),
                         "Load p {file} {kind}\nInfo p\nEcho on\n")
        self.assertEqual(code, 0)

    def test_video_frames(self):
        refused = {name for name, data in YUV.items()
                   if self.give(name, "yuv", data) != 0}
        self.assertEqual(refused, set())


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
