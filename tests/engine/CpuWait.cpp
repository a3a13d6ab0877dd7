// SPDX-License-Identifier: MIT
#include "tests/engine/CpuWait.h"

#include <filesystem>
#include <fstream>

namespace {

/** A thread's second number in schedstat; a kernel without it, or a thread that ends, says none. */
Seconds waitOfThread(const std::filesystem::path& folder) {
    std::ifstream file(folder / "schedstat");
    long running = 0;
    long waiting = 0;
    file >> running >> waiting;
    return std::chrono::nanoseconds(waiting);
}

std::map<std::string, Seconds> waitOfThreads() {
    std::map<std::string, Seconds> waits;
    for (const auto& thread : std::filesystem::directory_iterator("/proc/self/task"))
        waits[thread.path().filename()] = waitOfThread(thread.path());
    return waits;
}

} // namespace

CpuWait::CpuWait() : mBefore(waitOfThreads()) {}

Seconds CpuWait::elapsed() const {
    Seconds sum{};
    for (const auto& [thread, wait] : waitOfThreads()) {
        const auto before = mBefore.find(thread);
        sum += before == mBefore.end() ? wait : wait - before->second;
    }
    return sum;
}
