// SPDX-License-Identifier: MIT
#include "bench/all/Table.h"

#include <algorithm>

#include "bench/all/Goals.h"

namespace bench {
namespace {

/** Rows of the same kind. */
struct Kindred {
    std::string name;
    std::vector<Row> rows;
};

std::vector<Row> rowsOf(const Report& report) {
    std::vector<Row> rows = report.rows();
    const auto append = [&rows](std::vector<Row> more) {
        std::move(more.begin(), more.end(), std::back_inserter(rows));
    };
    for (const Curve& curve : report.curves()) {
        append(rowsAt(curve, 0));
        append(rowsAt(curve, curve.places.size() - 1));
    }
    return rows;
}

/** In the order in which each kind comes first. */
std::vector<Kindred> gather(const std::string& bench, std::vector<Row> rows) {
    std::vector<Kindred> kinds;
    for (Row& row : rows) {
        const std::string name = lineOf(bench, row.name);
        auto kind = std::find_if(kinds.begin(), kinds.end(),
                                 [&](const Kindred& known) { return known.name == name; });
        if (kind == kinds.end())
            kind = kinds.insert(kinds.end(), {name, {}});
        kind->rows.push_back(std::move(row));
    }
    return kinds;
}

/** The first floor, which is the lowest; the peer against which we look worst; or null. */
const Entry* contenderOf(const Row& row, Role role) {
    const Entry* chosen = nullptr;
    for (std::size_t i = 1; i < row.entries.size(); ++i) {
        const Entry& entry = row.entries[i];
        if (entry.role != role)
            continue;
        if (role == Role::floor)
            return &entry;
        if (chosen == nullptr || ratio(row, entry) < ratio(row, *chosen))
            chosen = &entry;
    }
    return chosen;
}

std::optional<Compared> compareTo(Role role, const std::vector<Row>& rows) {
    std::vector<double> figures;
    std::vector<double> ratios;
    std::string who;
    for (const Row& row : rows) {
        if (const Entry* const other = contenderOf(row, role)) {
            who = other->who;
            figures.push_back(other->figures.median);
            ratios.push_back(ratio(row, *other));
        }
    }
    if (figures.empty())
        return std::nullopt;
    const Statistics all = summarize(std::move(ratios));
    return Compared{who, summarize(std::move(figures)).median, all.median, all.minimum,
                    all.maximum};
}

std::vector<Verdict> judge(const std::string& bench, const Kindred& kind) {
    std::vector<Verdict> verdicts;
    for (const Goal& goal : goalsOf(bench, kind.name)) {
        Verdict verdict{textOf(goal, kind.rows.front().unit)};
        for (const Row& row : kind.rows) {
            if (const std::optional<bool> reached = isReached(goal, row)) {
                ++verdict.rows;
                verdict.reached += *reached ? 1 : 0;
            }
        }
        if (verdict.rows > 0)
            verdicts.push_back(std::move(verdict));
    }
    return verdicts;
}

double medianOfOurs(const std::vector<Row>& rows) {
    std::vector<double> figures;
    for (const Row& row : rows)
        figures.push_back(row.entries.front().figures.median);
    return summarize(std::move(figures)).median;
}

} // namespace

std::vector<TableLine> linesOf(const std::string& bench, const Report& report) {
    std::vector<TableLine> lines;
    for (const Kindred& kind : gather(bench, rowsOf(report)))
        lines.push_back({bench, kind.name, kind.rows.front().unit, medianOfOurs(kind.rows),
                         compareTo(Role::floor, kind.rows), compareTo(Role::peer, kind.rows),
                         judge(bench, kind)});
    return lines;
}

std::vector<std::string> gapsIn(const std::string& bench, const Report& report) {
    std::vector<std::string> gaps;
    if (report.rows().empty() && report.curves().empty())
        gaps.push_back(bench + " has measured nothing");
    std::vector<Row> rows = report.rows();
    for (const Curve& curve : report.curves())
        for (std::size_t place = 0; place < curve.places.size(); ++place)
            for (Row& row : rowsAt(curve, place))
                rows.push_back(std::move(row));
    for (const Row& row : rows)
        for (const Entry& entry : row.entries)
            if (entry.figures.samples == 0)
                gaps.push_back(bench + ", " + row.name + ": nothing of " + entry.who);
    return gaps;
}

} // namespace bench
