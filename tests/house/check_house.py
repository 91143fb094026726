"""Checks what no compiler sees: sizes, guards, room lists and stale README paths.

Usage: check_house.py TREE
"""

import pathlib
import re
import sys

MOST_LINES_OF_A_SOURCE = 600
MOST_LINES_OF_THE_ROOT_LIST = 80
ROOMS = ("platform core diag command env time geometry sound image "
         "host").split()


def lines_of(path):
    return path.read_text(encoding="utf-8").splitlines()


def check_sizes(root):
    for path in sorted((root / "src").rglob("*.cpp")):
        if len(lines_of(path)) > MOST_LINES_OF_A_SOURCE:
            yield f"{path}: longer than {MOST_LINES_OF_A_SOURCE} lines"
    if len(lines_of(root / "CMakeLists.txt")) > MOST_LINES_OF_THE_ROOT_LIST:
        yield f"CMakeLists.txt: longer than {MOST_LINES_OF_THE_ROOT_LIST} lines"


def check_guards(root):
    for path in sorted((root / "include").rglob("*.h")):
        guard = re.sub(r"[/.]", "_", str(path.relative_to(root / "include")))
        text = path.read_text(encoding="utf-8")
        if f"#ifndef {guard.upper()}\n#define {guard.upper()}\n" not in text:
            yield f"{path}: the guard is not {guard.upper()}"
        if "/// \\file" not in text:
            yield f"{path}: no paragraph says what the file is for"


def check_rooms(root):
    for room in ROOMS:
        folder = root / "src" / room
        listed = re.findall(r"^\s+(\S+\.cpp)$",
                            (folder / "CMakeLists.txt").read_text(), re.M)
        if listed != sorted(listed, key=str.lower):
            yield f"{folder}: the list of files is not alphabetical"
        present = {str(p.relative_to(folder)) for p in folder.rglob("*.cpp")}
        if present != set(listed):
            yield f"{folder}: list and folder differ: {present ^ set(listed)}"
        if present and not (folder / "README.md").exists():
            yield f"{folder}: no README.md"


def check_paths_in_readme(root):
    text = (root / "README.md").read_text(encoding="utf-8")
    for name in re.findall(r"`((?:src|include|tests|tools|docs|examples)/[^`*<]*)`",
                           text):
        if not (root / name).exists():
            yield f"README.md: {name} does not exist"


def check_program_in_readme(root):
    shown = re.search(r"```cpp\n(.*?)```",
                      (root / "README.md").read_text(encoding="utf-8"), re.S)
    program = (root / "examples/hello.cpp").read_text(encoding="utf-8")
    if shown is None or shown.group(1) != program:
        yield "README.md: the program shown is not examples/hello.cpp"


def check_pages_and_examples_are_listed(root):
    for listing, patterns in (("docs/README.md", ("*.md",)),
                              ("examples/README.md", ("*.cpp", "*.zt"))):
        text = (root / listing).read_text(encoding="utf-8")
        for pattern in patterns:
            for path in sorted((root / listing).parent.glob(pattern)):
                if path.name != "README.md" and f"({path.name})" not in text:
                    yield f"{listing}: does not list {path.name}"


def check_kept_interface_has_no_place(root):
    """What the interface is compared with says nothing of where it was made."""
    for path in sorted((root / "abi").glob("*.abi")):
        if "path='/" in path.read_text(encoding="utf-8"):
            yield f"abi/{path.name}: names files of one machine"


def main():
    root = pathlib.Path(sys.argv[1])
    faults = [fault
              for check in (check_sizes, check_guards, check_rooms,
                            check_paths_in_readme, check_program_in_readme,
                            check_pages_and_examples_are_listed,
                            check_kept_interface_has_no_place)
              for fault in check(root)]
    print("\n".join(faults) or "house: all well")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
