// SPDX-License-Identifier: MIT
// The table of everything as text and as JSON.
#include "bench/all/Table.h"

#include <algorithm>
#include <array>
#include <nlohmann/json.hpp>
#include <ostream>

#include "bench/all/Goals.h"

namespace bench {
namespace {

using Json = nlohmann::ordered_json;
using Cells = std::array<std::string, 6>;

std::string comparedText(const std::optional<Compared>& compared) {
    if (!compared)
        return "";
    std::string text = compared->who + " " + figureText(compared->figure);
    if (compared->ratio == 0)
        return text;
    text += " (" + figureText(compared->ratio);
    if (compared->lowestRatio != compared->highestRatio)
        text +=
            "; " + figureText(compared->lowestRatio) + " to " + figureText(compared->highestRatio);
    return text + ")";
}

std::string verdictsText(const std::vector<Verdict>& verdicts) {
    std::string text;
    for (const Verdict& verdict : verdicts)
        text += (text.empty() ? "" : "; ") + verdict.goal + ": " + textOf(verdict);
    return text;
}

Cells cellsOf(const TableLine& line) {
    return {line.bench,
            line.name,
            figureText(line.ours) + " " + line.unit,
            comparedText(line.floor),
            comparedText(line.peer),
            verdictsText(line.verdicts)};
}

void printCells(std::ostream& out, const Cells& cells, const std::array<std::size_t, 6>& widths) {
    std::string text;
    for (std::size_t i = 0; i < cells.size(); ++i) {
        text += cells[i];
        text.append(widths[i] - cells[i].size() + 2, ' ');
    }
    text.erase(text.find_last_not_of(' ') + 1);
    out << text << '\n';
}

Json comparedToJson(const std::optional<Compared>& compared) {
    if (!compared)
        return nullptr;
    return {{"who", compared->who},
            {"figure", rounded(compared->figure)},
            {"ratio", rounded(compared->ratio)},
            {"lowestRatio", rounded(compared->lowestRatio)},
            {"highestRatio", rounded(compared->highestRatio)}};
}

} // namespace

std::string textOf(const Verdict& verdict) {
    if (verdict.reached == verdict.rows)
        return "met";
    if (verdict.reached == 0)
        return "missed";
    return "met by " + std::to_string(verdict.reached) + " of " + std::to_string(verdict.rows);
}

Json toJson(const std::vector<TableLine>& lines) {
    Json table = Json::array();
    for (const TableLine& line : lines) {
        Json goals = Json::array();
        for (const Verdict& verdict : line.verdicts)
            goals.push_back({{"goal", verdict.goal}, {"verdict", textOf(verdict)}});
        table.push_back({{"bench", line.bench},
                         {"name", line.name},
                         {"unit", line.unit},
                         {"ours", rounded(line.ours)},
                         {"floor", comparedToJson(line.floor)},
                         {"peer", comparedToJson(line.peer)},
                         {"goals", goals}});
    }
    return table;
}

void printLines(std::ostream& out, const std::vector<TableLine>& lines) {
    std::vector<Cells> table = {
        {"bench", "measurement", "ours", "floor (ratio)", "best peer (ratio; range)", "goal"}};
    for (const TableLine& line : lines)
        table.push_back(cellsOf(line));
    std::array<std::size_t, 6> widths{};
    for (const Cells& cells : table)
        for (std::size_t i = 0; i < cells.size(); ++i)
            widths[i] = std::max(widths[i], cells[i].size());
    for (const Cells& cells : table)
        printCells(out, cells, widths);
}

} // namespace bench
