# SPDX-License-Identifier: MIT
"""Each shell completes what the tool understands, and nothing else."""

import os
import shutil
import subprocess
import tempfile
import unittest

import tool_help

FOLDER = os.environ["QNS_COMPLETION"]
FILES = ["film.mp4", "film two.mp4"]


def run(folder, *command):
    return subprocess.run(command, cwd=folder, encoding="utf-8", check=True, timeout=60,
                          stdin=subprocess.DEVNULL, stdout=subprocess.PIPE,
                          env={**os.environ, "HOME": folder}).stdout


class Completion:
    """What holds in every shell; complete() gives the set of words that may come next."""

    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = folder.name
        for name in FILES:
            open(os.path.join(self.folder, name), "wb").close()

    def test_offers_the_commands(self):
        self.assertEqual(self.complete(""), set(tool_help.commands_of()))
        self.assertEqual(self.complete("sta"), {"status"})

    def test_offers_the_commands_of_the_library(self):
        self.assertEqual(self.complete("library "), set(tool_help.commands_of("library")))
        self.assertEqual(self.complete("library --database film.mp4 se"), {"search"})

    def test_offers_the_options_of_every_command(self):
        for command in tool_help.all_commands():
            with self.subTest(command):
                words = " ".join([*command, "-"])
                self.assertEqual(self.complete(words), tool_help.options_of(tool_help.TOOL,
                                                                            *command))

    def test_offers_commands_behind_options_with_a_value(self):
        self.assertEqual(self.complete("--identity 1001 --timeout 5 pl"), {"play"})
        self.assertIn("--json", self.complete("--timeout 5 status --"))

    def test_offers_identities(self):
        self.assertEqual(self.complete("--identity "), {str(port) for port in range(1000, 1008)})

    def test_offers_files_where_files_are_wanted(self):
        for words in ("play fi", "info film.mp4 fi", "image fi", "image film.mp4 -o fi",
                      "image film.mp4 --output fi", "import fi", "library --database fi",
                      "library show fi"):
            with self.subTest(words):
                self.assertEqual(self.complete(words), set(FILES))

    def test_offers_nothing_where_anything_may_stand(self):
        for words in ("--timeout ", "image film.mp4 --at ", "image film.mp4 --size ",
                      "extensions fi", "import --to fi", "library search fi", "dance "):
            with self.subTest(words):
                self.assertEqual(self.complete(words), set())


class InBash(Completion, unittest.TestCase):
    SCRIPT = r"""
        source "$1/qnsmedia.bash"
        COMP_WORDS=($2) COMP_CWORD=$((${#COMP_WORDS[@]} - 1))
        [[ $2 == *" " ]] && COMP_WORDS+=("") && ((++COMP_CWORD))
        "$(complete -p qnsmedia | grep -o '_[a-z]*')"
        printf '%s\n' "${COMPREPLY[@]}"
    """

    def complete(self, words):
        out = run(self.folder, "bash", "-c", self.SCRIPT, "bash", FOLDER, "qnsmedia " + words)
        return set(out.splitlines()) - {""}


@unittest.skipUnless(shutil.which("fish"), "no fish here")
class InFish(Completion, unittest.TestCase):
    def complete(self, words):
        out = run(self.folder, "fish", "--no-config", "-c",
                  "source $argv[1]/qnsmedia.fish; complete -C $argv[2]", FOLDER,
                  "qnsmedia " + words)
        return {line.split("\t")[0] for line in out.splitlines()}


@unittest.skipUnless(shutil.which("zsh"), "no zsh here")
class InZsh(Completion, unittest.TestCase):
    SCRIPT = os.path.join(os.path.dirname(os.path.abspath(__file__)), "list-choices.zsh")

    @classmethod
    def setUpClass(cls):
        cache = tempfile.TemporaryDirectory()
        cls.addClassCleanup(cache.cleanup)
        cls.cache = os.path.join(cache.name, "cache")

    def complete(self, words):
        out = run(self.folder, "zsh", "-f", self.SCRIPT, FOLDER, "qnsmedia " + words, self.cache)
        return {line.replace("\\ ", " ") for line in out.splitlines()} - {""}


if __name__ == "__main__":
    unittest.main()
