# SPDX-License-Identifier: MIT
"""The manual pages are well-formed, complete and true."""

import glob
import os
import re
import subprocess
import unittest

import tool_help

MANUAL = os.environ["QNS_MANUAL"]
DOCS = os.environ["QNS_DOCS"]
PAGES = sorted(glob.glob(os.path.join(MANUAL, "man*", "*")))


def run(*command, **environment):
    return subprocess.run(command, encoding="utf-8", stdout=subprocess.PIPE,
                          stderr=subprocess.STDOUT, check=False,
                          env={**os.environ, "LC_ALL": "C.UTF-8", **environment}).stdout


def page(name):
    return next(path for path in PAGES if os.path.basename(path) == name)


def shown(path):
    """The page as a reader sees it, on a screen as wide as it takes."""
    text = run("mandoc", "-T", "utf8", "-O", "width=1000", path)
    return re.sub(r".\x08", "", text)


class TheManualPages(unittest.TestCase):
    def test_are_all_there(self):
        self.assertEqual([os.path.basename(path) for path in PAGES], QNS_PAGES)

    def test_are_without_fault_for_both_formatters(self):
        for path in PAGES:
            with self.subTest(os.path.basename(path)):
                self.assertEqual(run("mandoc", "-T", "lint", "-W", "warning", path), "")
                rendered = run("man", "--warnings=all", "-l", path, MANWIDTH="80")
                self.assertNotRegex(rendered, "warning|error:")
                self.assertGreater(len(rendered), 1000)

    def test_are_found_by_name(self):
        for path in PAGES:
            name, section = os.path.basename(path).rsplit(".", 1)
            self.assertEqual(run("man", "-M", MANUAL, "-w", section, name).strip(), path)

    def test_name_only_pages_that_exist(self):
        for path in PAGES:
            for name, section in re.findall(r"(\S+)\((\d)\)", shown(path)):
                if name.lower().startswith("qns"):
                    with self.subTest(f"{os.path.basename(path)}: {name}({section})"):
                        files = [os.path.basename(other).lower() for other in PAGES]
                        self.assertIn(f"{name}.{section}".lower(), files)

    def test_lose_nothing_of_what_they_are_made_of(self):
        with open(os.path.join(DOCS, "protocol.md"), encoding="utf-8") as file:
            source = re.sub(r"^```.*$|\]\([^)]*\)", " ", file.read(), flags=re.M)
        body = source[source.index("\nHow a program"):source.index("\nContents:")]
        body += source[source.index("\n## Connections"):]
        seen = set(re.findall(r"\w+", shown(page("qnsmedia-protocol.7")).lower()))
        self.assertEqual(set(re.findall(r"\w+", body.lower())) - seen, set())


class TheToolsPage(unittest.TestCase):
    def setUp(self):
        self.text = shown(page("qnsmedia.1"))
        self.headings = "\n".join(re.findall(r"^ {3}\w.*", self.text, re.M))

    def test_names_every_command_and_option(self):
        commands = tool_help.all_commands()
        self.assertGreater(len(commands), 5)
        for command in commands:
            with self.subTest(command):
                self.assertIn("".join(f" {word}" for word in command), self.headings)
                options = tool_help.options_of(tool_help.TOOL, *command)
                self.assertEqual(options - tool_help.options_in(self.text), set())

    def test_names_no_option_that_there_is_not(self):
        real = {option for command in tool_help.all_commands()
                for option in tool_help.options_of(tool_help.TOOL, *command)}
        named = {name for name in tool_help.options_in(self.text) if name.startswith("--")}
        self.assertEqual(named - real, set())


class TheOtherProgramsPages(unittest.TestCase):
    def test_name_every_option(self):
        for program, manual in ((tool_help.DAEMON, "QNSMediaService.8"),
                                (tool_help.MPRIS, "qnsmedia-mpris.1")):
            with self.subTest(manual):
                options = tool_help.options_of(program)
                self.assertIn("--version", options)
                self.assertEqual(options - tool_help.options_in(shown(page(manual))), set())


QNS_PAGES = ["qnsmedia-mpris.1", "qnsmedia.1", "qnsmedia-library.5", "qnsmedia-protocol.7", "QNSMediaService.8"]

if __name__ == "__main__":
    unittest.main()
