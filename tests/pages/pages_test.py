"""Reads the pages of a tool as people do: the manual by man, without a warning
and with every option of the tool's help in it; the completions by a real bash,
zsh or fish.

Usage: pages_test.py KIND NAME FOLDER PROGRAM

FOLDER holds a folder for each KIND with the page of the tool called NAME.
"""

import os
import pathlib
import re
import subprocess
import sys
import tempfile

sys.path.insert(0, str(pathlib.Path(__file__).parent.parent / "shell"))
from terminal import Terminal  # noqa: E402


def output_of(*command, **more):
    done = subprocess.run(command, text=True, capture_output=True, timeout=50,
                          check=True, **more)
    if done.stderr:
        sys.exit(f"{command}: {done.stderr}")
    return done.stdout


def options_of(program):
    options = re.findall(r"^ +(?:-\w,)?(--[\w-]+)",
                         output_of(program, "--help"), re.M)
    if len(options) < 2:
        sys.exit(f"the help of {program} shows {options}")
    return options


def check_man(name, folder, program):
    # One word a line would be broken at its hyphen.
    text = output_of("man", "--warnings=all", "--nh", "-E", "ascii", "-l",
                     folder / f"{name}.1",
                     env=dict(os.environ, MANWIDTH="100", LC_ALL="C.UTF-8"))
    for wanted in ["NAME", "SYNOPSIS", "DESCRIPTION", "OPTIONS", "EXIT",
                   *options_of(program)]:
        if wanted not in text:
            sys.exit(f"the manual does not say {wanted}:\n{text}")
    for fault in ("..\n", "\\f", "\n."):
        if fault in text:
            sys.exit(f"the manual has {fault!r} in it:\n{text}")


def in_a_shell(command, start, name, program):
    """Types the beginning of every option, and of the name of a file."""
    with tempfile.TemporaryDirectory(prefix="zt_pages_") as directory:
        pathlib.Path(directory, "only file").touch()
        shell = Terminal(command, directory,
                         {"PS1": "> ", "HOME": directory, "TERM": "dumb",
                          "LC_ALL": "C.UTF-8"}, columns=200)
        shell.type(start + "; echo rea'dy'\n")
        shell.wait_for("ready")
        for option in options_of(program):
            shell.type(f"{name} {option[:-1]}\t")
            shell.wait_for(option)
            shell.type("\x15")
        if "[script...]" in output_of(program, "--help"):
            shell.type(f"{name} on\t")
            shell.wait_for("only\\ file")
            shell.type("\x15")
        shell.type("exit\n")
        shell.end()


def check_bash(name, folder, program):
    in_a_shell(["/bin/bash", "--norc", "--noprofile", "-i"],
               f"source '{folder}/{name}'", name, program)


def check_zsh(name, folder, program):
    in_a_shell(["/usr/bin/zsh", "-f", "-i"],
               f"unset zle_bracketed_paste; fpath=('{folder}' $fpath); "
               "autoload -Uz compinit; compinit -u -D", name, program)


def check_fish(name, folder, program):
    page = folder / f"{name}.fish"
    for option in options_of(program):
        found = output_of("fish", "--no-config", "-c",
                          f"source '{page}'; complete -C'{name} {option}'",
                          env=dict(os.environ, HOME=str(folder)))
        if option not in re.split(r"\s", found):
            sys.exit(f"fish does not offer {option}: {found}")


def main():
    kind, name, pages, program = sys.argv[1:]
    folder = pathlib.Path(pages) / kind
    globals()["check_" + kind](name, folder, program)
    print(f"{kind}: well")


if __name__ == "__main__":
    main()
