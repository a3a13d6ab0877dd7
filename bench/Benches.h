// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

namespace bench {

class Report;

/** What every subcommand is started with. */
struct Options {
    int rounds = 0;                     ///< how often to repeat; 0: as the subcommand likes
    bool quick = false;                 ///< for checking that all works: seconds, not minutes
    std::vector<std::string> arguments; ///< the subcommand's own
};

/** The rounds that were asked for, or those that the subcommand likes. */
inline int roundsOf(const Options& options, int usual, int quick) {
    if (options.rounds > 0)
        return options.rounds;
    return options.quick ? quick : usual;
}

/** The subcommands. Each adds its rows to the report and returns the exit status. */
int runImport(const Options& options, Report& report);
int runMedia(const Options& options, Report& report);
int runPack(const Options& options, Report& report);
int runPlayer(const Options& options, Report& report);
int runRpc(const Options& options, Report& report);
int runScale(const Options& options, Report& report);
int runStart(const Options& options, Report& report);

} // namespace bench
