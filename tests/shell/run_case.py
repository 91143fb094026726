"""Runs one case: the shell with the arguments, files and input that the case
names, and compares what it writes and how it ends.

Usage: run_case.py SHELL TREE CASE [NAME=PLACE...]

A case is a text of sections, each begun by a line "--- NAME". What stands
before the first section says what the case shows.

  --- args        the command line, split as a POSIX shell does; default: none
  --- file NAME   a file in the directory that the shell runs in
  --- program NAME  a file that may be executed
  --- environment  variables of the environment, NAME=VALUE, one a line
  --- bytes NAME  a file, its bytes in hexadecimal; "00*500" is 500 of them
  --- input       standard input; default: empty
  --- output      what standard output must be; default: empty
  --- errors      what standard error must be; default: empty
  --- exit        the exit code; default: 0
  --- made        files that must be there afterwards, one a line

In all of them {dir} is the directory that the shell runs in, {tree} the
project's and {shell} the shell itself, and {NAME} each place that the command
line names. In output and errors {number} stands
for any number and {any} for any text up to the end of the line. {rest} stands
for whatever follows. The mark
<no newline> at the end of a line of a file or of the input joins it to what
follows.
"""

import os
import pathlib
import re
import shlex
import subprocess
import sys
import tempfile

SECONDS = 60


def sections_of(case):
    """Gives (name, text) of each section; a text keeps its newlines."""
    sections = []
    for line in case.read_text(encoding="utf-8").splitlines(keepends=True):
        if line.startswith("--- "):
            sections.append([line[4:].strip(), ""])
        elif sections:
            sections[-1][1] += line
    return sections


def pattern_of(text):
    pattern = re.escape(text)
    pattern = pattern.replace(re.escape("{number}"), r"-?[0-9.]+(e[-+][0-9]+)?")
    pattern = pattern.replace(re.escape("{rest}"), "(?s:.*)")
    return pattern.replace(re.escape("{any}"), "[^\n]*")


def bytes_of(text):
    """Gives the bytes that a section spells out."""
    made = b""
    for word in text.split():
        digits, _, times = word.partition("*")
        made += bytes.fromhex(digits) * int(times or 1)
    return made


def run(shell, tree, case, directory, named):
    texts = {"args": "", "input": "", "output": "", "errors": "", "exit": "0",
             "made": "", "environment": ""}
    places = {"{dir}": str(directory), "{tree}": tree, "{shell}": shell}
    for place in named:
        name, _, path = place.partition("=")
        places["{" + name + "}"] = path
    for name, text in sections_of(case):
        for mark, place in places.items():
            text = text.replace(mark, place)
        kind, _, rest = name.partition(" ")
        if kind in ("file", "program"):
            path = directory / rest
            path.parent.mkdir(parents=True, exist_ok=True)
            path.write_text(text.replace("<no newline>\n", ""),
                            encoding="utf-8")
            if kind == "program":
                path.chmod(0o755)
        elif name.startswith("bytes "):
            (directory / name[6:]).write_bytes(bytes_of(text))
        elif name in texts:
            texts[name] = text
        else:
            raise SystemExit(f"{case}: no section is called {name}")

    # The installation of whoever runs the tests is none of the cases'.
    environment = {name: value for name, value in os.environ.items()
                   if not name.startswith(("QUARN_", "ZT_"))}
    environment.update(LC_ALL="C.UTF-8", HOME=str(directory))
    environment.update(line.split("=", 1)
                       for line in texts["environment"].splitlines())
    done = subprocess.run([shell] + shlex.split(texts["args"]), cwd=directory,
                          input=texts["input"].replace("<no newline>\n", ""),
                          text=True, capture_output=True, timeout=SECONDS,
                          env=environment)
    faults = []
    for name, got in (("output", done.stdout), ("errors", done.stderr)):
        if not re.fullmatch(pattern_of(texts[name]), got):
            faults.append(f"{name} is\n{got}but should be\n{texts[name]}")
    if done.returncode != int(texts["exit"]):
        faults.append(f"exit code {done.returncode}, not {texts['exit']}")
    for made in texts["made"].split():
        if not (directory / made).is_file():
            faults.append(f"{made} was not made")
    return faults


def main():
    shell, tree, case, *named = sys.argv[1:]
    with tempfile.TemporaryDirectory(prefix="zt_case_") as name:
        directory = pathlib.Path(name).resolve()
        faults = run(shell, tree, pathlib.Path(case), directory, named)
    print("\n".join(faults) or "as it should be")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
