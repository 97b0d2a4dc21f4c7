#!/usr/bin/env python3
# SPDX-License-Identifier: MIT
"""figures.py SOURCE: tests what scripts/bench writes into its page, which has rows of several systems."""

import os
import sys
import tempfile
import unittest

SOURCE = sys.argv.pop(1)
sys.dont_write_bytecode = True
sys.path.insert(0, os.path.join(SOURCE, "bench"))

import report  # pylint: disable=wrong-import-position


def table(*values, columns=("Nests", "small", "large")):
    made = report.Table(*columns)
    made.row("eggs", values, 9, [len(values)])
    return made


class Page(unittest.TestCase):
    def setUp(self):
        self._folder = tempfile.TemporaryDirectory()
        self.addCleanup(self._folder.cleanup)
        self.page = os.path.join(self._folder.name, "page.md")
        with open(self.page, "w", encoding="utf-8") as file:
            file.write("before\n<!-- bench:begin -->\n<!-- bench:end -->\nafter\n")

    def text(self):
        with open(self.page, encoding="utf-8") as file:
            return file.read()

    def test_has_one_row_a_system_beside_each_other(self):
        report.write_into(self.page, "new: owl", [table("3", "4")], system_name="Owl 13")
        systems = report.write_into(self.page, "old", [table("1", "2")], system_name="Owl 12")
        self.assertEqual(systems, ["Owl 12", "Owl 13"])
        self.assertEqual(self.text(), """before
<!-- bench:begin -->
- Owl 12: old
- Owl 13: new: owl

| Nests | System | small | large | Limit | Verdict |
| --- | --- | ---: | ---: | ---: | --- |
| eggs | Owl 12 | 1 | 2 | ≤ 9 | pass |
| eggs | Owl 13 | 3 | 4 | ≤ 9 | pass |
<!-- bench:end -->
after
""")

    def test_replaces_the_rows_of_the_same_system_only(self):
        for name, value in (("Owl 12", "1"), ("Owl 13", "3"), ("Owl 12", "5")):
            report.write_into(self.page, value, [table(value, value)], system_name=name)
        self.assertIn("- Owl 12: 5\n- Owl 13: 3\n", self.text())
        self.assertIn("| eggs | Owl 12 | 5 | 5 | ≤ 9 | pass |\n| eggs | Owl 13 | 3 |", self.text())
        self.assertNotIn("| 1 |", self.text())

    def test_drops_rows_of_other_columns(self):
        report.write_into(self.page, "old", [table("1", columns=("Nests", "all"))],
                          system_name="Owl 12")
        report.write_into(self.page, "new", [table("3", "4")], system_name="Owl 13")
        self.assertNotIn("| Owl 12 |", self.text())

    def test_names_the_system(self):
        release = os.path.join(self._folder.name, "os-release")
        with open(release, "w", encoding="utf-8") as file:
            file.write('NAME="Debian GNU/Linux"\nVERSION_ID="12"\n\n')
        self.assertEqual(report.system(release), "Debian 12")
        with open(release, "w", encoding="utf-8") as file:
            file.write("NAME=Owl\n")
        self.assertEqual(report.system(release), "Owl")


if __name__ == "__main__":
    unittest.main()
