"""Makes plug-ins with `ztsh plugin new`, builds them outside of the tree against
the installed library, and has them load, act and unload.

Usage: plugin_kit_test.py BUILD COMPILER LIBDIR BINDIR FLAGS

FLAGS are what the library itself was compiled with, as one argument.
"""

import os
import pathlib
import shutil
import subprocess
import sys

SECONDS = 300


class Kit:
    def __init__(self, build, compiler, libdir, bindir, flags):
        self.build = pathlib.Path(build)
        self.compiler = compiler
        self.folder = self.build / "plugin_kit"
        # No blank in it: help files are found by paths of the library's, which
        # lose blanks.
        self.prefix = self.folder / "installed"
        self.libdir = self.prefix / libdir
        self.shell = self.prefix / bindir / "ztsh"
        self.flags = flags

    def run(self, *command, cwd=None):
        done = subprocess.run([str(word) for word in command], text=True,
                              capture_output=True, timeout=SECONDS, cwd=cwd,
                              env=dict(os.environ, CTEST_OUTPUT_ON_FAILURE="1",
                                       LD_LIBRARY_PATH=""), check=False)
        if done.returncode != 0:
            sys.exit(f"{command}: {done.returncode}\n{done.stdout}"
                     f"{done.stderr}")
        return done.stdout

    def expect(self, text, *command, cwd=None):
        found = self.run(*command, cwd=cwd)
        if found != text:
            sys.exit(f"{command}: it wrote\n{found}but should\n{text}")

    def install(self):
        shutil.rmtree(self.folder, ignore_errors=True)
        # Only what a plug-in needs: components that are not built are left.
        for component in ("runtime", "dev", "tools"):
            self.run("cmake", "--install", self.build, "--prefix",
                     self.prefix, "--component", component)

    def make(self, name, *arguments):
        """Gives the folder that a new plug-in was built in."""
        source = self.folder / name
        made = self.folder / (name + " build")
        self.run(self.shell, "plugin", "new", name, source, *arguments)
        self.run("cmake", "-G", "Ninja", "-S", source, "-B", made,
                 f"-DCMAKE_PREFIX_PATH={self.prefix}",
                 f"-DCMAKE_CXX_COMPILER={self.compiler}",
                 f"-DCMAKE_INSTALL_PREFIX={self.prefix}",
                 f"-DCMAKE_INSTALL_LIBDIR={self.libdir}",
                 "-DCMAKE_CXX_FLAGS=-Wall -Wextra -Werror " + self.flags)
        self.run("cmake", "--build", made)
        return made

    def directive(self):
        made = self.make("Hello")
        told = self.run("ctest", "--test-dir", made)
        if "100% tests passed, 0 tests failed out of 2" not in told:
            sys.exit(told)
        plugin = made / "Hello.d.so"
        self.expect(f"{plugin}: has the id Directive:1.0\n"
                    f"{plugin}: registers Hello\n{plugin}: all well\n",
                    self.shell, "plugin", "check", plugin)
        exported = self.run("nm", "-D", "--defined-only", plugin)
        shown = sorted(line.split()[-1] for line in exported.splitlines()
                       if line.split()[-1].startswith("Kvo"))
        if shown != ["KvoInitializePlugin", "KvoPluginIDString"]:
            sys.exit(exported)
        if "NOW" not in self.run("readelf", "-dW", plugin):
            sys.exit("functions are not looked up when it is loaded")

    def recognizer(self):
        made = self.make("Finder", "--kind", "recognizer")
        told = self.run("ctest", "--test-dir", made)
        if "100% tests passed, 0 tests failed out of 1" not in told:
            sys.exit(told)
        self.expect(f"Finder recognizer {made}\n", self.shell, "-c",
                    f"LoadPlugins '{made}'; Plugins")

    def installed(self):
        """A plug-in that is installed is found without being told where."""
        self.run("cmake", "--install", self.folder / "Hello build")
        place = self.libdir / "zt_util2/plugins"
        found = self.run(self.shell, "-c", "LoadPlugins; Plugins; Hello you")
        lines = found.splitlines()
        for wanted in (f"Gaps directive {place}", f"Hello directive {place}",
                       "Hello says hello to you"):
            if wanted not in lines:
                sys.exit(f"{wanted} is not in\n{found}")
        if "missing" not in self.run(self.shell, "-c",
                                     "LoadPlugins; PluginHelp Gaps"):
            sys.exit("there is no help about Gaps")

    def a_missing_function_is_told_by_the_linker(self):
        source = self.folder / "Hello/Hello.cpp"
        text = source.read_text(encoding="utf-8")
        source.write_text("int Nowhere();\nint value = Nowhere();\n" + text,
                          encoding="utf-8")
        done = subprocess.run(["cmake", "--build", self.folder / "Hello build"],
                              text=True, capture_output=True, timeout=SECONDS,
                              check=False)
        if done.returncode == 0 or "Nowhere" not in done.stdout:
            sys.exit("a missing function was not told")


def main():
    kit = Kit(*sys.argv[1:])
    kit.install()
    kit.directive()
    kit.recognizer()
    kit.installed()
    kit.a_missing_function_is_told_by_the_linker()
    shutil.rmtree(kit.folder)
    print("as it should be")


if __name__ == "__main__":
    main()
