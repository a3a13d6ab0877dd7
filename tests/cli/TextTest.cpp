// SPDX-License-Identifier: MIT
#include <filesystem>

#include <gtest/gtest.h>

#include "cli/HumanTime.h"
#include "cli/MediaPath.h"
#include "cli/MediaTime.h"
#include "cli/StateName.h"

using namespace std::chrono_literals;

namespace {

TEST(HumanTime, TellsMinutesSecondsAndTenths) {
    EXPECT_EQ(humanTime(0s), "0:00.0");
    EXPECT_EQ(humanTime(1499ms), "0:01.4") << "tenths are cut";
    EXPECT_EQ(humanTime(83500ms), "1:23.5");
    EXPECT_EQ(humanTime(59min + 59999ms), "59:59.9");
}

TEST(HumanTime, TellsHoursWhereThereAreSome) {
    EXPECT_EQ(humanTime(1h), "1:00:00.0");
    EXPECT_EQ(humanTime(1h + 2min + 3500ms), "1:02:03.5");
    EXPECT_EQ(humanTime(100h), "100:00:00.0");
}

TEST(HumanTime, TellsNegativeTimesAndTheLongest) {
    EXPECT_EQ(humanTime(-5s), "-0:05.0");
    EXPECT_EQ(humanTime(qnsmedia::Nanoseconds::max()), "2562047:47:16.8");
    EXPECT_EQ(humanTime(-qnsmedia::Nanoseconds::max()), "-2562047:47:16.8");
}

TEST(MediaTime, IsSecondsMinutesAndHours) {
    EXPECT_EQ(parseMediaTime("90")->time, 90s);
    EXPECT_EQ(parseMediaTime("1:23.5")->time, 83500ms);
    EXPECT_EQ(parseMediaTime("1:02:03")->time, 1h + 2min + 3s);
    EXPECT_EQ(parseMediaTime("100:00")->time, 100min);
}

TEST(MediaTime, CanBeAPartOfTheWhole) {
    EXPECT_EQ(parseMediaTime("25%")->in(8s), 2s);
    EXPECT_EQ(parseMediaTime("0%")->in(8s), 0s);
    EXPECT_EQ(parseMediaTime("100%")->in(8s), 8s);
    EXPECT_EQ(parseMediaTime("3")->in(8s), 3s);
}

TEST(MediaTime, IsNothingElse) {
    for (const char* text : {"", "x", ":", "1:", ":1", "1:60", "1:2:3:4", "-1", "1 ", " 1", "1e3",
                             "%", "101%", "inf", "nan", "99999999999"})
        EXPECT_FALSE(parseMediaTime(text)) << text;
}

TEST(MediaPath, BeginsAtTheRoot) {
    EXPECT_EQ(mediaPath("film.mp4"), (std::filesystem::current_path() / "film.mp4").string());
    EXPECT_EQ(mediaPath("/a/../b//ü.mp4"), "/b/ü.mp4");
}

TEST(MediaPath, LeavesUrisAndTheEmptyNameAlone) {
    EXPECT_EQ(mediaPath("http://host/a/../b"), "http://host/a/../b");
    EXPECT_EQ(mediaPath("file:///a b"), "file:///a b");
    EXPECT_EQ(mediaPath(""), "");
}

TEST(MediaPath, DoesNotTakeAnyPathForAUri) {
    EXPECT_EQ(mediaPath("/a b://c"), "/a b:/c");
    EXPECT_EQ(mediaPath("://c"), (std::filesystem::current_path() / ":/c").string());
}

TEST(StateName, IsThereForEveryNumber) {
    for (int state = -2; state < 10; ++state)
        EXPECT_STRNE(stateName(static_cast<qnsmedia::PlayerState>(state)), "");
}

} // namespace
