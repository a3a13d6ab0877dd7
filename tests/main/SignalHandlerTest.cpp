// SPDX-License-Identifier: MIT
#include "main/SignalHandler.h"

#include <array>
#include <cerrno>
#include <csignal>
#include <cstddef>
#include <gmock/gmock.h>
#include <string>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include "log/Logging.h"
#include "main/SystemSingleCaught.h"
#include "qnsys.h"
#include "tests/tools/LogSocket.h"

using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::StartsWith;

static bool gNoMemory = false;

/** Linked in the place of malloc(3) as this program's own code calls it. */
extern "C" {
void* __real_malloc(std::size_t size);
void* __wrap_malloc(std::size_t size) {
    if (!gNoMemory)
        return __real_malloc(size);
    errno = ENOMEM;
    return nullptr;
}
}

/** Its name is to be seen in the back-trace. */
__attribute__((noinline)) void crashInThisFunction(int signal) {
    ::raise(signal);
    asm volatile(""); // not a tail call
}

namespace {

struct Outcome {
    int status = 0;
    std::string output; ///< what the child wrote to standard output and error
};

/** Runs `body` in a child process, where signals can do what they do. */
template<typename Body>
Outcome inChild(Body&& body) {
    std::array<int, 2> ends{};
    EXPECT_EQ(::pipe(ends.data()), 0);
    const pid_t child = ::fork();
    if (child == 0) {
        const rlimit noCore{};
        ::setrlimit(RLIMIT_CORE, &noCore);
        ::dup2(ends[1], STDOUT_FILENO);
        ::dup2(ends[1], STDERR_FILENO);
        ::close(ends[0]);
        ::close(ends[1]);
        qnsys_init();
        body();
        ::_exit(0);
    }
    ::close(ends[1]);
    Outcome outcome;
    std::array<char, 4096> buffer{};
    for (ssize_t count; (count = ::read(ends[0], buffer.data(), buffer.size())) > 0;)
        outcome.output.append(buffer.data(), static_cast<std::size_t>(count));
    ::close(ends[0]);
    ::waitpid(child, &outcome.status, 0);
    return outcome;
}

void exitWithSeven() {
    ::_exit(7);
}

void exitWithEight() {
    ::_exit(8);
}

struct sigaction actionOf(int signal) {
    struct sigaction action {};
    ::sigaction(signal, nullptr, &action);
    return action;
}

auto handlerOf(int signal) {
    return actionOf(signal).sa_handler;
}

bool isCaughtPlainly(int signal) {
    constexpr int kFlags = SA_RESTART | SA_NODEFER | SA_RESETHAND | SA_SIGINFO | SA_ONSTACK;
    const struct sigaction action = actionOf(signal);
    return action.sa_handler != SIG_DFL && action.sa_handler != SIG_IGN &&
           (action.sa_flags & kFlags) == 0 && sigisemptyset(&action.sa_mask);
}

[[noreturn]] void waitForTheEnd() {
    for (;;)
        ::pause();
}

class IgnoredSignals : public ::testing::TestWithParam<int> {};

TEST_P(IgnoredSignals, DoNotEndTheProcess) {
    const Outcome outcome = inChild([] {
        registerSystemSignalHandler(exitWithSeven, "test");
        // The thread of the callbacks is given the time to run one, if it were to.
        for (int i = 0; i < 100'000; ++i)
            ::raise(GetParam());
    });
    EXPECT_TRUE(WIFEXITED(outcome.status));
    EXPECT_EQ(WEXITSTATUS(outcome.status), 0);
}

INSTANTIATE_TEST_SUITE_P(All, IgnoredSignals,
                         ::testing::Values(SIGPIPE, SIGUSR1, SIGUSR2, SIGALRM, SIGPWR));

class EndingSignals : public ::testing::TestWithParam<int> {};

TEST_P(EndingSignals, RunTheCallback) {
    const Outcome outcome = inChild([] {
        registerSystemSignalHandler(exitWithSeven, "test");
        ::raise(GetParam());
        waitForTheEnd();
    });
    EXPECT_TRUE(WIFEXITED(outcome.status));
    EXPECT_EQ(WEXITSTATUS(outcome.status), 7);
}

TEST_P(EndingSignals, RunTheCallbackThatWasRegisteredLast) {
    const Outcome outcome = inChild([] {
        registerSystemSignalHandler(exitWithSeven, "test");
        registerSystemSignalHandler(exitWithEight, "test");
        ::raise(GetParam());
        waitForTheEnd();
    });
    EXPECT_EQ(WEXITSTATUS(outcome.status), 8);
}

TEST_P(EndingSignals, DoNothingWithoutACallback) {
    const Outcome outcome = inChild([] {
        registerSystemSignalHandler(nullptr, "test");
        ::raise(GetParam());
        // A callback registered now is told of the next signal only.
        registerSystemSignalHandler(exitWithSeven, "test");
        ::raise(GetParam());
        waitForTheEnd();
    });
    EXPECT_TRUE(WIFEXITED(outcome.status));
    EXPECT_EQ(WEXITSTATUS(outcome.status), 7);
}

INSTANTIATE_TEST_SUITE_P(All, EndingSignals, ::testing::Values(SIGINT, SIGTERM));

class CrashSignals : public ::testing::TestWithParam<int> {};

TEST_P(CrashSignals, PrintABackTraceAndAbort) {
    const Outcome outcome = inChild([] {
        registerSystemSignalHandler(exitWithSeven, "test");
        crashInThisFunction(GetParam());
    });
    EXPECT_TRUE(WIFSIGNALED(outcome.status));
    EXPECT_EQ(WTERMSIG(outcome.status), SIGABRT);
    EXPECT_THAT(outcome.output, HasSubstr("main_test"));
    EXPECT_THAT(outcome.output, HasSubstr("(main+"));
    EXPECT_THAT(outcome.output, HasSubstr("crashInThisFunction"));
}

INSTANTIATE_TEST_SUITE_P(All, CrashSignals, ::testing::Values(SIGSEGV, SIGBUS, SIGFPE, SIGQUIT));

int gCrash = 0;

void crashInTheCallback() {
    crashInThisFunction(gCrash);
    ::_exit(7);
}

class CrashesOfTheCallback : public ::testing::TestWithParam<int> {};

TEST_P(CrashesOfTheCallback, AreCrashesLikeAnyOther) {
    const Outcome outcome = inChild([] {
        gCrash = GetParam();
        registerSystemSignalHandler(crashInTheCallback, "test");
        ::raise(SIGTERM);
        waitForTheEnd();
    });
    EXPECT_TRUE(WIFSIGNALED(outcome.status));
    EXPECT_EQ(WTERMSIG(outcome.status), SIGABRT);
    EXPECT_THAT(outcome.output, HasSubstr("crashInThisFunction"));
}

INSTANTIATE_TEST_SUITE_P(All, CrashesOfTheCallback, ::testing::Values(SIGSEGV, SIGBUS, SIGFPE));

TEST(SignalHandler, LeavesSignalsBeyondItsTableAlone) {
    const Outcome outcome = inChild([] {
        registerSystemSignalHandler(exitWithSeven, "test");
        ::raise(SIGXCPU);
    });
    EXPECT_TRUE(WIFSIGNALED(outcome.status));
    EXPECT_EQ(WTERMSIG(outcome.status), SIGXCPU);
}

TEST(SignalHandler, IsInstalledForTheTableAloneWithoutFlagsAndMask) {
    const Outcome outcome = inChild([] {
        registerSystemSignalHandler(nullptr, "test");
        constexpr int kCaught[] = {SIGSEGV, SIGBUS,  SIGFPE, SIGQUIT, SIGTERM, SIGINT,
                                   SIGALRM, SIGPIPE, SIGPWR, SIGUSR1, SIGUSR2};
        for (const int signal : kCaught)
            if (!isCaughtPlainly(signal))
                ::_exit(signal);
        for (const int signal : {SIGHUP, SIGCHLD, SIGXCPU, SIGTSTP})
            if (handlerOf(signal) != SIG_DFL)
                ::_exit(signal);
    });
    EXPECT_EQ(outcome.status, 0);
}

TEST(SignalHandler, IsNotInstalledAgainByASecondRegistration) {
    const Outcome outcome = inChild([] {
        registerSystemSignalHandler(exitWithSeven, "test");
        ::signal(SIGTERM, SIG_IGN);
        registerSystemSignalHandler(exitWithEight, "test");
        ::_exit(handlerOf(SIGTERM) == SIG_IGN ? 0 : 1);
    });
    EXPECT_EQ(outcome.status, 0);
}

TEST(SignalHandler, IsNotInstalledWithoutMemoryButSaysSo) {
    LogSocket log;
    const Outcome outcome = inChild([] {
        INIT_LOGGING(L"test");
        const auto crashHandler = handlerOf(SIGSEGV); // a sanitizer has one
        gNoMemory = true;
        registerSystemSignalHandler(exitWithSeven, "test");
        gNoMemory = false;
        registerSystemSignalHandler(exitWithSeven, "test"); // comes too late
        for (const int signal : {SIGTERM, SIGINT, SIGPIPE, SIGPWR})
            if (handlerOf(signal) != SIG_DFL)
                ::_exit(signal);
        if (handlerOf(SIGSEGV) != crashHandler)
            ::_exit(SIGSEGV);
    });
    EXPECT_EQ(outcome.status, 0);
    const std::string line = log.next().value_or("");
    EXPECT_THAT(line, StartsWith("<131>"));
    EXPECT_THAT(line, EndsWith("]: malloc: Cannot allocate memory"));
    EXPECT_EQ(log.waiting(), std::nullopt);
}

TEST(SignalHandler, LeavesTheErrorNumberAlone) {
    const Outcome outcome = inChild([] {
        registerSystemSignalHandler(nullptr, "test");
        errno = ERANGE;
        for (int i = 0; i < 100'000; ++i) // more than the way to the callback has room for
            ::raise(SIGTERM);
        ::_exit(errno == ERANGE ? 0 : 1);
    });
    EXPECT_EQ(outcome.status, 0);
}

TEST(SignalHandler, TakesAnyProcessName) {
    const Outcome outcome = inChild([] {
        registerSystemSignalHandler(exitWithSeven, nullptr);
        ::raise(SIGTERM);
        waitForTheEnd();
    });
    EXPECT_EQ(WEXITSTATUS(outcome.status), 7);
}

TEST(SystemSingleCaught, EndsAProcessWhoseMainThreadIsBusyAndLogsOneLineForTwoSignals) {
    LogSocket log;
    const Outcome outcome = inChild([] {
        INIT_LOGGING(L"MediaPlayerService");
        registerSystemSignalHandler(onSystemSingleCaught, "QNSMediaService");
        ::raise(SIGTERM);
        ::raise(SIGINT);
        waitForTheEnd();
    });
    EXPECT_TRUE(WIFEXITED(outcome.status));
    EXPECT_EQ(WEXITSTATUS(outcome.status), 0);
    EXPECT_EQ(log.nextMessage(), "MediaPlayerService 101: main::onSystemSingleCaught");
    EXPECT_EQ(log.waiting(), std::nullopt);
}

} // namespace
