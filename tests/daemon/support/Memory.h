// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <string>

#include <gtest/gtest.h>

#include "tests/daemon/support/DaemonProcess.h"

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
inline constexpr bool kMemoryTells = false; // what is freed is kept for a while, to be looked at
#else
inline constexpr bool kMemoryTells = true;
#endif

/** Bytes that the daemon uses more than before; told in the test's report. */
inline long memoryGrownSince(const DaemonProcess& daemon, std::size_t before) {
    const auto grown = static_cast<long>(daemon.residentBytes() - before);
    testing::Test::RecordProperty("grown", std::to_string(grown));
    return kMemoryTells ? grown : 0;
}
