#!/usr/bin/env python3
"""Copies the headers and guides of a tree as Doxygen wants them. No line moves,
so that its messages name the right one.

In headers, what stands behind a label (`Units:`, `Owner:` ...) is set apart,
and a comment above several declarations without a blank line between them is
given to each. In guides, headings and links within and between pages get the
anchors that they have where the source is read.

Usage: for_doxygen.py TREE FOLDER
"""

import pathlib
import re
import sys

LABEL = re.compile(r"^(Requires|Units|Owner|Cursor|Returns|Reports|Context"
                   r"|By design):")
TRIVIAL = re.compile(r"[( ].*(= default|= delete);$")


class Run:
    """A comment, and the declarations that follow at once at its indent."""

    def __init__(self):
        self.text = ""
        self.waiting = True  # for the first declaration
        self.depth = 0
        self.open = False    # within a declaration

    def add(self, line):
        line = LABEL.sub(r"<br>**\1:**", line.strip()[3:].strip())
        self.text += (line or "<br>") + " "

    def take(self, code):
        """Follows a declaration to its end."""
        self.open = True
        self.depth += sum(code.count(c) for c in "({")
        self.depth -= sum(code.count(c) for c in ")}")
        if self.depth == 0 and code.endswith((";", "}")):
            self.open = False


def headers_of(lines):
    runs = {}
    for line in lines:
        code = re.sub(r"//.*", "", line).rstrip()
        indent = len(line) - len(line.lstrip())
        if not line.strip():
            runs = {i: run for i, run in runs.items() if run.open}
            yield line
        elif re.match(r" *///(?!<)", line):
            if indent not in runs or not runs[indent].waiting:
                runs[indent] = Run()
            runs[indent].add(line)
            yield re.sub(r"^( */// ?)(.*)$", lambda m: m[1] + LABEL.sub(
                r"<br>**\1:**", m[2]), line)
        else:
            for i, run in runs.items():
                if i < indent and run.open:
                    run.take(code)
            run = runs.get(indent)
            lead = ""
            if run and code:
                if not run.waiting and not run.open and "///<" not in line:
                    lead = f"/** {run.text}*/ "
                run.waiting = False
                run.take(code)
            elif TRIVIAL.search(code):
                lead = "/** As the compiler does it, if at all. */ "
            yield lead + line


def anchor_of(heading):
    """Gives the anchor that a site for sources makes of a heading."""
    heading = re.sub(r"[`*]", "", heading.strip().lower())
    return re.sub(r"[^\w -]", "", heading).replace(" ", "-")


def guide_of(lines, page):
    in_code = False
    for line in lines:
        if line.startswith("```"):
            in_code = not in_code
        heading = re.match(r"(##+) (.*)$", line)
        if heading and not in_code:
            line = f"{line} {{#{page}-{anchor_of(heading[2])}}}"
        elif not in_code:
            line = re.sub(r"\]\(README[.]md", "](docs.md", line)
            line = re.sub(r"(docs|examples)/README[.]md", r"\1/\1.md", line)
            line = re.sub(r"\]\(#", f"](#{page}-", line)
            line = re.sub(r"\]\((?:[\w./-]*/)?([\w-]+)\.md#", r"](#\1-", line)
        yield line


def main():
    tree, folder = map(pathlib.Path, sys.argv[1:])
    sources = [*tree.glob("*.md"), *tree.glob("docs/*.md"),
               *tree.glob("examples/*.md"), *tree.glob("include/*/*.h")]
    for path in sources:
        lines = path.read_text(encoding="utf-8").splitlines()
        made = folder / path.relative_to(tree)
        if path.stem == "README" and path.parent != tree:
            made = made.with_stem(path.parent.name)  # there is one main page
        made.parent.mkdir(parents=True, exist_ok=True)
        lines = (headers_of(lines) if path.suffix == ".h" else
                 guide_of(lines, made.stem))
        made.write_text("\n".join(lines) + "\n", encoding="utf-8")


if __name__ == "__main__":
    main()
