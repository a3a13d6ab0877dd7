// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

namespace bench {

struct Options;

/** A subcommand of this program. */
struct Subcommand {
    std::string name;
    bool isPinned; ///< it measures how long one thing takes, which two cores blur
};

/**
 * Runs the subcommands one after another, each in a process of its own, and prints one table of
 * everything, or with `json` everything as JSON (the table then goes to standard error). `core` is
 * that of the pinned ones; -1 for the last one there is. Returns the exit status: not 0 when one
 * has failed or a contender has no figures.
 */
int runAll(const std::vector<Subcommand>& subcommands, const Options& options, bool json, int core);

} // namespace bench
