// SPDX-License-Identifier: MIT
#pragma once

#include <optional>

/**
 * Handles what the process is to do instead of serving: `--help` and `--version`. Returns the exit
 * status when that is all, and nothing when the daemon is to start. Other options are Qt's, and
 * an option that nobody knows is refused with status 2.
 */
std::optional<int> runCommandLine(int argc, char** argv);

/** Whether the command line chooses Qt's window system. */
bool choosesPlatform(int argc, char** argv);
