// SPDX-License-Identifier: MIT
#pragma once

/** What a script can tell from the tool's exit status. */
enum ExitCode : int {
    kDone = 0,
    kRefused = 1, ///< refused by the daemon, or the medium cannot be played
    kUsage = 2,
    kNotRunning = 3,
    kNoAnswer = 4, ///< timed out, or the connection was lost
    kInterrupted = 130
};
