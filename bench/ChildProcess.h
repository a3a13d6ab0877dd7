// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <sys/types.h>
#include <utility>
#include <vector>

namespace bench {

/** A child that ends with this object: SIGTERM, then waited for. */
class ChildProcess {
public:
    ChildProcess() = default;
    /** Runs a function in a forked child. Call while this process has one thread. */
    static ChildProcess call(const std::function<void()>& body);
    /** Runs a program; its standard output goes nowhere, or to `outputFd`. */
    static ChildProcess run(const std::vector<std::string>& command, int outputFd = -1);
    ~ChildProcess();

    ChildProcess(ChildProcess&& other) noexcept : mPid(std::exchange(other.mPid, -1)) {}
    ChildProcess& operator=(ChildProcess&& other) noexcept {
        std::swap(mPid, other.mPid);
        return *this;
    }

    [[nodiscard]] pid_t pid() const { return mPid; }

    /** Until it ends by itself. Its exit status; 128 and the signal's number when one ended it. */
    int waitForEnd();

private:
    explicit ChildProcess(pid_t pid) : mPid(pid) {}

    pid_t mPid = -1;
};

/** What a program that has ended leaves. */
struct Finished {
    int status = 0;     ///< as waitForEnd() tells it
    std::string output; ///< all that it wrote to its standard output
};

Finished runToEnd(const std::vector<std::string>& command);

} // namespace bench
