// SPDX-License-Identifier: MIT
#include "bench/Report.h"

#include <algorithm>
#include <iomanip>
#include <nlohmann/json.hpp>
#include <ostream>

namespace bench {
namespace {

constexpr int kFigureWidth = 11;

void printFigure(std::ostream& out, double figure) {
    out << std::setw(kFigureWidth) << figure;
}

void printEntry(std::ostream& out, const Row& row, const Entry& entry, int nameWidth) {
    const bool isFirst = &entry == &row.entries.front();
    out << std::left << std::setw(nameWidth) << (isFirst ? row.name : "") << std::setw(14)
        << entry.who << std::right;
    const Statistics& figures = entry.figures;
    for (const double figure : {figures.median, figures.p99, figures.minimum, figures.maximum})
        printFigure(out, figure);
    out << ' ' << std::left << std::setw(8) << row.unit << std::right;
    if (!isFirst)
        out << std::setw(7) << ratio(row, entry) << 'x';
    out << '\n';
}

nlohmann::ordered_json toJson(const Row& row) {
    nlohmann::ordered_json entries = nlohmann::ordered_json::array();
    for (const Entry& entry : row.entries) {
        const Statistics& figures = entry.figures;
        nlohmann::ordered_json object{{"who", entry.who},
                                      {"median", figures.median},
                                      {"p99", figures.p99},
                                      {"min", figures.minimum},
                                      {"max", figures.maximum}};
        if (&entry != &row.entries.front())
            object["ratio"] = ratio(row, entry);
        entries.push_back(std::move(object));
    }
    return {{"name", row.name},
            {"unit", row.unit},
            {"better", row.better == Better::kLower ? "lower" : "higher"},
            {"entries", std::move(entries)}};
}

} // namespace

double ratio(const Row& row, const Entry& other) {
    const double ours = row.entries.front().figures.median;
    const double theirs = other.figures.median;
    if (ours == 0 || theirs == 0)
        return 0;
    return row.better == Better::kLower ? theirs / ours : ours / theirs;
}

void Report::printTable(std::ostream& out) const {
    std::size_t nameWidth = 0;
    for (const Row& row : mRows)
        nameWidth = std::max(nameWidth, row.name.size() + 2);
    out << std::fixed << std::setprecision(2) << std::setw(static_cast<int>(nameWidth) + 14) << "";
    for (const char* title : {"median", "p99", "min", "max"})
        out << std::setw(kFigureWidth) << title;
    out << '\n';
    for (const Row& row : mRows)
        for (const Entry& entry : row.entries)
            printEntry(out, row, entry, static_cast<int>(nameWidth));
}

void Report::printJson(std::ostream& out) const {
    nlohmann::ordered_json rows = nlohmann::ordered_json::array();
    for (const Row& row : mRows)
        rows.push_back(toJson(row));
    out << rows.dump(2) << '\n';
}

} // namespace bench
