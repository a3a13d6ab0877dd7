// SPDX-License-Identifier: MIT
#include "tests/engine/CpuWait.h"

#include <algorithm>
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

Seconds waitOfProcess() {
    Seconds sum{};
    for (const auto& thread : std::filesystem::directory_iterator("/proc/self/task"))
        sum += waitOfThread(thread.path());
    return sum;
}

} // namespace

CpuWait::CpuWait() : mBefore(waitOfProcess()) {}

Seconds CpuWait::elapsed() const {
    return std::max(Seconds{}, waitOfProcess() - mBefore);
}
