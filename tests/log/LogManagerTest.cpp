// SPDX-License-Identifier: MIT
#include "log/LogManager.h"

#include <climits>
#include <cstdlib>
#include <ctime>
#include <string>
#include <thread>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

namespace {

/** Five microseconds after the epoch, in a time zone given as for TZ. */
std::string epochIn(const char* zone) {
    ::setenv("TZ", zone, 1);
    ::tzset();
    return LogManager::formatTime({0, 5});
}

class LogManagerTime : public testing::Test {
protected:
    ~LogManagerTime() override {
        ::unsetenv("TZ");
        ::tzset();
    }
};

} // namespace

TEST_F(LogManagerTime, HasMicrosecondsAndOffset) {
    EXPECT_EQ(epochIn("UTC0"), "1970-01-01T00:00:00.000005+00:00");
    EXPECT_EQ(epochIn("JST-9"), "1970-01-01T09:00:00.000005+09:00");
    EXPECT_EQ(epochIn("EST5"), "1969-12-31T19:00:00.000005-05:00");
}

TEST_F(LogManagerTime, OfZonesWithHalfHours) {
    EXPECT_EQ(epochIn("IST-5:30"), "1970-01-01T05:30:00.000005+05:30");
    EXPECT_EQ(epochIn("NST3:30"), "1969-12-31T20:30:00.000005-03:30");
}

TEST_F(LogManagerTime, ThirtyMinutesWestLoseTheirSign) {
    EXPECT_EQ(epochIn("XXX0:30"), "1969-12-31T23:30:00.000005+00:30");
}

TEST_F(LogManagerTime, ThatCannotBeBrokenDownIsEmpty) {
    EXPECT_EQ(LogManager::formatTime({LONG_MAX, 0}), "");
}

TEST_F(LogManagerTime, OfNowLooksLikeOne) {
    EXPECT_THAT(
        LogManager::getCurrentTime(),
        testing::MatchesRegex("[0-9]{4}(-[0-9]{2}){2}T[0-9:]{8}\\.[0-9]{6}[+-][0-9]{2}:[0-9]{2}"));
}

TEST(LogManager, TurnsIntegersIntoText) {
    EXPECT_EQ(LogManager::intToStringType(0), "0");
    EXPECT_EQ(LogManager::intToStringType(-12), "-12");
    EXPECT_EQ(LogManager::intToStringType(4711), "4711");
    EXPECT_EQ(LogManager::intToStringType(INT_MAX), "2147483647");
    EXPECT_EQ(LogManager::intToStringType(INT_MIN), "-2147483648");
    EXPECT_EQ(LogManager::getProcID(), std::to_string(::getpid()));
}

TEST(LogManager, TurnsWideTextIntoText) {
    EXPECT_EQ(LogManager::wstringToStringType(L"Z\u00fcrich"), "Z\u00fcrich");
    EXPECT_EQ(LogManager::wstringToStringType(L""), "");
}

TEST(LogManager, IsOneForAllThreadsUntilItIsCleared) {
    LogManager* other = nullptr;
    std::thread thread([&] { other = LogManager::getInstance(); });
    LogManager* const mine = LogManager::getInstance();
    thread.join();
    EXPECT_EQ(mine, other);
    EXPECT_EQ(ILogManager::getInstance(), mine);
    ILogManager::clearUp();
    LogManager::clearUp(); // there is none: nothing happens
}
