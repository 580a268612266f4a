#!/usr/bin/env python3
# SPDX-License-Identifier: BSL-1.0
"""Tests which faults are chosen, and that others do not change their order."""
import collections
import pathlib
import sys
import tempfile
import unittest

sys.path.insert(0, str(pathlib.Path(__file__).parent))
import choice  # noqa: E402

SOURCE = "".join(f"int f{n}() {{\n    if (a < {n})\n        b = {n};\n    return {n};\n}}\n"
                 for n in range(9))


class Choices(unittest.TestCase):
    def chosen(self, count: int, seed: int, **sources: str) -> list[choice.Choice]:
        with tempfile.TemporaryDirectory() as folder:
            top = pathlib.Path(folder)
            for name, source in sources.items():
                (top / name).write_text(source, encoding="utf-8")
            return choice.chosen(sorted(sources), top, count, seed)

    def test_are_equal_for_equal_seeds_alone(self) -> None:
        self.assertEqual(self.chosen(20, 1, a=SOURCE), self.chosen(20, 1, a=SOURCE))
        self.assertNotEqual(self.chosen(20, 1, a=SOURCE), self.chosen(20, 2, a=SOURCE))

    def test_begin_with_those_of_a_smaller_number(self) -> None:
        self.assertEqual(self.chosen(7, 1, a=SOURCE), self.chosen(20, 1, a=SOURCE)[:7])

    def test_have_as_many_of_each_kind(self) -> None:
        kinds = collections.Counter(one.fault.kind for one in self.chosen(25, 1, a=SOURCE))
        self.assertEqual(set(kinds.values()), {5})
        self.assertEqual(len(kinds), 5)

    def test_are_all_where_there_are_fewer(self) -> None:
        everything = self.chosen(10_000, 1, a=SOURCE)
        self.assertEqual(len(everything), len(choice.choices_in("a", SOURCE)))
        self.assertEqual(len(set(everything)), len(everything))
        self.assertEqual(self.chosen(5, 1, a=""), [])

    def test_keep_their_order_when_the_sources_change(self) -> None:
        before = self.chosen(10_000, 1, a=SOURCE)
        after = self.chosen(10_000, 1, a="// A line.\nint x = y + 77;\n" + SOURCE, b="f(1);\n")
        for kind in {one.fault.kind for one in before}:
            known = {one for one in before if one.fault.kind == kind}
            self.assertEqual([one for one in before if one in known],
                             [one for one in after if one in known])

    def test_differ_in_equal_lines(self) -> None:
        twice = choice.choices_in("a", "if (a)\n    b();\nif (a)\n    c();\n")
        conditions = [one for one in twice if one.fault.kind == "condition"]
        self.assertEqual([one.nth for one in conditions], [0, 1])
        self.assertEqual({(one.old, one.new) for one in conditions}, {("if (a)", "if (!(a))")})


if __name__ == "__main__":
    unittest.main()
