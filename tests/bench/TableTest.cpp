// SPDX-License-Identifier: MIT
#include "bench/all/Table.h"

#include <gmock/gmock.h>
#include <sstream>

#include "bench/all/Goals.h"

using bench::Better;
using bench::linesOf;
using bench::Report;
using bench::Role;
using bench::Row;
using bench::summarize;
using bench::TableLine;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

namespace {

Row opening(const std::string& file, double ours, double theirs) {
    return {file + ", open to ready",
            "ms",
            {{"engine", summarize({ours}), Role::ours}, {"libmpv", summarize({theirs})}}};
}

} // namespace

TEST(Table, ComparesWithTheFirstFloorAndTheBestPeer) {
    Report report;
    report.add(Row{"serve",
                   "us",
                   {{"daemon", summarize({10}), Role::ours},
                    {"bare", summarize({8}), Role::floor},
                    {"bare with a thread", summarize({5}), Role::floor},
                    {"slow peer", summarize({30})},
                    {"quick peer", summarize({20})}}});
    const std::vector<TableLine> lines = linesOf("any", report);
    ASSERT_EQ(lines.size(), 1U);
    EXPECT_EQ(lines[0].name, "serve");
    EXPECT_EQ(lines[0].ours, 10);
    ASSERT_TRUE(lines[0].floor && lines[0].peer);
    EXPECT_EQ(lines[0].floor->who, "bare");
    EXPECT_DOUBLE_EQ(lines[0].floor->ratio, 0.8);
    EXPECT_EQ(lines[0].peer->who, "quick peer");
    EXPECT_DOUBLE_EQ(lines[0].peer->ratio, 2);
    EXPECT_THAT(lines[0].verdicts, IsEmpty());
}

TEST(Table, FilesOfAKindMakeOneLineWithTheRangeOfTheirRatios) {
    Report report;
    report.add(opening("film.mp4", 2, 6));
    report.add(opening("sound.mp3", 2, 2));
    report.add(opening("film.mkv", 4, 4));
    report.add(opening("film.ts", 3, 6));
    const std::vector<TableLine> lines = linesOf("player", report);
    ASSERT_EQ(lines.size(), 2U);
    EXPECT_EQ(lines[0].name, "films, open to ready");
    EXPECT_EQ(lines[0].ours, 3);
    ASSERT_TRUE(lines[0].peer);
    EXPECT_EQ(lines[0].peer->ratio, 2);
    EXPECT_EQ(lines[0].peer->lowestRatio, 1);
    EXPECT_EQ(lines[0].peer->highestRatio, 3);
    ASSERT_EQ(lines[0].verdicts.size(), 1U);
    EXPECT_EQ(lines[0].verdicts[0].goal, "2 x libmpv");
    EXPECT_EQ(bench::textOf(lines[0].verdicts[0]), "met by 2 of 3");
    EXPECT_EQ(lines[1].name, "sound, open to ready");
    ASSERT_EQ(lines[1].verdicts.size(), 1U);
    EXPECT_EQ(bench::textOf(lines[1].verdicts[0]), "missed");
}

TEST(Table, TellsACurveAtItsEnds) {
    Report report;
    report.add(
        bench::Curve{"search",
                     "ms",
                     "rows",
                     {10, 100, 1000},
                     {{"a word", Role::ours, {summarize({1}), summarize({2}), summarize({30})}}}});
    const std::vector<TableLine> lines = linesOf("scale", report);
    ASSERT_EQ(lines.size(), 2U);
    EXPECT_EQ(lines[0].ours, 1);
    EXPECT_EQ(lines[1].ours, 30);
    EXPECT_EQ(lines[1].name, "search (rows: 1000)");
}

TEST(Table, JudgesAFigureOfOurOwnWithoutAPeer) {
    Report report;
    report.add(Row{"processor when idle", "%", {{"daemon", summarize({0})}}});
    std::vector<TableLine> lines = linesOf("start", report);
    ASSERT_EQ(lines[0].verdicts.size(), 1U);
    EXPECT_EQ(bench::textOf(lines[0].verdicts[0]), "met");
    Report busy;
    busy.add(Row{"processor when idle", "%", {{"daemon", summarize({0.1})}}});
    lines = linesOf("start", busy);
    EXPECT_EQ(bench::textOf(lines[0].verdicts[0]), "missed");
}

TEST(Table, HasNoVerdictOnAPeerThatDoesNotTakePart) {
    Report report;
    report.add(Row{"import of mp3",
                   "1/s",
                   {{"daemon", summarize({300})}, {"MPD", summarize({100})}},
                   Better::kHigher});
    const std::vector<TableLine> lines = linesOf("import", report);
    ASSERT_EQ(lines[0].verdicts.size(), 1U);
    EXPECT_EQ(lines[0].verdicts[0].goal, "3 x MPD");
    EXPECT_EQ(bench::textOf(lines[0].verdicts[0]), "met");
}

TEST(Table, PrintsFiguresRatiosAndGoals) {
    Report report;
    report.add(opening("film.mp4", 2, 5));
    std::ostringstream out;
    bench::printLines(out, linesOf("player", report));
    EXPECT_THAT(out.str(), HasSubstr("player  films, open to ready"));
    EXPECT_THAT(out.str(), HasSubstr("2.00 ms"));
    EXPECT_THAT(out.str(), HasSubstr("libmpv 5.00 (2.50)"));
    EXPECT_THAT(out.str(), HasSubstr("2 x libmpv: met\n"));
}

TEST(Gaps, AreContendersWithoutFigures) {
    Report report;
    report.add(Row{"open", "ms", {{"daemon", summarize({1})}, {"MPD", {}}}});
    report.add(bench::Curve{"grow", "ms", "rows", {1, 2}, {{"daemon", Role::ours, {{}, {}}}}});
    EXPECT_THAT(bench::gapsIn("x", report),
                ElementsAre("x, open: nothing of MPD", "x, grow (rows: 1): nothing of daemon",
                            "x, grow (rows: 2): nothing of daemon"));
}

TEST(Gaps, ABenchWithoutAnyFiguresIsOne) {
    EXPECT_THAT(bench::gapsIn("x", {}), ElementsAre("x has measured nothing"));
}

TEST(Figures, HaveThreeDigitsOrSo) {
    EXPECT_EQ(bench::figureText(0), "0");
    EXPECT_EQ(bench::figureText(12345.6), "12346");
    EXPECT_EQ(bench::figureText(12.34), "12.3");
    EXPECT_EQ(bench::figureText(1.234), "1.23");
    EXPECT_EQ(bench::figureText(0.01234), "0.0123");
}
