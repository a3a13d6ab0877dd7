// SPDX-License-Identifier: MIT
#pragma once

#include <csignal>

/** What a script can tell from the tool's exit status. */
enum ExitCode : int {
    kDone = 0,
    kFailed = 1, ///< refused by the daemon, the medium cannot be played, or no place for output
    kUsage = 2,
    kNotRunning = 3,
    kNoAnswer = 4, ///< timed out, or the connection was lost
    kReaderGone = 128 + SIGPIPE
};

/** The exit status of a command that a signal ended: what a shell calls it. */
constexpr int exitCodeOfSignal(int number) {
    return 128 + number;
}
