// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>

/** How many descriptors and threads this process has. */
[[nodiscard]] std::size_t descriptorCount();
[[nodiscard]] std::size_t threadCount();

/** Runs a signal handler, one that interrupts system calls, on every other thread. */
void interruptOtherThreads();

/** Lets the process open no more than `count` further descriptors, until the end of the scope. */
class DescriptorLimit {
public:
    explicit DescriptorLimit(int count);
    ~DescriptorLimit();
    DescriptorLimit(const DescriptorLimit&) = delete;
    DescriptorLimit& operator=(const DescriptorLimit&) = delete;

private:
    unsigned long mBefore;
};
