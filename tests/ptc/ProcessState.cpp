// SPDX-License-Identifier: MIT
#include "tests/ptc/ProcessState.h"

#include <csignal>
#include <fcntl.h>
#include <filesystem>
#include <iterator>
#include <string>
#include <sys/resource.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace {

std::size_t entriesOf(const char* folder) {
    using Iterator = std::filesystem::directory_iterator;
    return static_cast<std::size_t>(std::distance(Iterator(folder), Iterator()));
}

void doNothing(int) {}

void setDescriptorLimit(unsigned long limit) {
    rlimit limits{};
    getrlimit(RLIMIT_NOFILE, &limits);
    limits.rlim_cur = limit;
    setrlimit(RLIMIT_NOFILE, &limits);
}

} // namespace

std::size_t descriptorCount() {
    return entriesOf("/proc/self/fd");
}

std::size_t threadCount() {
    return entriesOf("/proc/self/task");
}

void interruptOtherThreads() {
    struct sigaction action {};
    action.sa_handler = doNothing; // without SA_RESTART
    sigaction(SIGUSR1, &action, nullptr);
    const auto self = static_cast<pid_t>(syscall(SYS_gettid));
    for (const auto& task : std::filesystem::directory_iterator("/proc/self/task")) {
        const auto thread = static_cast<pid_t>(std::stol(task.path().filename()));
        if (thread != self)
            syscall(SYS_tgkill, getpid(), thread, SIGUSR1);
    }
}

DescriptorLimit::DescriptorLimit(int count) {
    rlimit limits{};
    getrlimit(RLIMIT_NOFILE, &limits);
    mBefore = limits.rlim_cur;
    const int lowestFree = fcntl(STDIN_FILENO, F_DUPFD, 0);
    close(lowestFree);
    setDescriptorLimit(static_cast<unsigned long>(lowestFree + count));
}

DescriptorLimit::~DescriptorLimit() {
    setDescriptorLimit(mBefore);
}
