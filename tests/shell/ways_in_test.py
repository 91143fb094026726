"""How scripts reach the shell, and where its output may not go.

Usage: ways_in_test.py SHELL TREE
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


class WaysIn(unittest.TestCase):
    def setUp(self):
        self.holder = tempfile.TemporaryDirectory(prefix="zt ways_")
        self.directory = pathlib.Path(self.holder.name).resolve()
        self.addCleanup(self.holder.cleanup)

    def run_it(self, command, **more):
        more.setdefault("stdin", subprocess.DEVNULL)
        return subprocess.run(command, cwd=self.directory, text=True,
                              stderr=subprocess.PIPE, timeout=SECONDS, **more)

    def program(self, first_line, text):
        script = self.directory / "script.zt"
        script.write_text(first_line + "\n" + text)
        script.chmod(0o755)
        return script

    def path_with_the_shell(self):
        (self.directory / "bin").mkdir()
        (self.directory / "bin/ztsh").symlink_to(SHELL)
        return dict(os.environ,
                    PATH=f"{self.directory}/bin:{os.environ['PATH']}")

    def test_first_line_names_the_shell(self):
        script = self.program("#!/usr/bin/env ztsh", "Echo hello\n")
        done = self.run_it([script], env=self.path_with_the_shell())
        self.assertEqual((done.returncode, done.stderr), (0, "hello\n"))

    def test_first_line_gives_options(self):
        script = self.program("#!/usr/bin/env -S ztsh --safe --jobs 2",
                              "cd /\n")
        done = self.run_it([script], env=self.path_with_the_shell())
        self.assertEqual(done.returncode, 1)
        self.assertTrue(done.stderr.startswith(
            "Error: cd: not allowed in a safe shell (--safe)\n"))

    def test_arguments_behind_a_program_are_further_scripts(self):
        script = self.program("#!/usr/bin/env ztsh", "Echo one\n")
        (self.directory / "more.zt").write_text("Echo two\n")
        done = self.run_it([script, "more.zt"],
                           env=self.path_with_the_shell())
        self.assertEqual(done.stderr, "one\ntwo\n")

    def test_a_named_pipe_is_a_script(self):
        done = self.run_it(["bash", "-c",
                            '"$0" <(echo "Echo a"; echo "Bad")', SHELL])
        self.assertRegex(done.stderr, r"^a\nWarning: Unknown command: Bad\n"
                                      r"    at /dev/fd/\d+:2\n$")

    def test_here_holds_blanks(self):
        (self.directory / "more.zt").write_text("Echo $here\n")
        (self.directory / "script.zt").write_text("Include $here/more.zt\n")
        done = self.run_it([SHELL, "script.zt"])
        self.assertEqual(done.stderr, f"{self.directory}\n")

    def test_a_link_out_of_the_directory_is_not_safe(self):
        (self.directory / "in").mkdir()
        (self.directory / "out.zt").write_text("Echo no\n")
        (self.directory / "in/link.zt").symlink_to("../out.zt")
        (self.directory / "in/a.zt").write_text("Include in/link.zt\n")
        done = self.run_it([SHELL, "--safe", "in/a.zt"])
        self.assertEqual(done.returncode, 1)
        self.assertIn("is not a relative path below", done.stderr)

    def test_output_that_cannot_be_written_is_told(self):
        with open("/dev/full", "w", encoding="ascii") as full:
            done = self.run_it([SHELL, "-c", "Help; Echo on"], stdout=full)
        self.assertEqual(done.returncode, 4)
        self.assertEqual(done.stderr,
                         "on\nztsh: cannot write to standard output\n")

    def test_nobody_reads_the_output(self):
        done = self.run_it(["bash", "-c", '"$0" -c "$1" | true; '
                            'echo ${PIPESTATUS[0]}', SHELL,
                            "System sleep 0.2; Help"],
                           stdout=subprocess.PIPE)
        self.assertEqual((done.stdout, done.stderr), ("141\n", ""))

    def test_a_large_script_is_read_in_linear_time(self):
        (self.directory / "big.zt").write_text(
            "; " * 1000000 + "\n" * 1000000 + "Bad\n")
        done = self.run_it([SHELL, "big.zt"])
        self.assertEqual(done.stderr, "Warning: Unknown command: Bad\n"
                                      "    at big.zt:1000001\n")

    def test_an_open_quote_over_many_bytes(self):
        (self.directory / "big.zt").write_text('Echo "' + "x" * 30000000)
        done = self.run_it([SHELL, "big.zt"])
        self.assertEqual(
            done.stderr, "Warning: Last statement not run, it needs a newline "
            "behind it: Echo " + "x" * 55 + "...\n    at big.zt:1\n")

    def test_scripts_within_each_other_up_to_the_greatest_depth(self):
        (self.directory / "deep.zt").write_text("Include deep.zt\n")
        _, hard = resource.getrlimit(resource.RLIMIT_NOFILE)
        most = hard if 0 < hard < 2000 else 2000
        self.assertGreaterEqual(most, 1010, "too few files to test this")

        def more_files():
            resource.setrlimit(resource.RLIMIT_NOFILE, (most, hard))

        done = self.run_it([SHELL, "--max-depth", "1000", "deep.zt"],
                           preexec_fn=more_files)
        self.assertEqual(
            done.stderr, "Error: Include: more than 1000 scripts within each "
            "other, deep.zt is not read\n    at deep.zt:1\n")
        self.assertEqual(done.returncode, 1)

    def test_scripts_within_each_other_until_there_are_no_more_files(self):
        (self.directory / "deep.zt").write_text("Include deep.zt\n")
        # Other files come first, and often enough that words are looked up in
        # their index, so that whatever a sanitizer has to look at for the first
        # time is looked at while it can open files itself.
        (self.directory / "a.zt").write_text(
            "Include empty.zt; " * 100 + "\nInclude nofile\n"
            "Include deep.zt\n")
        (self.directory / "empty.zt").write_text("")

        def few_files():
            resource.setrlimit(resource.RLIMIT_NOFILE, (30, 30))

        done = self.run_it([SHELL, "a.zt"], preexec_fn=few_files)
        self.assertEqual(
            done.stderr, "Error - ZtDispatcher: Cannot open file nofile\n"
            "    at a.zt:2\n"
            "Error - ZtDispatcher: Cannot open file deep.zt\n"
            "    at deep.zt:1\n")
        self.assertEqual(done.returncode, 3)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
