# SPDX-License-Identifier: BSL-1.0
"""Tests benchmarks/page.py: what it writes of a run into a page, and that its picture fits the page.

  figuresTest.py SOURCE
"""
import json
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

source = Path(sys.argv.pop())
BEGIN, END = (line for line in (source / "docs/performance.md").read_text(encoding="utf-8").split("\n")
              if line.startswith("<!-- The figures"))
FIGURES = {
    "compiler": "GCC 99", "options": "-O2", "repetitions": 25,
    "times": [{"name": "cast/null", "work": "a null cast", "limit": "one call", "workNanoseconds": 3.0,
               "limitNanoseconds": 2.0, "ratio": 1.5, "reach": 1.2, "peerReach": 0.5,
               "peers": [{"name": "slower", "nanoseconds": 12}, {"name": "faster", "nanoseconds": 4}]},
              {"name": "start/first", "work": "a start", "limit": "by hand", "workNanoseconds": 2.5e6,
               "limitNanoseconds": 2e6, "ratio": 1.25}],
    "memory": [{"name": "memory/library", "work": "each library", "limit": "a map", "workBytes": 950,
                "limitBytes": 500}]}


class Figures(unittest.TestCase):
    def setUp(self):
        self.folder = tempfile.TemporaryDirectory()
        self.addCleanup(self.folder.cleanup)
        root = Path(self.folder.name)
        self.page, self.pictures, self.figures = root / "page.md", root / "pictures", root / "figures.json"
        self.pictures.mkdir()
        self.page.write_text("*Our time, divided by theirs*, *by the best peer's*, *by the limit's*\n"
                             f"![](pictures/plot.svg)\n{BEGIN}\nold figures\n{END}\nthe end\n", encoding="utf-8")

    def write(self, figures=FIGURES, missing=()):
        self.figures.write_text(json.dumps(figures), encoding="utf-8")
        return subprocess.run([sys.executable, "-B", source / "benchmarks/page.py", self.figures, self.page,
                               self.pictures / "plot.svg", *missing], capture_output=True, text=True, check=False)

    def test_replaces_only_the_figures(self):
        for _ in range(2):
            self.assertEqual(self.write().returncode, 0)
            text = self.page.read_text(encoding="utf-8")
            self.assertNotIn("old figures", text)
            self.assertTrue(text.startswith("*Our time") and text.endswith(f"{END}\nthe end\n"))
            self.assertEqual(text.count("| a start |"), 1)

    def test_compares_with_the_fastest_peer_and_the_limit(self):
        self.write()
        text = self.page.read_text(encoding="utf-8")
        self.assertIn("| a null cast | 3 ns | faster: 4 ns | **0.75** | one call: 2 ns | **1.50** | "
                      "1.2 of limit, 0.5 of peer |", text)
        self.assertIn("| a start | 2.5 ms | – | – | by hand: 2 ms | **1.25** | – |", text)
        self.assertIn("| a null cast | 3 ns | faster 4 ns, slower 12 ns |", text)
        self.assertIn("| each library | 950 B | a map: 500 B | 1.90 |", text)

    def test_names_the_peers_that_are_missing(self):
        self.write(missing=["fmt", "Qt 6"])
        self.assertIn("not measured: fmt, Qt 6.", self.page.read_text(encoding="utf-8"))

    def test_a_picture_of_other_figures_does_not_fit_the_page(self):
        self.write()
        check = [sys.executable, "-B", source / "tests/documentation/pictures.py", self.pictures, self.page]
        (self.pictures / "a.dot").write_text('label = "word"', encoding="utf-8")
        (self.pictures / "a.svg").write_text("<text>word</text>", encoding="utf-8")
        with self.page.open("a", encoding="utf-8") as page:
            page.write("![](pictures/a.svg)\n")
        fits = subprocess.run(check, capture_output=True, text=True, check=False)
        self.assertEqual((fits.returncode, fits.stdout), (0, "1 pictures\n"))
        picture = self.pictures / "plot.svg"
        picture.write_text(picture.read_text(encoding="utf-8").replace("0.75 of faster", "0.74 of faster"),
                           encoding="utf-8")
        self.assertIn("0.74", subprocess.run(check, capture_output=True, text=True, check=False).stdout)

    def test_a_page_without_a_place_for_figures_is_refused(self):
        self.page.write_text("no place\n", encoding="utf-8")
        self.assertNotEqual(self.write().returncode, 0)
        self.assertEqual(self.page.read_text(encoding="utf-8"), "no place\n")


if __name__ == "__main__":
    unittest.main()
