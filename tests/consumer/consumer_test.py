"""Builds and runs a host program against the library, one way a test.

Usage: consumer_test.py WAY TREE BUILD COMPILER LIBDIR [--installed]

WAY is `install`, which installs the library and moves the folder; then
`find_package` and `pkg_config`, which need that; or `add_subdirectory`. With
`--installed` the library is where everybody finds it.
"""

import os
import pathlib
import shutil
import subprocess
import sys

OUTPUT = "00:00:02:02 1 C++{}\n"
REPORT = "Error: no picture: 0\n"
STANDARDS = ("17", "20")


class Consumer:
    def __init__(self, tree, build, compiler, libdir, installed=None):
        self.tree = pathlib.Path(tree)
        self.build = pathlib.Path(build)
        self.compiler = compiler
        self.folder = self.build / "consumer"
        self.first = self.folder / "first place"
        self.prefix = self.folder / "moved here"
        self.installed = installed is not None
        if self.installed:
            self.prefix = pathlib.Path("/usr")
        self.libdir = self.prefix / libdir
        self.source = self.tree / "tests/consumer"

    def run(self, *command, **environment):
        done = subprocess.run(command, check=False, text=True,
                              env=dict(os.environ, **environment),
                              stdout=subprocess.PIPE)
        if done.returncode != 0:
            sys.exit(f"{done.stdout}\n{command}: code {done.returncode}")
        return done.stdout

    def expect(self, program, standard, libraries=""):
        """Runs a program, which finds the library by itself or in a folder."""
        done = subprocess.run([program], text=True, capture_output=True,
                              timeout=60, check=False,
                              env=dict(os.environ, LD_LIBRARY_PATH=libraries))
        if (done.returncode, done.stdout, done.stderr) != (
                0, OUTPUT.format(standard), REPORT):
            sys.exit(f"{program}: {done}")

    def install(self):
        for place in (self.first, self.prefix):
            shutil.rmtree(place, ignore_errors=True)
        self.run("cmake", "--install", self.build, "--prefix", self.first)
        self.first.rename(self.prefix)
        # Another name, for those who cannot have blanks in it.
        plain = self.folder / "moved"
        if not plain.is_symlink():
            plain.symlink_to(self.prefix.name)
        for path in self.prefix.rglob("*"):
            if path.is_file() and path.suffix in (".cmake", ".pc", ".h"):
                text = path.read_text(encoding="utf-8")
                for place in (self.first, self.tree, self.build):
                    if str(place) in text:
                        sys.exit(f"{path} names {place}")

    def configured(self, way, *arguments):
        """Configures and builds a project of tests/consumer."""
        made = self.folder / way
        shutil.rmtree(made, ignore_errors=True)
        self.run("cmake", "--no-warn-unused-cli", "-G", "Ninja",
                 "-S", self.source / way, "-B", made,
                 f"-DCMAKE_CXX_COMPILER={self.compiler}",
                 f"-DCONSUMER={self.source}", *arguments)
        targets = [f"consumer{standard}" for standard in STANDARDS]
        if way == "by_find_package":
            targets.append("consumer_static")
        self.run("cmake", "--build", made, "--target", *targets)
        return made

    def find_package(self):
        place = ([] if self.installed else
                 [f"-DCMAKE_PREFIX_PATH={self.prefix}"])
        made = self.configured("by_find_package", *place)
        for standard in STANDARDS:
            self.expect(made / f"consumer{standard}", standard)
        self.expect(made / "consumer_static", "17")
        commands = self.run("ninja", "-C", made, "-t", "commands",
                            "consumer17")
        if "-ffp-contract=off" not in commands:
            sys.exit("the host is not told how to compute")

    def pkg_config(self):
        place = ({} if self.installed else
                 {"PKG_CONFIG_PATH": str(self.libdir / "pkgconfig")})
        flags = self.run("pkg-config", "--cflags", "--libs", "zt_util2",
                         **place)
        folder = self.folder / "by_pkg_config"
        folder.mkdir(exist_ok=True)
        for standard in STANDARDS:
            program = folder / f"consumer{standard}"
            # A shell, as in a Makefile: the folder's name has blanks.
            self.run("sh", "-ec", f"'{self.compiler}' -std=c++{standard} "
                     f"-Wall -Wextra -Werror '{self.source}/consumer.cpp' "
                     f"{flags.strip()} -o '{program}'")
            self.expect(program, standard,
                        "" if self.installed else str(self.libdir))

    def add_subdirectory(self):
        # The flags of the build that the test belongs to, so that the
        # compiler cache has the library already.
        made = self.configured("by_add_subdirectory", f"-DTREE={self.tree}",
                               "-DCMAKE_BUILD_TYPE=Debug",
                               "-DZT_WARNINGS_AS_ERRORS=ON")
        for standard in STANDARDS:
            self.expect(made / f"consumer{standard}", standard)
        shutil.rmtree(made)


def main():
    way, *arguments = sys.argv[1:]
    getattr(Consumer(*arguments), way)()
    print(f"{way}: well")


if __name__ == "__main__":
    main()
