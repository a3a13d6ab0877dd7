# SPDX-License-Identifier: MIT
"""The generator of manual pages takes nothing for an order, and refuses what it does not know."""

import os
import re
import subprocess
import sys
import tempfile
import unittest

GENERATOR = os.environ["QNS_MAN_PAGE"]


class TheGenerator(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.page, self.manual = (os.path.join(folder.name, name) for name in ("in", "out"))

    def generate(self, text, *options):
        with open(self.page, "w", encoding="utf-8") as file:
            file.write("# Title\n\n" + text + "\n")
        return subprocess.run([sys.executable, GENERATOR, self.page, "name", "7", "what it is",
                               "--output", self.manual, *options],
                              stderr=subprocess.PIPE, check=False, encoding="utf-8")

    def shown(self, text, *options):
        self.assertEqual(self.generate(text, *options).returncode, 0)
        lines = subprocess.run(["mandoc", "-T", "utf8", self.manual], check=True,
                               stdout=subprocess.PIPE, encoding="utf-8").stdout
        return re.sub(".\x08", "", lines)

    def test_takes_no_text_for_an_order(self):
        for text in (".TH is no order", "'quoted' begins a line", "a \\fB is no font",
                     "```\n.nf\n'br\n```", "- .item", "| a |\n|---|\n| .cell of 'text' |"):
            with self.subTest(text):
                words = text.strip("`-| \n").split("\n")[-1].strip("| ")
                self.assertIn(words, self.shown(text))

    def test_shows_what_is_between_bars_of_a_table(self):
        self.assertRegex(self.shown("| one | two |\n|---|---|\n| a\\|b | |"), r"a\|b")

    def test_breaks_wide_tables_into_lines(self):
        wide = " ".join(["word"] * 40)
        lines = self.shown(f"| one | two |\n|---|---|\n| {wide} | {wide} |").splitlines()
        self.assertLessEqual(max(map(len, lines)), 80)
        self.assertEqual(" ".join(lines).count("word"), 80)

    def test_leaves_sections_out(self):
        text = "## Kept\n\nstays\n\n## Install\n\ngoes\n\n### Deeper\n\ngoes\n\n## Also kept\n\nstays"
        shown = self.shown(text, "--without", "Install")
        self.assertEqual((shown.count("stays"), shown.count("goes")), (2, 0))

    def test_names_the_manual_page_that_a_link_leads_to(self):
        self.assertIn("qnsmedia-protocol(7)", self.shown("see [there](protocol.md#encoding)"))
        self.assertIn("see there.", self.shown("see [there](../elsewhere.cpp)."))

    def test_refuses_what_it_does_not_know(self):
        for text in ("> quoted", "![picture](a.png)", "<b>bold</b>", "#### Too deep",
                     "    indented", "- item\n  - nested"):
            with self.subTest(text):
                self.assertNotEqual(self.generate(text).returncode, 0)


if __name__ == "__main__":
    unittest.main()
