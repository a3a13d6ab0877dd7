// SPDX-License-Identifier: MIT
#include "main/SignalHandler.h"

#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <fcntl.h>
#include <initializer_list>
#include <string>
#include <syslog.h>
#include <thread>
#include <unistd.h>
#include <utility>

#include "ptc/Barrier.h"
#include "qnsys.h"

namespace {

struct SignalMessage {
    int number;
    const char* message;
};

constexpr SignalMessage signalsTable[] = {
    {SIGSEGV, "Segmentation Fault"},
    {SIGBUS, "Bus Error"},
    {SIGFPE, "Floating Point Exception"},
    {SIGQUIT, "Keyboard Quit"},
    {SIGTERM, "Termination"},
    {SIGINT, "Interrupt"},
    {SIGALRM, "Alarm"},
    {SIGPIPE, "Broken Pipe"},
    {SIGPWR, "Power Button Pressed"},
    {SIGUSR1, ""},
    {SIGUSR2, "User Defined Signal #2"},
    {0, nullptr},
};

constexpr int kSignalCount = 65;
constexpr int kHighestHandledSignal = 15;

std::atomic<void (*)()> g_pCallBackFun{nullptr};
std::string g_strProcessName;
std::atomic<bool> g_bIsInited{false};
std::atomic<const char**> g_SignalMsgTable{nullptr};

/** From the handler to the thread that runs the callback: one byte for every signal. */
int gSignalPipe[2] = {-1, -1};

void runCallback() {
    if (void (*callback)() = g_pCallBackFun)
        callback();
}

[[noreturn]] void crash() {
    qnsys_print_backtrace();
    // Not freed: the heap may be what has broken.
    g_SignalMsgTable = nullptr;
    g_bIsInited = false;
    std::abort();
}

void passOn(int sig) {
    if (gSignalPipe[1] < 0) { // there is no thread: better in the handler than not at all
        runCallback();
        return;
    }
    const int savedErrno = errno;
    const char byte = static_cast<char>(sig);
    [[maybe_unused]] const ssize_t written = ::write(gSignalPipe[1], &byte, 1);
    errno = savedErrno;
}

void handleSignal(int sig) {
    if (sig > kHighestHandledSignal)
        return;
    switch (sig) {
    case SIGQUIT:
    case SIGBUS:
    case SIGFPE:
    case SIGSEGV:
        crash();
    case SIGINT:
    case SIGTERM:
        passOn(sig);
        return;
    default:
        return;
    }
}

/** Runs the callback for every signal that the handler tells of, as long as the process lives. */
void runCallbacks() {
    char byte;
    while (::read(gSignalPipe[0], &byte, 1) == 1)
        runCallback();
}

/**
 * It takes no signals itself, so that no read is interrupted; but a crash on it is one like any
 * other.
 */
bool startThreadWithoutSignals(void (*body)()) {
    sigset_t blocked;
    sigset_t before;
    sigfillset(&blocked);
    for (const int crash : {SIGSEGV, SIGBUS, SIGFPE})
        sigdelset(&blocked, crash);
    pthread_sigmask(SIG_SETMASK, &blocked, &before);
    const bool started = PTC::barrier([body] { std::thread(body).detach(); });
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
    return started;
}

void startCallbackThread() {
    if (::pipe2(gSignalPipe, O_CLOEXEC) != 0)
        return;
    ::fcntl(gSignalPipe[1], F_SETFL, O_NONBLOCK); // a handler never waits
    if (startThreadWithoutSignals(runCallbacks))
        return;
    for (int& end : gSignalPipe)
        ::close(std::exchange(end, -1));
}

const char* messageOf(int number) {
    for (const SignalMessage* row = signalsTable; row->number != 0; ++row)
        if (row->number == number)
            return row->message;
    return nullptr;
}

bool buildMessageTable() {
    auto** table = static_cast<const char**>(std::malloc(kSignalCount * sizeof(const char*)));
    if (table == nullptr) {
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wpedantic" // %m is the system log's own
#pragma GCC diagnostic ignored "-Wformat"
        qnsys_syslog(LOG_ERR, "%s: %m", "malloc");
#pragma GCC diagnostic pop
        return false;
    }
    for (int number = 0; number < kSignalCount; ++number)
        table[number] = messageOf(number);
    g_SignalMsgTable = table;
    return true;
}

void installHandlers() {
    struct sigaction action {};
    action.sa_handler = handleSignal;
    sigemptyset(&action.sa_mask);
    for (const SignalMessage* row = signalsTable; row->number != 0; ++row)
        ::sigaction(row->number, &action, nullptr);
}

} // namespace

void registerSystemSignalHandler(void (*callback)(), const char* processName) {
    g_pCallBackFun = callback;
    g_strProcessName = processName != nullptr ? processName : "";
    if (g_bIsInited)
        return;
    if (buildMessageTable()) {
        startCallbackThread();
        installHandlers();
    }
    g_bIsInited = true;
}
