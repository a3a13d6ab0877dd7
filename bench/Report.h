// SPDX-License-Identifier: MIT
#pragma once

#include "bench/Statistics.h"

#include <iosfwd>
#include <nlohmann/json_fwd.hpp>
#include <string>
#include <vector>

namespace bench {

/** What a contender is to the others. */
enum class Role {
    ours,
    floor, ///< does less than any product can: what is left when all but the necessary is gone
    peer   ///< does the same, made by others
};

/** One contender's figures for one row. */
struct Entry {
    std::string who;
    Statistics figures;
    Role role = Role::peer;
};

enum class Better { kLower, kHigher };

/** What was measured, ours first, and beside it the same from others. */
struct Row {
    std::string name;
    std::string unit;
    std::vector<Entry> entries; ///< the first one is ours, whatever its role says
    Better better = Better::kLower;
};

/** How many times better the first entry's median is than `other`; 0 when it cannot be said. */
[[nodiscard]] double ratio(const Row& row, const Entry& other);

/** One contender's figures while something grows. */
struct Line {
    std::string who;
    Role role = Role::peer;
    std::vector<Statistics> points; ///< one for each of the curve's places
};

/** How a cost grows, and beside it that of others. */
struct Curve {
    std::string name;
    std::string unit;
    std::string along; ///< what grows: "clients"
    std::vector<int> places;
    std::vector<Line> lines;
    Better better = Better::kLower;
};

/** A row for each of our lines, as it is at one place of the curve. */
[[nodiscard]] std::vector<Row> rowsAt(const Curve& curve, std::size_t place);

/** Collects what one run has measured and prints it, for people or as JSON. */
class Report {
public:
    void add(Row row) { mRows.push_back(std::move(row)); }
    void add(Curve curve) { mCurves.push_back(std::move(curve)); }

    /** A contender that does not take part, because its program is not installed. */
    void leaveOut(const std::string& contender);

    [[nodiscard]] const std::vector<Row>& rows() const { return mRows; }
    [[nodiscard]] const std::vector<Curve>& curves() const { return mCurves; }
    [[nodiscard]] const std::vector<std::string>& leftOut() const { return mLeftOut; }

    void printTable(std::ostream& out) const;
    void printJson(std::ostream& out) const;

private:
    std::vector<Row> mRows;
    std::vector<Curve> mCurves;
    std::vector<std::string> mLeftOut;
};

[[nodiscard]] nlohmann::ordered_json toJson(const Report& report);

/** Throws nlohmann::json::exception when `json` is no report. */
[[nodiscard]] Report reportFromJson(const nlohmann::ordered_json& json);

} // namespace bench
