"""Sequences: the same files however many workers there are.

Usage: sequence_test.py SHELL TREE
"""

import os
import pathlib
import resource
import subprocess
import sys
import tempfile
import unittest

SHELL = os.path.abspath(sys.argv[1])
SECONDS = 60

SCRIPT = """
Frames 1 12 begin
  Load a in.$frame.rgb
  Resize a 20 10
  Store a $out/out.$frame.rgb
  ScaleBest a 5 5
  Png a $out/out.$frame.png
end
"""


def picture(frame):
    """A verbatim picture of 4 x 2 pixels that is different for each frame."""
    header = bytes.fromhex("01da0001000300040002000300000000000000ff")
    return header.ljust(512, b"\0") + bytes(
        (frame * 7 + i * 31) % 256 for i in range(24))


class Sequences(unittest.TestCase):
    def setUp(self):
        self.holder = tempfile.TemporaryDirectory(prefix="zt_sequence_")
        self.directory = pathlib.Path(self.holder.name)
        self.addCleanup(self.holder.cleanup)
        for frame in range(1, 13):
            (self.directory / f"in.{frame:04}.rgb").write_bytes(picture(frame))
        (self.directory / "a.zt").write_text(SCRIPT)

    def run_it(self, jobs):
        out = self.directory / f"jobs{jobs}"
        out.mkdir()
        done = subprocess.run(
            [SHELL, "--jobs", str(jobs), "-c", f"Set out {out}", "a.zt"],
            cwd=self.directory, text=True, capture_output=True,
            timeout=SECONDS, check=False)
        files = {path.name: path.read_bytes() for path in out.iterdir()}
        return done, files

    def test_workers_make_the_same_files(self):
        alone, files_alone = self.run_it(1)
        together, files_together = self.run_it(4)
        self.assertEqual((alone.returncode, alone.stderr), (0, ""))
        self.assertEqual((together.returncode, together.stderr), (0, ""))
        self.assertEqual(len(files_alone), 24)
        self.assertEqual(len(set(files_alone.values())), 24)
        self.assertEqual(files_alone, files_together)

    def test_missing_frames_are_told_and_the_rest_is_made(self):
        (self.directory / "in.0003.rgb").unlink()
        (self.directory / "in.0007.rgb").write_bytes(b"no picture")
        alone, files_alone = self.run_it(1)
        together, files_together = self.run_it(4)
        for done in (alone, together):
            self.assertEqual(done.returncode, 1)
            self.assertIn("Error: Load: cannot load in.0003.rgb: No such file "
                          "or directory\n    at a.zt:3\n", done.stderr)
            self.assertIn("Error: Frame 0003 failed\n    at a.zt:2\n",
                          done.stderr)
            self.assertIn("Error: Frames: 2 of 12 frames failed: 0003, 0007\n",
                          done.stderr)
        self.assertEqual(alone.stderr, together.stderr)
        self.assertEqual(len(files_alone), 20)
        self.assertEqual(files_alone, files_together)

    def test_frames_that_cannot_be_written_tell_by_the_exit_code(self):
        for jobs in ("1", "2"):
            done = subprocess.run(
                [SHELL, "--jobs", jobs, "-c", "Set out nowhere", "a.zt"],
                cwd=self.directory, text=True, capture_output=True,
                timeout=SECONDS, check=False)
            self.assertEqual(done.returncode, 4)
            self.assertIn("12 of 12 frames failed: 0001, 0002, 0003, 0004, "
                          "0005, 0006, 0007, 0008, 0009, 0010, ...\n",
                          done.stderr)

    def test_workers_that_cannot_be_started_are_failed_frames(self):
        (self.directory / "b.zt").write_text(
            "Frames 1 2 begin; Echo no; end\nEcho on\n")

        def few_files():
            resource.setrlimit(resource.RLIMIT_NOFILE, (8, 8))

        done = subprocess.run([SHELL, "--jobs", "2", "b.zt"],
                              cwd=self.directory, text=True,
                              capture_output=True, timeout=SECONDS,
                              check=False, preexec_fn=few_files)
        self.assertEqual(done.returncode, 1)
        self.assertEqual(done.stderr, "".join(
            f"Error: Frame {frame} failed: no worker could be started: Too "
            "many open files\n    at b.zt:1\n" for frame in ("0001", "0002"))
            + "Error: Frames: 2 of 2 frames failed: 0001, 0002\n"
            "    at b.zt:1\non\n")


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
