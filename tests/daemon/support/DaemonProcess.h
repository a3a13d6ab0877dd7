// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <csignal>
#include <cstddef>
#include <map>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <sys/types.h>
#include <thread>
#include <vector>

#include "base/UniqueFd.h"
#include "tests/daemon/support/Lines.h"
#include "tests/daemon/support/Patience.h"

/** How a daemon is started. */
struct DaemonOptions {
    std::string program = QNS_DAEMON;

    /**
     * Where standard output goes. Standard error goes with it, but not into the full pipe, and is
     * captured where standard output is discarded.
     */
    enum class Output { captured, closed, fullPipe, discarded };

    std::vector<std::string> arguments;

    /** Changes to the test's own environment; nothing: the variable is taken out. */
    std::map<std::string, std::optional<std::string>> environment;

    /** Options of setpriv(1): user, groups, capabilities. */
    std::vector<std::string> privileges;

    Output output = Output::captured;

    /** Puts a library folder before the build's own. */
    void preferLibraries(const std::string& folder) { environment["LD_LIBRARY_PATH"] = folder; }
};

/**
 * A real daemon process. Standard output and standard error are captured together, line by
 * line. The destructor kills what still runs; a sanitizer's report in the output fails the test.
 */
class DaemonProcess {
public:
    explicit DaemonProcess(const DaemonOptions& options = {});
    ~DaemonProcess();
    DaemonProcess(const DaemonProcess&) = delete;
    DaemonProcess& operator=(const DaemonProcess&) = delete;

    [[nodiscard]] pid_t pid() const { return mPid; }

    /** Waits for the line that follows the start of the socket server. */
    [[nodiscard]] bool waitUntilServing() {
        return mOutput.waitFor("MediaServiceMain::initialize");
    }

    /** Waits for an output line that contains `text`. */
    [[nodiscard]] bool waitForLine(std::string_view text, std::size_t count = 1) {
        return mOutput.waitFor(text, count);
    }

    /** All that the process has written up to now. */
    [[nodiscard]] const Lines& output();

    void signal(int number);

    /** Sends the signal to every thread of the process by itself. */
    void signalEachThread(int number) const;

    /** Waits for the end. What the shell would call the exit status: 128 + n for signal n. */
    int waitForExit();

    /** The same, but does not wait for all output: a process that it started may still write. */
    int waitForEnd();

    /** signal(SIGTERM) and waitForExit(). */
    int terminate();

    [[nodiscard]] bool isRunning();

    /**
     * Open descriptors at this moment, but for those of the engine's worker processes: each has
     * one, and is started when it is first needed.
     */
    [[nodiscard]] std::size_t descriptorCount() const;

    /** Threads at this moment. */
    [[nodiscard]] std::size_t threadCount() const;

    /** Bytes of memory in use at this moment. */
    [[nodiscard]] std::size_t residentBytes() const;

    /** Waits until there are no more than that many of either. */
    [[nodiscard]] bool waitForResources(std::size_t descriptors, std::size_t threads) const;

    /** Lets the process open this many descriptors more, and then no more, until told again. */
    void limitFreeDescriptors(std::size_t count) const;

private:
    void readLoop();
    bool readAvailable();
    void checkOutput() const;
    [[nodiscard]] bool endsBefore(patience::Clock::time_point deadline, int process) const;

    pid_t mPid = -1;
    int mLastSignal = 0;
    std::optional<int> mStatus;
    qns::UniqueFd mRead;
    qns::UniqueFd mFullPipe; ///< read end of a pipe that nobody reads
    std::mutex mReadMutex;   ///< held while reading; guards mPending
    std::string mPending;    ///< the beginning of a line
    Lines mOutput;
    std::thread mReader;
};
