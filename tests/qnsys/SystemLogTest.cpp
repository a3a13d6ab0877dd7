// SPDX-License-Identifier: MIT
#include <cerrno>
#include <chrono>
#include <gmock/gmock.h>
#include <string>
#include <syslog.h>
#include <thread>
#include <unistd.h>
#include <vector>

#include "qnsys.h"
#include "tests/tools/LogSocket.h"

using ::testing::HasSubstr;
using ::testing::MatchesRegex;

namespace {

constexpr int kLocal0 = LOG_LOCAL0;

TEST(SystemLog, LinesHaveTheFormOfTheCLibrary) {
    LogSocket log;
    qnsys_openlog("tester", LOG_PID, kLocal0);
    qnsys_syslog(LOG_INFO, "value %d of %s", 7, "x");
    const std::string line = log.next().value_or("");
    EXPECT_THAT(line, MatchesRegex("<134>[A-Z][a-z][a-z] [ 0-9][0-9] [0-9:]+ "
                                   "tester\\[[0-9]+\\]: value 7 of x"));
    EXPECT_THAT(line, HasSubstr("[" + std::to_string(::getpid()) + "]"));
}

TEST(SystemLog, WithoutThePidOptionThereIsNoPid) {
    LogSocket log;
    qnsys_openlog("tester", 0, kLocal0);
    qnsys_syslog(LOG_ERR, "plain");
    EXPECT_THAT(log.next().value_or(""), MatchesRegex("<131>.* tester: plain"));
}

TEST(SystemLog, AFacilityInThePriorityWins) {
    LogSocket log;
    qnsys_openlog("tester", 0, kLocal0);
    qnsys_syslog(LOG_DAEMON | LOG_WARNING, "x");
    EXPECT_THAT(log.next().value_or(""), MatchesRegex("<28>.*"));
}

TEST(SystemLog, TheErrorTextOfErrnoIsExpanded) {
    LogSocket log;
    qnsys_openlog("tester", LOG_PID, kLocal0);
    errno = ENOENT;
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wpedantic" // %m is the system log's own
#pragma GCC diagnostic ignored "-Wformat"
    qnsys_syslog(LOG_ERR, "%s: %m", "malloc");
#pragma GCC diagnostic pop
    EXPECT_EQ(log.nextMessage(), "malloc: No such file or directory");
}

TEST(SystemLog, WithoutALogDaemonLinesAreLostAndLaterOnesArrive) {
    qnsys_openlog("tester", LOG_PID, kLocal0);
    qnsys_syslog(LOG_INFO, "nobody reads this");
    LogSocket log;
    qnsys_syslog(LOG_INFO, "somebody reads this");
    EXPECT_EQ(log.nextMessage(), "1 log lines were dropped");
    EXPECT_EQ(log.nextMessage(), "somebody reads this");
}

TEST(SystemLog, ARestartedLogDaemonIsFoundAgain) {
    qnsys_openlog("tester", LOG_PID, kLocal0);
    {
        LogSocket log;
        qnsys_syslog(LOG_INFO, "one");
        EXPECT_EQ(log.nextMessage(), "one");
    }
    LogSocket log;
    qnsys_syslog(LOG_INFO, "two");
    EXPECT_EQ(log.nextMessage(), "two");
}

TEST(SystemLog, ALogDaemonThatStopsReadingStopsNobodyAndIsToldWhatItMissed) {
    LogSocket log;
    qnsys_openlog("tester", LOG_PID, kLocal0);
    constexpr int kLines = 1000; // syslog(3) would wait for ever after about ten
    for (int i = 0; i < kLines; ++i)
        qnsys_syslog(LOG_INFO, "line %d", i);

    int arrived = 0;
    while (log.waiting())
        ++arrived;
    EXPECT_LT(arrived, kLines);

    qnsys_syslog(LOG_INFO, "after");
    EXPECT_EQ(log.nextMessage(), std::to_string(kLines - arrived) + " log lines were dropped");
    EXPECT_EQ(log.nextMessage(), "after");
}

TEST(SystemLog, LinesOfSeveralThreadsArriveWhole) {
    LogSocket log;
    qnsys_openlog("tester", LOG_PID, kLocal0);
    std::vector<std::thread> threads;
    for (int i = 0; i < 8; ++i)
        threads.emplace_back([i] { qnsys_syslog(LOG_INFO, "thread %d says a whole line", i); });
    for (std::thread& thread : threads)
        thread.join();
    for (int i = 0; i < 8; ++i)
        EXPECT_THAT(log.nextMessage(), MatchesRegex("thread [0-7] says a whole line"));
}

} // namespace
