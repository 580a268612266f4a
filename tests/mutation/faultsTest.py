#!/usr/bin/env python3
# SPDX-License-Identifier: BSL-1.0
"""Tests which faults are put into a source."""
import pathlib
import sys
import unittest

sys.path.insert(0, str(pathlib.Path(__file__).parent))
import faults  # noqa: E402


def faulty(source: str, kind: str) -> list[str]:
    return [fault.put_into(source) for fault in faults.faults_of(source) if fault.kind == kind]


class Faults(unittest.TestCase):
    def test_comparisons_are_turned(self) -> None:
        self.assertEqual(faulty("x = a < b;", "comparison"), ["x = a <= b;"])
        self.assertEqual(faulty("x = a == b && c != d;", "comparison"),
                         ["x = a != b && c != d;", "x = a == b && c == d;"])
        self.assertEqual(faulty("std::vector<int> a; a->b(); a << b;", "comparison"), [])

    def test_constants_are_one_more_or_less(self) -> None:
        self.assertEqual(faulty("f(7);", "constant"), ["f(6);", "f(8);"])
        self.assertEqual(faulty("f(0);", "constant"), ["f(1);"])
        self.assertEqual(faulty("f(x2, 1.5, 0x7f, 1'000);", "constant"), [])

    def test_conditions_are_negated(self) -> None:
        self.assertEqual(faulty("if (a && (b || c)) d();", "condition"),
                         ["if (!(a && (b || c))) d();"])
        self.assertEqual(faulty("while (a == b) c();", "condition"), ["while (!(a == b)) c();"])
        self.assertEqual(faulty("if (const int a = f()) g();", "condition"), [])

    def test_statements_are_dropped(self) -> None:
        self.assertEqual(faulty("{\n    a.b(1);\n}", "statement"), ["{\n    ;\n}"])
        self.assertEqual(faulty("{\n    ++a;\n    b = c;\n}", "statement"),
                         ["{\n    ;\n    b = c;\n}", "{\n    ++a;\n    ;\n}"])
        self.assertEqual(faulty("{\n    return a(1);\n    int b = 2;\n}", "statement"), [])
        self.assertEqual(faulty("{\n    f(a,\n      b);\n}", "statement"), [])

    def test_returned_values_are_changed(self) -> None:
        self.assertEqual(faulty("return true;", "return"), ["return false;"])
        self.assertEqual(faulty("return a + b;", "return"), ["return {};"])
        self.assertEqual(faulty("return;", "return"), [])

    def test_what_is_no_code_stays(self) -> None:
        for text in ('// a < b\n', '/* if (a) b(); */', 'f("a < 1");', "f('<');", "#if A < 1\n",
                     'R"(return 1;)";'):
            self.assertEqual(faults.faults_of(text), [], text)

    def test_lines_are_counted_from_one(self) -> None:
        source = "\n// 1\nx = a < b;"
        self.assertEqual([fault.line(source) for fault in faults.faults_of(source)], [3])


if __name__ == "__main__":
    unittest.main()
