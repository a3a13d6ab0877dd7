// SPDX-License-Identifier: MIT
#include "log/Logging.h"

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <thread>
#include <unistd.h>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/tools/LogSocket.h"

namespace fs = std::filesystem;

namespace {

using testing::EndsWith;
using testing::StartsWith;

const std::string kUserFile = "/var/log/qn_ope.log";
const std::string kDebugFile = "/var/log/qn_ope_debug.log";

std::string contents(const std::string& path) {
    std::ifstream file(path);
    return {std::istreambuf_iterator<char>(file), {}};
}

/** What a line has after its time. */
std::string lineEnd(const std::string& process, const std::string& rest) {
    return " localhost " + process + "[" + std::to_string(::getpid()) + "]: " + rest + "\n";
}

constexpr const char* kTime = "[0-9]{4}-[0-9]{2}-[0-9]{2}T[0-9]{2}:[0-9]{2}:[0-9]{2}\\.[0-9]{6}"
                              "[+-][0-9]{2}:[0-9]{2} localhost .*\n";

class LoggingOff : public testing::Test {
protected:
    LoggingOff() { removeFiles(); }
    ~LoggingOff() override {
        UNINIT_LOGGING();
        removeFiles();
    }

    static void removeFiles() {
        fs::remove_all(kUserFile);
        fs::remove_all(kDebugFile);
    }

    static void logEverywhere() {
        LOG_EVENT(6, "Name", 101, "%d", 1);
        LOG_EVENT(L"Name", 101, L"text", 6);
        LOG_EVENT(std::string("Name"), 101, std::string("text"), 6);
        LOG_USER_OPERATE("Name", 101, "%d", 1);
        LOG_USER_OPERATE(L"Name", 101, L"text");
        LOG_DEBUG_OPERATE(L"Name", 101, L"text");
        LOG_DEBUG_CAMERA("Name", 101, "%d", 1);
    }

    LogSocket mDaemon;
};

class Logging : public LoggingOff {
protected:
    Logging() { INIT_LOGGING(L"Process"); }
};

} // namespace

TEST_F(LoggingOff, NothingIsWrittenAndNothingFails) {
    logEverywhere();
    EXPECT_EQ(mDaemon.waiting(), std::nullopt);
    EXPECT_FALSE(fs::exists(kUserFile));
    EXPECT_FALSE(fs::exists(kDebugFile));
}

TEST_F(Logging, MayBeTurnedOffAndOnAgainUnderAnotherName) {
    UNINIT_LOGGING();
    logEverywhere();
    EXPECT_EQ(mDaemon.waiting(), std::nullopt);
    EXPECT_EQ(contents(kUserFile), "");
    INIT_LOGGING(L"Other");
    LOG_USER_OPERATE(L"Name", 101, L"text");
    EXPECT_THAT(contents(kUserFile), EndsWith(lineEnd("Other", "[Name] 101: text")));
}

TEST_F(Logging, KeepsTheNameThatItWasTurnedOnWith) {
    INIT_LOGGING(L"Other");
    LOG_EVENT(L"Name", 101, L"text", 6);
    EXPECT_THAT(mDaemon.next().value_or(""),
                EndsWith(" Process[" + std::to_string(::getpid()) + "]: Name 101: text"));
}

TEST_F(Logging, AnEventHasNameCodeAndText) {
    LOG_EVENT(6, "Name", 7, "%s is %d", "answer", 42);
    EXPECT_EQ(mDaemon.nextMessage(), "Name 007: answer is 42");
    LOG_EVENT(L"Name", 101, L"text", 6);
    EXPECT_EQ(mDaemon.nextMessage(), "Name 101: text");
    LOG_EVENT(std::string("Name"), -1, std::string("text"), 6);
    EXPECT_EQ(mDaemon.nextMessage(), "Name -01: text");
}

TEST_F(Logging, AnEventHasItsLevelAndTheLocalFacility) {
    LOG_EVENT(3, "Name", 401, "failed");
    EXPECT_THAT(mDaemon.next().value_or(""), StartsWith("<131>"));
    LOG_EVENT(L"Name", 401, L"careful", 4);
    EXPECT_THAT(mDaemon.next().value_or(""), StartsWith("<132>"));
    LOG_EVENT(std::string("Name"), 101, std::string("done"), 6);
    EXPECT_THAT(mDaemon.next().value_or(""), StartsWith("<134>"));
}

TEST_F(Logging, AnEventInPrintfFormTakesConversionsFromTheName) {
    const char* format = "%s"; // with the name's there are two conversions
    LOG_EVENT(6, "%s", 101, format, "name", "text");
    EXPECT_EQ(mDaemon.nextMessage(), "name 101: text");
}

TEST_F(Logging, AnEventInAStringFormPrintsPercentSignsAsTheyStand) {
    LOG_EVENT(L"100%s", 101, L"50%d", 6);
    EXPECT_EQ(mDaemon.nextMessage(), "100%s 101: 50%d");
    LOG_EVENT(std::string("100%s"), 101, std::string("50%d"), 6);
    EXPECT_EQ(mDaemon.nextMessage(), "100%s 101: 50%d");
}

TEST_F(Logging, AnEventInPrintfFormIsCutBeforeItsArgumentsAreExpanded) {
    const std::string format = "%s" + std::string(1000, 'x');
    const std::string argument(500, 'y');
    LOG_EVENT(6, "Name", 101, format.c_str(), argument.c_str());
    const std::string prefix = "Name 101: ";
    EXPECT_EQ(mDaemon.nextMessage(), prefix + argument + std::string(255 - prefix.size() - 2, 'x'));
}

TEST_F(Logging, AnEventInAStringFormIsNotCut) {
    LOG_EVENT(L"Name", 101, std::wstring(50000, L'x'), 6);
    EXPECT_EQ(mDaemon.nextMessage(), "Name 101: " + std::string(50000, 'x'));
}

TEST_F(Logging, WideTextIsWrittenInTheLocale) {
    LOG_EVENT(L"Z\u00fcrich", 101, L"\u4eac\U0001f600", 6);
    EXPECT_EQ(mDaemon.nextMessage(), "Z\u00fcrich 101: \u4eac\U0001f600");
}

TEST_F(Logging, UserOperationsGoToTheirFileAndNowhereElse) {
    LOG_USER_OPERATE("Name", 1, "%s is %d", "answer", 42);
    EXPECT_THAT(contents(kUserFile), testing::MatchesRegex(kTime));
    EXPECT_THAT(contents(kUserFile), EndsWith(lineEnd("Process", "[Name] 001: answer is 42")));
    LOG_USER_OPERATE(L"Name", 102, L"text");
    EXPECT_THAT(contents(kUserFile), EndsWith(lineEnd("Process", "[Name] 102: text")));
    EXPECT_EQ(contents(kDebugFile), "");
    EXPECT_EQ(mDaemon.waiting(), std::nullopt);
}

TEST_F(Logging, DebugOperationsGoToTheirFileAndNowhereElse) {
    LOG_DEBUG_OPERATE(L"Name", 102, L"text");
    EXPECT_THAT(contents(kDebugFile), testing::MatchesRegex(kTime));
    EXPECT_THAT(contents(kDebugFile), EndsWith(lineEnd("Process", "[Name] 102: text")));
    EXPECT_EQ(contents(kUserFile), "");
    EXPECT_EQ(mDaemon.waiting(), std::nullopt);
}

TEST_F(Logging, CameraMessagesAreDropped) {
    LOG_DEBUG_CAMERA("Name", 101, "%d", 1);
    EXPECT_EQ(mDaemon.waiting(), std::nullopt);
    EXPECT_EQ(contents(kUserFile) + contents(kDebugFile), "");
    const fs::directory_iterator files("/var/log");
    EXPECT_EQ(std::distance(begin(files), end(files)), 2);
}

TEST_F(Logging, FilesAreAppendedTo) {
    UNINIT_LOGGING();
    std::ofstream(kUserFile) << "before\n";
    INIT_LOGGING(L"Process");
    LOG_USER_OPERATE(L"Name", 101, L"text");
    EXPECT_THAT(contents(kUserFile), StartsWith("before\n"));
    EXPECT_THAT(contents(kUserFile), EndsWith("[Name] 101: text\n"));
}

TEST_F(Logging, AFileLineInPrintfFormTakesConversionsFromTheNames) {
    UNINIT_LOGGING();
    INIT_LOGGING(L"50%%");
    const char* format = "%s";
    LOG_USER_OPERATE("%s", 101, format, "name", "text");
    EXPECT_THAT(contents(kUserFile), EndsWith(lineEnd("50%", "[name] 101: text")));
}

TEST_F(Logging, AFileLineInAStringFormPrintsPercentSignsAsTheyStand) {
    UNINIT_LOGGING();
    INIT_LOGGING(L"50%%");
    LOG_USER_OPERATE(L"100%s", 101, L"%n%s");
    EXPECT_THAT(contents(kUserFile), EndsWith(lineEnd("50%%", "[100%s] 101: %n%s")));
    LOG_DEBUG_OPERATE(L"100%s", 101, L"%n%s");
    EXPECT_THAT(contents(kDebugFile), EndsWith(lineEnd("50%%", "[100%s] 101: %n%s")));
}

TEST_F(Logging, AFileLineInPrintfFormIsCutBeforeItsArgumentsAreExpanded) {
    const std::string format = "%s" + std::string(1000, 'x');
    const std::string argument(2000, 'y');
    LOG_USER_OPERATE("Name", 101, format.c_str(), argument.c_str());
    const std::string line = contents(kUserFile);
    EXPECT_EQ(line.size(), 511 - 2 + argument.size());
    EXPECT_THAT(line, EndsWith("yyx" + std::string(line.size() - line.rfind('y') - 2, 'x')));
}

TEST_F(Logging, AFileLineInAStringFormIsNotCut) {
    LOG_USER_OPERATE(L"Name", 101, std::wstring(100000, L'x'));
    EXPECT_THAT(contents(kUserFile), EndsWith("101: " + std::string(100000, 'x') + "\n"));
}

TEST_F(LoggingOff, AFileThatCannotBeOpenedLosesItsLinesAndNoOthers) {
    fs::create_directory(kUserFile);
    INIT_LOGGING(L"Process");
    LOG_USER_OPERATE("Name", 101, "%d", 1);
    LOG_USER_OPERATE(L"Name", 101, L"text");
    LOG_DEBUG_OPERATE(L"Name", 101, L"text");
    EXPECT_TRUE(fs::is_directory(kUserFile));
    EXPECT_THAT(contents(kDebugFile), EndsWith(lineEnd("Process", "[Name] 101: text")));
}

TEST_F(LoggingOff, AFullDiskHarmsNobody) {
    fs::create_symlink("/dev/full", kUserFile);
    fs::create_symlink("/dev/full", kDebugFile);
    INIT_LOGGING(L"Process");
    for (int i = 0; i < 3; ++i)
        logEverywhere();
    EXPECT_EQ(mDaemon.nextMessage(), "Name 101: 1");
}

TEST_F(LoggingOff, ThreadsMayTurnItOnAndLogAtTheSameTime) {
    constexpr int kThreads = 8;
    constexpr int kLines = 100;
    std::vector<std::thread> threads;
    for (int i = 0; i < kThreads; ++i)
        threads.emplace_back([] {
            INIT_LOGGING(L"Process");
            for (int line = 0; line < kLines; ++line) {
                LOG_USER_OPERATE("Name", 101, "%s", "text");
                LOG_USER_OPERATE(L"Name", 101, L"text");
                LOG_EVENT(L"Name", 101, L"text", 6);
            }
        });
    for (std::thread& thread : threads)
        thread.join();
    while (mDaemon.waiting()) {
    }
    LOG_EVENT(L"Name", 101, L"end", 6); // what was dropped is told here and not in another test
    std::ifstream file(kUserFile);
    int lines = 0;
    for (std::string line; std::getline(file, line); ++lines)
        EXPECT_THAT(line + "\n", EndsWith(lineEnd("Process", "[Name] 101: text")));
    EXPECT_EQ(lines, 2 * kThreads * kLines);
}
