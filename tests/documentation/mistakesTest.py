# SPDX-License-Identifier: BSL-1.0
"""Tests that the other scripts of this folder find mistakes on pages."""
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

sys.dont_write_bytecode = True
from blocks import PageError, parse

HERE = Path(__file__).parent


class Page(unittest.TestCase):
    def setUp(self):
        self.folder = tempfile.TemporaryDirectory()
        self.page = Path(self.folder.name) / "page.md"

    def tearDown(self):
        self.folder.cleanup()

    def write(self, text):
        self.page.write_text(text, encoding="utf-8")
        return self.page

    def script(self, name, *arguments):
        done = subprocess.run([sys.executable, "-B", HERE / name, *arguments], text=True,
                              stdout=subprocess.PIPE, stderr=subprocess.STDOUT)
        return done.returncode, done.stdout

    def run_page(self, text):
        return self.script("run.py", self.write(text), "--build", self.folder.name, "--source",
                           self.folder.name, "--programs", self.folder.name, "--work",
                           str(self.page.parent / "work"))


class Kinds(Page):
    def refused(self, text, reason):
        with self.assertRaisesRegex(PageError, reason):
            parse(self.write(text))

    def test_a_block_without_a_known_kind_is_refused(self):
        for language in ("", "c++", "bash", "python", "text"):
            self.refused(f"Text.\n\n```{language}\nx\n```\n", "no known kind")

    def test_a_block_that_does_not_end_is_refused(self):
        self.refused("```cpp\nint a;\n", "no end")

    def test_an_indented_block_is_refused(self):
        self.refused("Text.\n\n    int a;\n", "indented")

    def test_an_unknown_or_lonely_comment_is_refused(self):
        self.refused("<!-- skipped -->\n```cpp\nint a;\n```\n", "unknown comment")
        self.refused("<!-- diagram -->\n\nText.\n", "without a block")

    def test_not_run_needs_a_reason(self):
        self.refused("<!-- not run -->\n```sh\nls\n```\n", "reason")
        self.refused("<!-- not run: slow -->\n```cpp\nint a;\n```\n", "reason")

    def test_output_belongs_to_a_program(self):
        items = parse(self.write("```cpp\nint main() {}\n```\n\n```text\nx\n```\n"))
        self.assertEqual([item.kind for item in items], ["program", "output"])


class Tested(Page):
    def extracted(self, name):
        (self.page.parent / "CMakeLists.txt").write_text("add_test(NAME Known.Test)")
        self.write(f"<!-- tested: {name} -->\n```sh\nls\n```\n")
        return self.script("extract.py", self.page.parent / "out", self.page.parent,
                           self.page.parent, "linux", self.page)[0]

    def test_the_test_of_a_block_exists(self):
        self.assertEqual(self.extracted("Known.Test"), 0)
        self.assertEqual(self.extracted("Unknown.Test"), 1)


class Commands(Page):
    def test_equal_output_passes(self):
        status, text = self.run_page("```console\n$ printf 'a\\nb\\n'\na\nb\n$ cd / && pwd\n/\n```\n")
        self.assertEqual(status, 0, text)

    def test_other_output_fails(self):
        self.assertEqual(self.run_page("```console\n$ echo a\nb\n```\n")[0], 1)
        self.assertEqual(self.run_page("```console\n$ echo a\n```\n")[0], 1)
        self.assertEqual(self.run_page("```console\n$ true\na\n```\n")[0], 1)

    def test_dots_stand_for_any_text(self):
        page = "```console\n$ printf 'a\\nb\\nc 1\\n'\na\n…\nc …\n```\n"
        self.assertEqual(self.run_page(page)[0], 0)
        self.assertEqual(self.run_page(page.replace("c …", "d …"))[0], 1)

    def test_the_status_counts(self):
        self.assertEqual(self.run_page("```console\n$ false\n```\n")[0], 1)
        self.assertEqual(self.run_page("```console\n$ false   # ends with 1\n```\n")[0], 0)
        self.assertEqual(self.run_page("```sh\nfalse\ntrue\n```\n")[0], 1)


class Links(Page):
    def links(self, text):
        return self.script("links.py", self.folder.name, self.write(text))

    def test_links_to_headings_and_files(self):
        status, text = self.links("# A `b`, c\n\n[x](#a-b-c) [y](page.md#a-b-c)\n")
        self.assertEqual(status, 0, text)

    def test_dead_links(self):
        for link in ("#b", "other.md", "page.md#b"):
            status, text = self.links(f"# A\n\n[x]({link})\n")
            self.assertEqual(status, 1, text)
            self.assertIn("page.md:3: " + link, text)

    def test_two_headings_with_one_anchor(self):
        self.assertEqual(self.links("# A\n\n## A\n\n[x](#a)\n")[0], 1)

    def test_headings_in_code_are_none(self):
        self.assertEqual(self.links("```sh\n# A\n```\n\n[x](#a)\n")[0], 1)


class Headings(Page):
    def headings(self, text):
        source = self.page.parent / "source"
        source.write_text('{"one"}, {"two"}')
        return self.script("headings.py", self.write(text), r'"(\w+)"', source)[0]

    def test_each_name_needs_a_heading(self):
        self.assertEqual(self.headings("### `one`\n### two (Linux)\n"), 0)
        self.assertEqual(self.headings("### `one`\n"), 1)
        self.assertEqual(self.headings("### one\n### two\n### three\n"), 1)


class Proofs(Page):
    CMAKE = """function(add_page_test name)
  add_test(NAME ${MZ_BUILD_NAME}/Pages.${name} COMMAND x)
endfunction()
function(add_rule_test name)
  add_test(NAME ${MZ_BUILD_NAME}/${name} COMMAND x)
endfunction()
add_page_test(AreThere)
foreach(rule layers
    circles)
  add_rule_test(Tree.${rule} x)
endforeach()
foreach(library IN LISTS libraries)
  add_rule_test(Exports.${library} x)
endforeach()
add_test(NAME ${MZ_BUILD_NAME}/Host.Works COMMAND x)
"""

    def setUp(self):
        super().setUp()
        (self.page.parent / "tests").mkdir()
        (self.page.parent / "tests" / "CMakeLists.txt").write_text(self.CMAKE)
        (self.page.parent / "tests" / "test.cpp").write_text(
            "TEST(Scan, Ends) {\nTYPED_TEST(Both, Read) {\nTEST(Scan, DISABLED_Waits) {\n// TEST(Scan, Was) {\n")
        (self.page.parent / "run").write_text("case $1 in\nfuzz) fuzz ;;\n")

    def proofs(self, proof, heading="proof"):
        return self.script("proofs.py", self.folder.name,
                           self.write(f"| promise | {heading} |\n|---|---|\n| a | {proof} |\n"))

    def test_each_proof_is_a_test(self):
        for name in ("Scan.Ends", "Scan.*", "Both.Read", "Pages.AreThere", "Tree.layers", "Tree.circles",
                     "Exports.*", "Host.Works", "./run fuzz"):
            status, text = self.proofs(f"`{name}`")
            self.assertEqual(status, 0, text)

    def test_other_names_are_none(self):
        for name in ("Scan.End", "Scn.*", "Scan.DISABLED_Waits", "Scan.Was", "Pages.AreGone", "Tree.rule",
                     "Exports.MZbase", "Exports.IN", "Ends", "./run fuz"):
            status, text = self.proofs(f"`Scan.Ends`, `{name}`", "test")
            self.assertEqual(status, 1, name)
            self.assertEqual(text, f"page.md:3: there is no test {name}\n")

    def test_each_row_needs_a_proof(self):
        self.assertEqual(self.proofs("Scan.Ends")[0], 1)

    def test_a_page_needs_a_table(self):
        self.assertEqual(self.proofs("`Scan.Ends`", "why")[0], 1)


unittest.main()
