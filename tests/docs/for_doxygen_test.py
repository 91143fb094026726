"""What Doxygen is given: comments that several declarations share, labels,
anchors, and what stays without a comment so that it is complained about.

Usage: for_doxygen_test.py
"""

import pathlib
import shutil
import subprocess
import sys
import tempfile
import unittest

TREE = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(TREE / "docs/reference"))
from for_doxygen import guide_of, headers_of  # noqa: E402


def header(text):
    return list(headers_of(text.splitlines()))


class Headers(unittest.TestCase):
    def test_a_comment_is_shared_up_to_the_next_blank_line(self):
        self.assertEqual(
            header("/// Does it.\nint a(int x,\n      int y);\nint b();\n\n"
                   "int c();"),
            ["/// Does it.", "int a(int x,", "      int y);",
             "/** Does it. */ int b();", "", "int c();"])

    def test_a_body_is_no_declaration(self):
        self.assertEqual(
            header("/// Does it.\nint a()\n{\n    return 1;\n}\nint b();"),
            ["/// Does it.", "int a()", "{", "    return 1;", "}",
             "/** Does it. */ int b();"])

    def test_a_member_with_a_comment_of_its_own_keeps_that(self):
        lines = "    /// One.\n    int a;\n    int b; ///< Two."
        self.assertEqual(header(lines), lines.splitlines())

    def test_a_label_stands_apart(self):
        self.assertEqual(header("/// Units: bytes.\nint a;"),
                         ["/// <br>**Units:** bytes.", "int a;"])


class Guides(unittest.TestCase):
    def test_headings_and_links_get_the_anchors_of_the_page(self):
        self.assertEqual(
            list(guide_of(["## Two words", "[a](#two-words)",
                           "[b](other.md#part)", "```sh", "## no", "```"],
                          "page")),
            ["## Two words {#page-two-words}", "[a](#page-two-words)",
             "[b](#other-part)", "```sh", "## no", "```"])


class Site(unittest.TestCase):
    def test_a_public_name_without_a_comment_is_an_error(self):
        with tempfile.TemporaryDirectory(prefix="zt_site_") as name:
            tree = pathlib.Path(name)
            (tree / "docs/pictures").mkdir(parents=True)
            shutil.copytree(TREE / "docs/reference", tree / "docs/reference")
            (tree / "scripts").mkdir()
            shutil.copy(TREE / "scripts/make-docs", tree / "scripts")
            (tree / "README.md").write_text("# Page\n", encoding="utf-8")
            (tree / "include/KVO").mkdir(parents=True)
            (tree / "include/KVO/KvoOne.h").write_text(
                "/// \\file\n/// One.\n\n/// Is told.\nint told();\n\n"
                "int untold();\n", encoding="utf-8")
            done = subprocess.run([tree / "scripts/make-docs"], text=True,
                                  capture_output=True, timeout=60,
                                  check=False)
        self.assertNotEqual(done.returncode, 0)
        self.assertIn("KvoOne.h:7: error: Member untold()", done.stderr)
        self.assertNotIn("Member told()", done.stderr)


if __name__ == "__main__":
    unittest.main()
