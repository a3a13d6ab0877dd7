// SPDX-License-Identifier: MIT
#pragma once

#include "bench/Statistics.h"

#include <iosfwd>
#include <string>
#include <vector>

namespace bench {

/** One contender's figures for one row. */
struct Entry {
    std::string who;
    Statistics figures;
};

enum class Better { kLower, kHigher };

/** What was measured, ours first, and beside it the same from others. */
struct Row {
    std::string name;
    std::string unit;
    std::vector<Entry> entries;
    Better better = Better::kLower;
};

/** How many times better the first entry's median is than `other`; 0 when it cannot be said. */
[[nodiscard]] double ratio(const Row& row, const Entry& other);

/** Collects the rows of one run and prints them, for people or as JSON. */
class Report {
public:
    void add(Row row) { mRows.push_back(std::move(row)); }
    void printTable(std::ostream& out) const;
    void printJson(std::ostream& out) const;

private:
    std::vector<Row> mRows;
};

} // namespace bench
