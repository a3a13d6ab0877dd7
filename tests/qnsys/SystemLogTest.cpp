// SPDX-License-Identifier: MIT
#include "qnsys.h"

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <optional>
#include <string>
#include <syslog.h>
#include <thread>
#include <utility>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/tools/LogSocket.h"

namespace {

using testing::EndsWith;
using testing::HasSubstr;
using testing::MatchesRegex;

constexpr int kLocal0 = LOG_LOCAL0;

/** Dropped lines are counted over all tests of this process, so each starts with none. */
class SystemLog : public testing::Test {
protected:
    SystemLog() {
        qnsys_openlog("tester", LOG_PID, kLocal0);
        startDaemon();
        qnsys_syslog(LOG_INFO, "start");
        while (mDaemon->nextMessage() != "start") {
        }
    }

    void startDaemon(int type = SOCK_DGRAM) { mDaemon.emplace(type); }
    void stopDaemon() { mDaemon.reset(); }

    static std::string tag() { return " tester[" + std::to_string(::getpid()) + "]: "; }

    std::optional<LogSocket> mDaemon;
};

std::string withoutTime(const std::string& line) {
    return line.substr(0, line.find('>') + 1) + line.substr(line.find('>') + 16);
}

} // namespace

TEST_F(SystemLog, LinesAreThoseOfTheCLibrary) {
    ::openlog("tester", LOG_PID, kLocal0);
    ::syslog(LOG_WARNING, "%s is %d", "answer", 42);
    ::closelog();
    const std::string expected = mDaemon->next().value_or("");
    qnsys_syslog(LOG_WARNING, "%s is %d", "answer", 42);
    const std::string line = mDaemon->next().value_or("");
    EXPECT_EQ(withoutTime(line), withoutTime(expected));
    EXPECT_THAT(line, MatchesRegex("<132>[A-Z][a-z]{2} [ 1-3][0-9] [0-9]{2}:[0-9]{2}:[0-9]{2} .*"));
    EXPECT_THAT(line, EndsWith(tag() + "answer is 42"));
}

TEST_F(SystemLog, WithoutTheOptionThereIsNoProcessId) {
    qnsys_openlog("tester", 0, kLocal0);
    qnsys_syslog(LOG_INFO, "text");
    EXPECT_THAT(mDaemon->next().value_or(""), EndsWith(" tester: text"));
}

TEST_F(SystemLog, WithoutAnIdentTheNameIsTheProgrammes) {
    qnsys_openlog(nullptr, 0, kLocal0);
    qnsys_syslog(LOG_INFO, "text");
    EXPECT_THAT(mDaemon->next().value_or(""), EndsWith(" qnsys_test: text"));
}

TEST_F(SystemLog, TheIdentIsCopied) {
    std::string ident = "first";
    qnsys_openlog(ident.c_str(), 0, kLocal0);
    ident = "other";
    qnsys_syslog(LOG_INFO, "text");
    EXPECT_THAT(mDaemon->next().value_or(""), EndsWith(" first: text"));
}

TEST_F(SystemLog, AFacilityInThePriorityIsKept) {
    qnsys_syslog(LOG_DAEMON | LOG_ERR, "text");
    EXPECT_THAT(mDaemon->next().value_or(""), testing::StartsWith("<27>"));
}

TEST_F(SystemLog, AWrongFacilityIsNotTaken) {
    qnsys_openlog("tester", LOG_PID, 1 << 20);
    qnsys_syslog(LOG_ERR | 1 << 20, "text");
    EXPECT_THAT(mDaemon->next().value_or(""), testing::StartsWith("<131>"));
}

TEST_F(SystemLog, TheErrorNumberHasAConversion) {
    const char* format = "%s: %m"; // a variable, for which compilers do not check conversions
    errno = ENOENT;
    qnsys_syslog(LOG_ERR, format, "open");
    EXPECT_EQ(mDaemon->nextMessage(), "open: No such file or directory");
}

TEST_F(SystemLog, ALongLineComesWhole) {
    const std::string text(100000, 'x');
    qnsys_syslog(LOG_INFO, "%s", text.c_str());
    EXPECT_EQ(mDaemon->nextMessage(), text);
}

TEST_F(SystemLog, ALineThatIsTooLongIsDroppedAndTheNextOneComes) {
    qnsys_syslog(LOG_INFO, "%s", std::string(8'000'000, 'x').c_str());
    qnsys_syslog(LOG_INFO, "next");
    EXPECT_EQ(mDaemon->nextMessage(), "1 log lines were dropped");
    EXPECT_EQ(mDaemon->nextMessage(), "next");
}

TEST_F(SystemLog, LinesWithoutALogDaemonAreCounted) {
    stopDaemon();
    qnsys_syslog(LOG_INFO, "lost");
    qnsys_syslog(LOG_INFO, "lost too");
    startDaemon();
    qnsys_syslog(LOG_INFO, "next");
    const std::string told = mDaemon->next().value_or("");
    EXPECT_THAT(told, testing::StartsWith("<132>"));
    EXPECT_THAT(told, EndsWith(tag() + "2 log lines were dropped"));
    EXPECT_EQ(mDaemon->nextMessage(), "next");
}

TEST_F(SystemLog, ARestartedLogDaemonGetsTheNextLine) {
    stopDaemon();
    startDaemon();
    qnsys_syslog(LOG_INFO, "next");
    EXPECT_EQ(mDaemon->nextMessage(), "next");
}

TEST_F(SystemLog, ALogDaemonThatStopsReadingHoldsUpNobody) {
    constexpr int kLines = 1000;
    for (int i = 0; i < kLines; ++i) // blocks for ever in the C library
        qnsys_syslog(LOG_INFO, "%d", i);
    int taken = 0;
    while (const auto line = mDaemon->waiting())
        EXPECT_THAT(*line, EndsWith("]: " + std::to_string(taken++)));
    EXPECT_LT(taken, kLines);
    qnsys_syslog(LOG_INFO, "next");
    EXPECT_EQ(mDaemon->nextMessage(), std::to_string(kLines - taken) + " log lines were dropped");
    EXPECT_EQ(mDaemon->nextMessage(), "next");
}

TEST_F(SystemLog, LinesOfSeveralThreadsComeWhole) {
    constexpr int kThreads = 4;
    constexpr int kLines = 1000;
    std::vector<std::thread> threads;
    for (int i = 0; i < kThreads; ++i)
        threads.emplace_back([i] {
            for (int line = 1; line <= kLines; ++line)
                qnsys_syslog(LOG_INFO, "thread %d line %d", i, line);
        });
    std::atomic<bool> ended{false};
    std::thread closing([&] {
        for (std::thread& thread : threads)
            thread.join();
        while (!ended) // it may be dropped like every line
            qnsys_syslog(LOG_INFO, "end");
    });
    std::vector<int> last(kThreads, 0);
    for (;;) {
        const std::string message = mDaemon->nextMessage();
        unsigned thread = 0;
        int line = 0;
        if (message == "end" || message.empty())
            break;
        if (testing::Matches(EndsWith(" log lines were dropped"))(message))
            continue;
        EXPECT_THAT(message, MatchesRegex("thread [0-3] line [0-9]+"));
        std::sscanf(message.c_str(), "thread %u line %d", &thread, &line);
        EXPECT_GT(line, std::exchange(last[thread % kThreads], line));
    }
    ended = true;
    closing.join();
}

TEST_F(SystemLog, AStreamIsTakenWhereTheLogDaemonServesOne) {
    stopDaemon();
    startDaemon(SOCK_STREAM);
    qnsys_syslog(LOG_INFO, "first");
    qnsys_syslog(LOG_INFO, "second");
    const qns::UniqueFd connection(::accept(mDaemon->socket(), nullptr, nullptr));
    stopDaemon();
    std::string text(1000, '\0');
    const ssize_t length = ::recv(connection.get(), text.data(), text.size(), 0);
    ASSERT_GT(length, 0);
    text.resize(static_cast<std::size_t>(length));
    const std::string end(1, '\0');
    EXPECT_THAT(text, HasSubstr(tag() + "first" + end));
    EXPECT_THAT(text, EndsWith(tag() + "second" + end));
}
