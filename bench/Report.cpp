// SPDX-License-Identifier: MIT
#include "bench/Report.h"

#include <algorithm>
#include <iomanip>
#include <nlohmann/json.hpp>
#include <ostream>

namespace bench {
namespace {

constexpr int kFigureWidth = 11;
constexpr int kWhoWidth = 30;

void printFigure(std::ostream& out, double figure) {
    out << std::setw(kFigureWidth) << figure;
}

void printEntry(std::ostream& out, const Row& row, const Entry& entry, int nameWidth) {
    const bool isFirst = &entry == &row.entries.front();
    out << std::left << std::setw(nameWidth) << (isFirst ? row.name : "") << std::setw(kWhoWidth)
        << entry.who << std::right;
    const Statistics& figures = entry.figures;
    for (const double figure : {figures.median, figures.p99, figures.minimum, figures.maximum})
        printFigure(out, figure);
    out << ' ' << std::left << std::setw(10) << row.unit << std::right;
    if (!isFirst)
        out << std::setw(9) << ratio(row, entry) << 'x';
    out << '\n';
}

std::vector<Row> everyRow(const std::vector<Row>& rows, const std::vector<Curve>& curves) {
    std::vector<Row> all = rows;
    for (const Curve& curve : curves)
        for (std::size_t place = 0; place < curve.places.size(); ++place)
            for (Row& row : rowsAt(curve, place))
                all.push_back(std::move(row));
    return all;
}

} // namespace

double ratio(const Row& row, const Entry& other) {
    const double ours = row.entries.front().figures.median;
    const double theirs = other.figures.median;
    if (ours == 0 || theirs == 0)
        return 0;
    return row.better == Better::kLower ? theirs / ours : ours / theirs;
}

std::vector<Row> rowsAt(const Curve& curve, std::size_t place) {
    const auto isOurs = [](const Line& line) { return line.role == Role::ours; };
    const auto ours = std::count_if(curve.lines.begin(), curve.lines.end(), isOurs);
    const std::string where = " (" + curve.along + ": " + std::to_string(curve.places[place]) + ")";
    std::vector<Row> rows;
    for (const Line& line : curve.lines) {
        if (!isOurs(line))
            continue;
        Row row{curve.name + (ours > 1 ? ", " + line.who : "") + where,
                curve.unit,
                {{line.who, line.points[place], line.role}},
                curve.better};
        for (const Line& other : curve.lines)
            if (!isOurs(other))
                row.entries.push_back({other.who, other.points[place], other.role});
        rows.push_back(std::move(row));
    }
    return rows;
}

void Report::leaveOut(const std::string& contender) {
    if (std::find(mLeftOut.begin(), mLeftOut.end(), contender) == mLeftOut.end())
        mLeftOut.push_back(contender);
}

void Report::printTable(std::ostream& out) const {
    const std::vector<Row> rows = everyRow(mRows, mCurves);
    std::size_t nameWidth = 0;
    for (const Row& row : rows)
        nameWidth = std::max(nameWidth, row.name.size() + 2);
    out << std::fixed << std::setprecision(2) << std::setw(static_cast<int>(nameWidth) + kWhoWidth)
        << "";
    for (const char* title : {"median", "p99", "min", "max"})
        out << std::setw(kFigureWidth) << title;
    out << '\n';
    for (const Row& row : rows)
        for (const Entry& entry : row.entries)
            printEntry(out, row, entry, static_cast<int>(nameWidth));
    for (const std::string& contender : mLeftOut)
        out << "not installed, so left out: " << contender << '\n';
}

void Report::printJson(std::ostream& out) const {
    out << toJson(*this).dump(2) << '\n';
}

} // namespace bench
