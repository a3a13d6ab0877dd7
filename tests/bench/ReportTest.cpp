// SPDX-License-Identifier: MIT
#include "bench/Report.h"

#include <gmock/gmock.h>
#include <nlohmann/json.hpp>

using bench::Better;
using bench::Curve;
using bench::Report;
using bench::Role;
using bench::Row;
using bench::summarize;

namespace {

Curve makeCurve() {
    return {"search",
            "ms",
            "rows",
            {10, 20},
            {{"a word", Role::ours, {summarize({1}), summarize({2})}},
             {"two words", Role::ours, {summarize({3}), summarize({4})}},
             {"grep", Role::peer, {summarize({30}), summarize({40})}}}};
}

} // namespace

TEST(Statistics, TellsHowManySamplesTheyAreOf) {
    EXPECT_EQ(summarize({}).samples, 0);
    const bench::Statistics figures = summarize({3, 1, 2});
    EXPECT_EQ(figures.samples, 3);
    EXPECT_EQ(figures.median, 2);
    EXPECT_EQ(figures.minimum, 1);
    EXPECT_EQ(figures.maximum, 3);
}

TEST(Statistics, AreRoundedToFiveDigits) {
    EXPECT_EQ(bench::rounded(123456.7), 123460);
    EXPECT_EQ(bench::rounded(0.0012345678), 0.0012346);
    EXPECT_EQ(bench::rounded(0), 0);
}

TEST(Ratio, IsAboveOneWhenOursIsBetter) {
    Row row{"a", "us", {{"ours", summarize({2})}, {"theirs", summarize({3})}}};
    EXPECT_DOUBLE_EQ(bench::ratio(row, row.entries[1]), 1.5);
    row.better = Better::kHigher;
    EXPECT_DOUBLE_EQ(bench::ratio(row, row.entries[1]), 2.0 / 3);
    row.entries[0].figures.median = 0;
    EXPECT_EQ(bench::ratio(row, row.entries[1]), 0);
}

TEST(Curve, IsARowForEachOfOurLinesAtAPlace) {
    const std::vector<Row> rows = bench::rowsAt(makeCurve(), 1);
    ASSERT_EQ(rows.size(), 2U);
    EXPECT_EQ(rows[0].name, "search, a word (rows: 20)");
    EXPECT_EQ(rows[1].name, "search, two words (rows: 20)");
    EXPECT_EQ(rows[1].entries[0].figures.median, 4);
    ASSERT_EQ(rows[1].entries.size(), 2U);
    EXPECT_EQ(rows[1].entries[1].who, "grep");
    EXPECT_EQ(rows[1].entries[1].figures.median, 40);
}

TEST(Report, IsReadAsItWasWritten) {
    Report report;
    report.add(Row{"open",
                   "ms",
                   {{"ours", summarize({1, 2}), Role::ours}, {"bare", summarize({1}), Role::floor}},
                   Better::kHigher});
    report.add(makeCurve());
    report.leaveOut("MPD");
    report.leaveOut("MPD");
    const auto written = bench::toJson(report);
    const Report read = bench::reportFromJson(written);
    EXPECT_EQ(bench::toJson(read), written);
    EXPECT_THAT(read.leftOut(), testing::ElementsAre("MPD"));
    EXPECT_EQ(read.rows()[0].better, Better::kHigher);
    EXPECT_EQ(read.rows()[0].entries[1].role, Role::floor);
    EXPECT_EQ(read.curves()[0].lines[0].role, Role::ours);
}

TEST(Report, IsNotReadFromSomethingElse) {
    EXPECT_THROW((void)bench::reportFromJson({{"rows", 1}}), nlohmann::json::exception);
}
