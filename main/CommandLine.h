// SPDX-License-Identifier: MIT
#pragma once

#include <optional>

struct CommandLine {
    /** Set when the process is to end at once: help and version are printed, or an error is. */
    std::optional<int> exitStatus;

    /** Whether an option names Qt's window system. */
    bool choosesPlatform = false;

    /** Whether clients that end and start again are to be served. */
    bool reconnectsClients = false;
};

/** Qt's own options are left to Qt. Anything that nobody knows ends with status 2. */
CommandLine readCommandLine(int argc, char** argv);

/**
 * Where there is no display, and the environment names no window system of Qt, chooses one that
 * draws nowhere. Call it while the process has one thread: it changes the environment.
 */
void choosePlatform();
