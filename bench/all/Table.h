// SPDX-License-Identifier: MIT
#pragma once

#include <iosfwd>
#include <nlohmann/json_fwd.hpp>
#include <optional>
#include <string>
#include <vector>

#include "bench/Report.h"

namespace bench {

/** Another contender's figure beside ours; medians, where several rows make a line. */
struct Compared {
    std::string who;
    double figure = 0;
    double ratio = 0; ///< how many times better ours is; 0 when it cannot be said
    double lowestRatio = 0;
    double highestRatio = 0;
};

/** How many of a line's rows reach a goal. */
struct Verdict {
    std::string goal;
    int reached = 0;
    int rows = 0;
};

/** What a table of everything tells of one measurement. */
struct TableLine {
    std::string bench;
    std::string name;
    std::string unit;
    double ours = 0;
    std::optional<Compared> floor; ///< the lowest
    std::optional<Compared> peer;  ///< the best
    std::vector<Verdict> verdicts;
};

/** The lines of a bench; curves are told at their ends. */
[[nodiscard]] std::vector<TableLine> linesOf(const std::string& bench, const Report& report);

/** What is wrong with the figures: contenders without any. Empty when all is well. */
[[nodiscard]] std::vector<std::string> gapsIn(const std::string& bench, const Report& report);

[[nodiscard]] nlohmann::ordered_json toJson(const std::vector<TableLine>& lines);
void printLines(std::ostream& out, const std::vector<TableLine>& lines);

/** "met", "missed", or "met by 2 of 6". */
[[nodiscard]] std::string textOf(const Verdict& verdict);

} // namespace bench
