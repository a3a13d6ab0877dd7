// SPDX-License-Identifier: MIT
#pragma once

namespace bench {

class Report;
struct Options;

/** The parts of the subcommand; each adds curves and returns whether it could be run. */

/** 1 to 8 clients that each wait for every answer. */
bool measureClients(const Options& options, Report& report);

/** One client that has 1 to 64 requests unanswered. */
bool measureInFlight(const Options& options, Report& report);

/** One notification that 1 to 1,000 objects have asked for. */
bool measureListeners(const Options& options, Report& report);

/** 1 to 10 discoverers that share the reading of a collection. */
bool measureDiscoverers(const Options& options, Report& report);

/**
 * What a row costs while the library's database grows to a hundred thousand, and how long
 * searching takes then; without files and daemon.
 */
bool measureLibraryRows(const Options& options, Report& report);

} // namespace bench
