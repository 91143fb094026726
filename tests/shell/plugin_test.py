"""Has the shell check, load and use plug-ins.

Usage: plugin_test.py SHELL TREE PLUGINS

PLUGINS is the folder of the plug-ins that are wrong in one way each.
"""

import pathlib
import shutil
import subprocess
import sys
import tempfile
import time
import unittest

SHELL, TREE, PLUGINS = sys.argv[1:4]
OTHER_NAME = "is not found by scans: its name does not end in "


def runs(process):
    """Tells whether the process of a folder of /proc is there and no zombie."""
    try:
        return "\nState:\tZ" not in (process / "status").read_text()
    except (FileNotFoundError, ProcessLookupError):
        return False


class PluginTest(unittest.TestCase):
    def setUp(self):
        # pylint: disable=consider-using-with
        self.temporary = tempfile.TemporaryDirectory(prefix="zt_plugin_")
        self.dir = pathlib.Path(self.temporary.name).resolve()

    def tearDown(self):
        self.temporary.cleanup()

    def put(self, plugin, name=None, kind="d"):
        place = self.dir / (name or f"{plugin}.{kind}.so")
        shutil.copy(f"{PLUGINS}/{plugin}.{kind}.so", place)
        return place

    def run_shell(self, *arguments):
        return subprocess.run([SHELL, *map(str, arguments)], cwd=self.dir,
                              text=True, capture_output=True, timeout=100,
                              stdin=subprocess.DEVNULL, check=False)

    def check(self, file, *arguments):
        """Gives the lines about a file, good and wrong, and the exit code."""
        done = self.run_shell("plugin", "check", *arguments, file)
        self.assertEqual(done.stderr, "")
        good, wrong = [], []
        for line in done.stdout.splitlines():
            self.assertTrue(line.startswith(f"{file}: "), line)
            line = line[len(f"{file}: "):]
            if line.startswith("WRONG: "):
                wrong.append(line[len("WRONG: "):])
            else:
                good.append(line)
        return good, wrong, done.returncode

    def expect_wrong(self, file, *wrong, arguments=(), code=1):
        found = self.check(file, *arguments)
        self.assertEqual(found[1], list(wrong))
        self.assertEqual(found[2], code)
        return found[0]


class Check(PluginTest):
    def test_a_good_one_is_well(self):
        self.assertEqual(
            self.check(self.put("well")),
            (["has the id Directive:1.0", "registers Well", "all well"], [],
             0))

    def test_the_kind_may_be_given_too(self):
        self.assertEqual(
            self.check(self.put("well"), "--kind", "directive")[2], 0)

    def test_a_bare_name_is_a_file_here(self):
        self.put("well")
        self.assertEqual(self.check("well.d.so")[2], 0)

    def test_several_are_all_checked(self):
        done = self.run_shell("plugin", "check", self.put("nothing"),
                              self.put("well"))
        self.assertEqual(done.returncode, 1)
        self.assertTrue(done.stdout.endswith("well.d.so: all well\n"))

    def test_text_is_no_shared_object(self):
        file = self.dir / "text.d.so"
        file.write_text("some text that is long enough to have a header, but "
                        "it has none, so that it cannot be loaded at all\n")
        self.expect_wrong(file, "is no shared object: invalid ELF header")

    def test_a_short_text_is_no_shared_object(self):
        file = self.dir / "text.d.so"
        file.write_text("text\n")
        self.expect_wrong(file, "is no shared object: file too short")

    def test_a_cut_one_is_truncated(self):
        file = self.put("well")
        file.write_bytes(file.read_bytes()[:9000])
        self.expect_wrong(file, "is truncated: it ends before its segments")

    def test_a_missing_function_is_named(self):
        good = self.expect_wrong(
            self.put("missing_function"),
            "has an undefined symbol: _Z21FunctionThatIsNowherev")
        self.assertEqual(good, ["has the id Directive:1.0",
                                "registers Missing"])

    def test_no_id(self):
        self.expect_wrong(self.put("no_id"), "has no id: nothing in it is "
                          "called KvoPluginIDString")

    def test_wrong_id(self):
        self.expect_wrong(self.put("wrong_id"),
                          "has the id Directive:2.0, not Directive:1.0")

    def test_another_kind(self):
        self.expect_wrong(
            self.put("well", "well.r.so"),
            "has the id Directive:1.0, not Recognizer:2.1")

    def test_a_name_that_no_scan_finds(self):
        for name in ("well.so", ".d.so"):
            self.expect_wrong(self.put("well", name),
                              OTHER_NAME + ".d.so or .r.so")

    def test_a_name_of_another_kind(self):
        self.expect_wrong(self.put("well", "well.r.so"), OTHER_NAME + ".d.so",
                          arguments=("--kind", "directive"))

    def test_registers_nothing(self):
        self.expect_wrong(self.put("nothing"), "registers nothing")

    def test_names_taken_by_others(self):
        beside = self.dir / "beside"
        beside.mkdir()
        shutil.copy(self.put("well"), beside)
        self.expect_wrong(self.dir / "well.d.so",
                          "registers nothing: its names are taken",
                          arguments=("--beside", beside))

    def test_what_is_no_directive_is_told(self):
        self.expect_wrong(
            self.put("no_directive"),
            f"says: Warning: Plug-in {self.dir}: Thing is no directive")

    def test_what_makes_no_recognizer_is_told(self):
        self.expect_wrong(self.put("no_factory", kind="r"),
                          "says: Thing makes no recognizer")

    def test_an_exception_is_told(self):
        file = self.put("throws")
        self.expect_wrong(
            file, f"says: Warning: Plug-in {file} threw an exception",
            "throws an exception out of its entry")

    def test_a_crash_while_loading(self):
        self.expect_wrong(self.put("crashes_loading"), "ends the program "
                          "while it was loaded, by signal 9")

    def test_a_crash_while_unloading(self):
        self.expect_wrong(self.put("crashes_unloading"), "ends the program "
                          "while it was unloaded, by signal 9")

    def test_an_end_of_the_program(self):
        self.expect_wrong(self.put("ends_program"), "ends the program "
                          "while it was loaded, with code 7")

    def test_no_such_file(self):
        self.expect_wrong("nowhere.d.so", "No such file or directory", code=3)

    def test_a_directory(self):
        (self.dir / "dir.d.so").mkdir()
        self.assertEqual(self.check("dir.d.so")[2], 3)

    def test_the_command_line_is_checked(self):
        for words in ((), ("check",), ("check", "--kind", "dog", "x"),
                      ("new",), ("new", "1a"), ("new", "a-b"), ("new", "a/b"),
                      ("old", "x"), ("new", "A", "--kind", "dog")):
            done = self.run_shell("plugin", *words)
            self.assertEqual((done.returncode, done.stdout), (2, ""), words)
            self.assertTrue(done.stderr.startswith("ztsh"), words)
        self.assertEqual(list(self.dir.iterdir()), [])

    def test_help_is_written(self):
        done = self.run_shell("plugin", "--help")
        self.assertEqual(done.returncode, 0)
        self.assertIn("ztsh ./plugin", done.stdout)


class New(PluginTest):
    def test_files_are_written_and_named(self):
        done = self.run_shell("plugin", "new", "Hello")
        names = ["Hello/Hello.cpp", "Hello/CMakeLists.txt", "Hello/test.zt"]
        self.assertEqual((done.returncode, done.stdout.split(), done.stderr),
                         (0, names, ""))
        for name in names:
            text = (self.dir / name).read_text()
            self.assertIn("Hello", text)
            self.assertNotIn("@", text)

    def test_another_directory_and_kind(self):
        done = self.run_shell("plugin", "new", "Edge", "a/b", "--kind",
                              "recognizer")
        self.assertEqual(done.returncode, 0)
        self.assertEqual(sorted(p.name for p in (self.dir / "a/b").iterdir()),
                         ["CMakeLists.txt", "Edge.cpp"])
        self.assertIn("KIND recognizer",
                      (self.dir / "a/b/CMakeLists.txt").read_text())

    def test_a_check_that_is_ended_leaves_no_process(self):
        checking = subprocess.Popen(
            [SHELL, "plugin", "check", self.put("never_returns")],
            stdin=subprocess.DEVNULL)
        children = pathlib.Path(f"/proc/{checking.pid}/task/{checking.pid}"
                                "/children")
        while not children.read_text():
            self.assertIsNone(checking.poll())
            time.sleep(0.01)
        child = pathlib.Path("/proc") / children.read_text().split()[0]
        checking.terminate()
        checking.wait(timeout=100)
        deadline = time.monotonic() + 20
        while runs(child):
            self.assertLess(time.monotonic(), deadline)
            time.sleep(0.01)

    def test_nothing_that_is_there_is_replaced(self):
        (self.dir / "Hello").mkdir()
        (self.dir / "Hello/test.zt").write_text("mine\n")
        done = self.run_shell("plugin", "new", "Hello")
        self.assertEqual(done.returncode, 1)
        self.assertEqual(done.stderr, "ztsh: Hello/test.zt is there already; "
                         "nothing was written\n")
        self.assertEqual([p.name for p in (self.dir / "Hello").iterdir()],
                         ["test.zt"])

    def test_a_place_where_nothing_can_be_written(self):
        (self.dir / "file").write_text("")
        done = self.run_shell("plugin", "new", "Hello", "file/below")
        self.assertEqual(done.returncode, 4)
        name = 300 * "a"
        done = self.run_shell("plugin", "new", name)
        self.assertEqual(done.returncode, 4)
        self.assertEqual(done.stderr, f"ztsh: {name}/{name}.cpp: "
                         "File name too long\n")


class Words(PluginTest):
    def test_a_word_is_used_and_withdrawn(self):
        self.put("well")
        done = self.run_shell("-c", "LoadPlugins .; well a b; Plugins")
        self.assertEqual(
            (done.returncode, done.stdout, done.stderr),
            (0, "Well 2\nWell directive .\nWell is withdrawn\n", ""))

    def test_a_word_of_the_shell_goes_on_acting(self):
        self.put("echo_word")
        done = self.run_shell("-c", f"LoadPlugins {self.dir}; Echo still")
        self.assertEqual(
            (done.returncode, done.stderr),
            (1, f"Warning: LoadPlugins: ECHO in {self.dir}: there is a word "
                "of that name already, which goes on acting\n"
                "    at -c:1\nstill\n"))

    def test_a_safe_shell_loads_nothing(self):
        self.put("crashes_loading")
        done = self.run_shell("--safe", "-c", "LoadPlugins .; LoadPlugins")
        self.assertEqual(done.returncode, 1)
        self.assertEqual(done.stderr.count("not allowed in a safe shell"), 2)

    def test_words_stay_through_other_loads(self):
        self.put("well")
        done = self.run_shell("-c", "LoadPlugins .; LoadPlugins .:.; Well")
        self.assertEqual(done.stdout.splitlines()[-2:],
                         ["Well 0", "Well is withdrawn"])

    def test_words_are_completed_and_helped(self):
        self.put("well")
        done = self.run_shell("-c", "LoadPlugins .; Help Well; Help")
        self.assertEqual(done.stdout.count("    Well\n"), 2)

    def test_quit_withdraws_too(self):
        self.put("well")
        done = self.run_shell("-c", "LoadPlugins .; Quit 5; Well")
        self.assertEqual((done.returncode, done.stdout),
                         (5, "Well is withdrawn\n"))

    def test_help_files_are_shown_and_found(self):
        self.put("well")
        (self.dir / "Help").mkdir()
        (self.dir / "Help/Well.d.txt").write_text("about Well\n")
        (self.dir / "Well.d.html").write_text("<p>")
        done = self.run_shell(
            "-c", "LoadPlugins .; PluginHelp Well; PluginHelp Well html; "
            "PluginHelp Well into file; Echo $file; "
            "PluginHelp Well html into page; Echo $page")
        self.assertEqual((done.stdout, done.stderr),
                         ("about Well\n<p>Well is withdrawn\n",
                          "./Help/Well.d.txt\n./Well.d.html\n"))

    def test_help_that_is_not_there_is_an_error(self):
        self.put("well")
        (self.dir / "Well.d.dir").mkdir()
        done = self.run_shell(
            "-c", "LoadPlugins .; PluginHelp Well; PluginHelp Other; "
            "PluginHelp Well dir; PluginHelp Well txt txt; "
            "PluginHelp Well into 1")
        self.assertEqual(done.returncode, 1)
        self.assertEqual(
            [line for line in done.stderr.splitlines() if "at -c" not in line],
            ["Error: PluginHelp: there is no help about Well",
             "Error: PluginHelp: no plug-in has brought Other",
             "Error: PluginHelp: ./Well.d.dir: it is a directory"] +
            2 * ["Error: PluginHelp: expected: PluginHelp NAME [EXTENSION] "
                 "[into VARIABLE]"])

    def test_scores_that_cannot_be_are_told_as_the_nearest_that_can(self):
        self.put("impossible_scores", kind="r")
        done = self.run_shell(
            "-c", "LoadPlugins .; Recognizer finder Impossible; "
            "Canvas scene 8 8 808080; Store scene a.rgb; "
            "Target finder it a.rgb; Recognize finder scene")
        self.assertEqual((done.returncode, done.stderr), (0, ""))
        self.assertEqual(
            [line.split()[-1] for line in done.stdout.splitlines()],
            ["0.000", "0.000", "1.000", "1.000"])

    def test_a_script_called_plugin_is_run_by_its_path(self):
        (self.dir / "plugin").write_text("Echo a script\n")
        (self.dir / "plugin.zt").write_text("Echo another\n")
        done = self.run_shell("./plugin", "plugin.zt")
        self.assertEqual(done.stderr, "a script\nanother\n")
        self.assertEqual(self.run_shell("-c", "", "plugin").stderr,
                         "a script\n")


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
