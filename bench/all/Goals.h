// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "bench/Report.h"

namespace bench {

/** What a measurement is to reach. */
struct Goal {
    const char* bench;
    const char* line;   ///< regular expression for the table's line
    const char* versus; ///< a contender, or empty for a figure of our own
    double bound;       ///< the least ratio to that contender, or the largest figure
};

/** The goals of a line of the table. */
[[nodiscard]] std::vector<Goal> goalsOf(const std::string& bench, const std::string& line);

/** Whether a row reaches the goal; none when the row does not have that contender. */
[[nodiscard]] std::optional<bool> isReached(const Goal& goal, const Row& row);

/** "2 x MPD" or "10 ms". */
[[nodiscard]] std::string textOf(const Goal& goal, const std::string& unit);

/** The name of the line that tells of a row: its own, or that of all rows of the kind. */
[[nodiscard]] std::string lineOf(const std::string& bench, const std::string& row);

/** With as many digits as matter. */
[[nodiscard]] std::string figureText(double figure);

} // namespace bench
