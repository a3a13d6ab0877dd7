// SPDX-License-Identifier: MIT
#include "log/Logging.h"

#include <cstdlib>
#include <ctime>
#include <fstream>
#include <gmock/gmock.h>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>
#include <vector>

#include "log/LogManager.h"
#include "tests/tools/LogSocket.h"

using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::MatchesRegex;
using ::testing::SizeIs;

namespace {

constexpr const char* kUserFile = "/var/log/qn_ope.log";
constexpr const char* kDebugFile = "/var/log/qn_ope_debug.log";

std::vector<std::string> linesOf(const char* path) {
    std::ifstream in(path);
    std::vector<std::string> lines;
    for (std::string line; std::getline(in, line);)
        lines.push_back(line);
    return lines;
}

class Logging : public ::testing::Test {
protected:
    void SetUp() override {
        ::unlink(kUserFile);
        ::unlink(kDebugFile);
    }
    void TearDown() override { UNINIT_LOGGING(); }
};

TEST_F(Logging, IsSilentBeforeInitialisation) {
    LogSocket log;
    LOG_EVENT(6, "Module", 101, "%d", 1);
    LOG_EVENT(std::wstring(L"Module"), 101, L"text", 6);
    LOG_EVENT(std::string("Module"), 101, "text", 6);
    LOG_USER_OPERATE("Module", 101, "%d", 1);
    LOG_USER_OPERATE(L"Module", 101, L"text");
    LOG_DEBUG_OPERATE(L"Module", 101, L"text");
    LOG_DEBUG_CAMERA("Module", 101, "text");
    EXPECT_FALSE(log.waiting());
    EXPECT_THAT(linesOf(kUserFile), SizeIs(0));
}

TEST_F(Logging, IsSilentAgainAfterItsEnd) {
    LogSocket log;
    INIT_LOGGING(L"Process");
    UNINIT_LOGGING();
    LOG_EVENT(6, "Module", 101, "text");
    EXPECT_FALSE(log.waiting());
}

TEST_F(Logging, EventsGoToTheSystemLogWithNameAndCode) {
    LogSocket log;
    INIT_LOGGING(L"MediaPlayerService");
    LOG_EVENT(3, "Module", 7, "%s is %d", "x", 5);
    EXPECT_THAT(log.next().value_or(""),
                MatchesRegex("<131>.*MediaPlayerService\\[[0-9]+\\]: Module 007: x is 5"));
    LOG_EVENT(std::wstring(L"Wide"), 101, L"gr\u00fc\u00df", 4);
    EXPECT_THAT(log.next().value_or(""), MatchesRegex("<132>.*: Wide 101: gr\u00fc\u00df"));
    LOG_EVENT(std::string("Narrow"), 410, "text", 6);
    EXPECT_THAT(log.next().value_or(""), MatchesRegex("<134>.*: Narrow 410: text"));
}

TEST_F(Logging, APercentSignIsAConversionInThePrintfFormOnly) {
    LogSocket log;
    INIT_LOGGING(L"Process");
    LOG_EVENT(6, "100%%", 1, "text");
    EXPECT_EQ(log.nextMessage(), "100% 001: text");
    LOG_EVENT(std::string("100%d"), 1, "50%s", 6);
    EXPECT_EQ(log.nextMessage(), "100%d 001: 50%s");
    LOG_EVENT(std::wstring(L"100%d"), 1, L"50%s", 6);
    EXPECT_EQ(log.nextMessage(), "100%d 001: 50%s");
}

TEST_F(Logging, ThePrintfFormIsCutAt255CharactersBeforeExpansion) {
    LogSocket log;
    INIT_LOGGING(L"Process");
    const std::string longName(300, 'n');
    LOG_EVENT(6, longName.c_str(), 1, "text");
    EXPECT_EQ(log.nextMessage(), std::string(255, 'n'));
    LOG_EVENT(6, "Module", 1, "%s", std::string(1000, 'm').c_str());
    EXPECT_EQ(log.nextMessage(), "Module 001: " + std::string(1000, 'm'));
}

TEST_F(Logging, TheProcessNameOfTheFirstInitialisationStays) {
    LogSocket log;
    INIT_LOGGING(L"First");
    INIT_LOGGING(L"Second");
    LOG_EVENT(6, "Module", 1, "text");
    EXPECT_THAT(log.next().value_or(""), HasSubstr(" First["));
}

TEST_F(Logging, OperationsAreAppendedToTheirFilesAndFlushed) {
    INIT_LOGGING(L"Process");
    LOG_USER_OPERATE("Module", 12, "value %d", 3);
    LOG_USER_OPERATE(L"Wide", 13, L"100%");
    LOG_DEBUG_OPERATE(L"Debug", 14, L"text");
    const std::string prefix = "[0-9-]+T[0-9:]+\\.[0-9]+[+-][0-9:]+ localhost Process\\[" +
                               std::to_string(::getpid()) + "\\]: ";
    const auto user = linesOf(kUserFile);
    ASSERT_THAT(user, SizeIs(2));
    EXPECT_THAT(user[0], MatchesRegex(prefix + "\\[Module\\] 012: value 3"));
    EXPECT_THAT(user[1], MatchesRegex(prefix + "\\[Wide\\] 013: 100%"));
    const auto debug = linesOf(kDebugFile);
    ASSERT_THAT(debug, SizeIs(1));
    EXPECT_THAT(debug[0], MatchesRegex(prefix + "\\[Debug\\] 014: text"));
}

TEST_F(Logging, FileLinesInThePrintfFormAreCutAt511Characters) {
    INIT_LOGGING(L"Process");
    LOG_USER_OPERATE(std::string(600, 'n').c_str(), 1, "text");
    const std::string all = linesOf(kUserFile).at(0);
    EXPECT_THAT(all, SizeIs(511));
    EXPECT_THAT(all, EndsWith("nnn"));
}

TEST_F(Logging, FilesThatCannotBeOpenedLoseTheirLinesSilently) {
    ASSERT_EQ(::mkdir(kUserFile, 0700), 0);
    ASSERT_EQ(::mkdir(kDebugFile, 0700), 0);
    INIT_LOGGING(L"Process");
    LOG_USER_OPERATE("Module", 1, "text");
    LOG_USER_OPERATE(L"Module", 1, L"text");
    LOG_DEBUG_OPERATE(L"Module", 1, L"text");
    ::rmdir(kUserFile);
    ::rmdir(kDebugFile);
}

TEST_F(Logging, CameraMessagesAreDropped) {
    LogSocket log;
    INIT_LOGGING(L"Process");
    LOG_DEBUG_CAMERA("Module", 1, "text");
    EXPECT_FALSE(log.waiting());
    EXPECT_THAT(linesOf(kUserFile), SizeIs(0));
    EXPECT_THAT(linesOf(kDebugFile), SizeIs(0));
}

TEST_F(Logging, ConcurrentFirstCallsMakeOneManager) {
    std::vector<LogManager*> managers(8);
    std::vector<std::thread> threads;
    for (LogManager*& manager : managers)
        threads.emplace_back([&manager] { manager = LogManager::getInstance(); });
    for (std::thread& thread : threads)
        thread.join();
    for (LogManager* manager : managers)
        EXPECT_EQ(manager, managers[0]);
}

TEST_F(Logging, LinesOfSeveralThreadsStayWhole) {
    INIT_LOGGING(L"Process");
    std::vector<std::thread> threads;
    for (int i = 0; i < 8; ++i)
        threads.emplace_back([] {
            for (int line = 0; line < 50; ++line)
                LOG_USER_OPERATE("Module", 1, "%s", "a line that is written whole");
        });
    for (std::thread& thread : threads)
        thread.join();
    const auto lines = linesOf(kUserFile);
    ASSERT_THAT(lines, SizeIs(400));
    for (const std::string& line : lines)
        EXPECT_THAT(line, EndsWith("[Module] 001: a line that is written whole"));
}

class TimeStamp : public ::testing::TestWithParam<std::pair<const char*, const char*>> {
protected:
    void TearDown() override {
        ::unsetenv("TZ");
        ::tzset();
    }
};

TEST_P(TimeStamp, TellsTheOffset) {
    ::setenv("TZ", GetParam().first, 1);
    ::tzset();
    EXPECT_THAT(LogManager::formatTime({1'700'000'000, 42}), EndsWith(GetParam().second));
}

// POSIX writes what is to be added to local time to get UTC.
INSTANTIATE_TEST_SUITE_P(Offsets, TimeStamp,
                         ::testing::Values(std::pair{"XXX-9", "T07:13:20.000042+09:00"},
                                           std::pair{"XXX-5:30", "T03:43:20.000042+05:30"},
                                           std::pair{"XXX0:30", "T21:43:20.000042+00:30"},
                                           std::pair{"XXX3:30", "T18:43:20.000042-03:30"},
                                           std::pair{"UTC0", "T22:13:20.000042+00:00"}));

TEST(LogManagerTime, IsEmptyWhenTheTimeCannotBeTold) {
    EXPECT_EQ(LogManager::formatTime({INT64_MAX, 0}), "");
}

TEST(LogManagerNumbers, AreDecimal) {
    EXPECT_EQ(LogManager::intToStringType(0), "0");
    EXPECT_EQ(LogManager::intToStringType(-12), "-12");
    EXPECT_EQ(LogManager::intToStringType(INT32_MIN), "-2147483648");
    EXPECT_EQ(LogManager::getProcID(), std::to_string(::getpid()));
}

} // namespace
