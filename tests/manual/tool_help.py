# SPDX-License-Identifier: MIT
"""What the programs' --help names."""

import os
import re
import subprocess

TOOL = os.environ["QNS_TOOL"]
DAEMON = os.environ["QNS_DAEMON"]
MPRIS = os.environ["QNS_MPRIS"]


def help_of(program, *command):
    return subprocess.run([program, *command, "--help"], check=True, encoding="utf-8",
                          stdout=subprocess.PIPE).stdout


def options_of(program, *command):
    """Short and long ones, such as {-h, --help}."""
    lines = re.findall(r"^  (-.*?)(?:  |$)", help_of(program, *command), re.M)
    return options_in("\n".join(lines))


def options_in(text):
    return set(re.findall(r"(?<![\w-])(?:--[\w-]+|-\w)(?![\w-])", text))


def commands_of(*command):
    """The subcommands of the tool, or of one of its commands."""
    part = help_of(TOOL, *command).partition("\nSubcommands:\n")[2]
    return re.findall(r"^  (\w\S*)", part.split("\n\n")[0], re.M)


def all_commands(*command):
    """Every command as a tuple of words, with those of several words; the first is empty."""
    return [command, *(found for name in commands_of(*command)
                       for found in all_commands(*command, name))]
