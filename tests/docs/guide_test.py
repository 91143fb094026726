"""Builds and runs every code block of a guide, in the order of the page, and
follows its links.

Usage: guide_test.py PAGE TREE PREFIX LIBDIR COMPILER

PREFIX is where the library is installed. All blocks of a page run in one
temporary directory, in which `examples` and `plugins` are the project's, the
latter for includes too. A block begins with the name of its language:

  cpp    a complete program: built against the installed library and run
  zt     a script: run by ztsh
  sh     commands for the system's shell
  cmake  contents of a file
  text   behind one of these: what it writes; elsewhere an illustration

In a text, `...` stands for anything: alone on a line for any lines. A comment
of the page that stands right before a block says more about it:

  <!-- file: NAME -->    the block is written to a file, and not run
  <!-- exit: N -->       how the script or the commands end, if not with 0
  <!-- around: TEXT -->  TEXT, of several lines, is put around a fragment, in
                         place of a line @
  <!-- elsewhere: WHY --> it is run by another test, which is named

and one by itself, `<!-- run: TEXT -->`, is run like a block of sh.
"""

import os
import pathlib
import re
import subprocess
import sys
import tempfile

SECONDS = 120
PARTS = re.compile(
    r"<!-- (?P<mark>file|exit|around|elsewhere|run):[ \n](?P<value>.*?)\s*-->"
    r"|^```(?P<language>[^\n]*)\n(?P<block>.*?)^```$", re.S | re.M)
LANGUAGES = ("cpp", "zt", "sh", "cmake", "text")


def fail(place, text):
    sys.exit(f"{place}: {text}")


def pattern_of(text):
    """Gives the pattern of an expected text with its three dots."""
    lines = []
    for line in text.splitlines():
        if line.strip() == "...":
            lines.append("(?:[^\n]*\n)*?")
        else:
            lines.append(re.escape(line).replace(r"\.\.\.", "[^\n]*") + "\n")
    return "".join(lines)


class Page:
    def __init__(self, page, tree, prefix, libdir, compiler, directory):
        self.page = pathlib.Path(page)
        self.tree = pathlib.Path(tree)
        self.prefix = prefix
        self.compiler = compiler
        self.directory = directory
        self.count = 0
        for folder in ("examples", "plugins"):
            (directory / folder).symlink_to(self.tree / folder)
        self.environment = dict(
            os.environ, LC_ALL="C.UTF-8", HOME=str(directory),
            PATH=f"{prefix}/bin:{os.environ['PATH']}",
            LD_LIBRARY_PATH=f"{prefix}/{libdir}",
            CMAKE_PREFIX_PATH=prefix,
            PKG_CONFIG_PATH=f"{prefix}/{libdir}/pkgconfig")

    def run(self, *command):
        """Gives what a command writes to both its outputs, and its code."""
        done = subprocess.run(command, cwd=self.directory, text=True,
                              stdin=subprocess.DEVNULL, timeout=SECONDS,
                              stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                              env=self.environment, check=False)
        return done.stdout, done.returncode

    def expect(self, place, got, code, marks, wanted):
        if code != int(marks.get("exit", 0)):
            fail(place, f"ended with {code}:\n{got}")
        if wanted is not None and not re.fullmatch(pattern_of(wanted), got):
            fail(place, f"writes\n{got}and not\n{wanted}")

    def do_cpp(self, place, block, marks, wanted):
        if "int main(" not in block:
            fail(place, "neither a program nor a fragment with its around")
        source = self.directory / f"block{self.count}.cpp"
        source.write_text(block, encoding="utf-8")
        # By the shell, which understands pkg-config's escapes.
        said, code = self.run(
            "sh", "-ec", f"flags=$(pkg-config --cflags --libs zt_util2)\n"
            f"eval \"'{self.compiler}' -std=c++20 -Wall -Wextra -Werror "
            f"-I. -Iplugins '{source}' -o '{source}.out' $flags\"")
        if code != 0:
            fail(place, f"does not compile:\n{said}")
        self.expect(place, *self.run(f"{source}.out"), marks, wanted)

    def do_zt(self, place, block, marks, wanted):
        script = self.directory / f"block{self.count}.zt"
        script.write_text(block, encoding="utf-8")
        self.expect(place, *self.run("ztsh", script.name), marks,
                    wanted)

    def do_sh(self, place, block, marks, wanted):
        self.expect(place, *self.run("sh", "-ec", block), marks, wanted)

    def do_cmake(self, place, block, marks, wanted):
        fail(place, "says no file to write it to")

    def do_blocks(self):
        text = self.page.read_text(encoding="utf-8")
        parts = list(PARTS.finditer(text))
        marks = {}
        for part, after in zip(parts, parts[1:] + [None]):
            place = f"{self.page}:{text[:part.start()].count(chr(10)) + 1}"
            if part["mark"] == "run":
                self.do_sh(place, part["value"], {}, None)
            elif part["mark"]:
                marks[part["mark"]] = part["value"]
            elif part["language"] not in LANGUAGES:
                fail(place, f"a block of {part['language'] or 'no language'}")
            elif part["language"] != "text":
                between = (text[part.end():after.start()] if after else "")
                shown = (after and after["language"] == "text" and
                         between.count("\n\n") <= 2 and "\n#" not in between)
                self.count += 1
                self.do_block(place, part, marks,
                              after["block"] if shown else None)
                marks = {}

    def do_block(self, place, part, marks, wanted):
        block = part["block"]
        if "around" in marks:
            before, mark, after = f"\n{marks['around']}\n".partition("\n@\n")
            if not mark:
                fail(place, "no line @ in what is around")
            block = f"{before}\n{block}{after}"
        if "elsewhere" in marks:
            print(f"{place}: run by {marks['elsewhere']}")
        elif "file" in marks:
            (self.directory / marks["file"]).write_text(block,
                                                        encoding="utf-8")
        else:
            getattr(self, "do_" + part["language"])(place, block, marks,
                                                    wanted)

    def follow_links(self):
        text = re.sub(r"^```.*?^```$", "",
                      self.page.read_text(encoding="utf-8"), flags=re.S | re.M)
        for target in re.findall(r"\]\(([^)\s]+)\)", text):
            name, _, anchor = target.partition("#")
            if "://" in name:
                continue
            path = (self.page.parent / name).resolve() if name else self.page
            if not path.exists():
                fail(self.page, f"{target} leads nowhere")
            if anchor and anchor not in anchors_of(path):
                fail(self.page, f"{target}: no such heading")


def anchors_of(path):
    sys.path.insert(0, str(pathlib.Path(__file__).parents[2] /
                           "docs/reference"))
    from for_doxygen import anchor_of  # pylint: disable=all
    headings = re.findall(r"^#+ (.*)$", path.read_text(encoding="utf-8"), re.M)
    return {anchor_of(heading) for heading in headings}


def main():
    with tempfile.TemporaryDirectory(prefix="zt_guide_") as name:
        page = Page(*sys.argv[1:], pathlib.Path(name).resolve())
        page.follow_links()
        page.do_blocks()
        print(f"{page.count} blocks")


if __name__ == "__main__":
    main()
