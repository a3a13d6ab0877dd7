// SPDX-License-Identifier: MIT
#include "tests/daemon/support/LivesTest.h"

namespace {

class ManyTools : public LivesTest {};

TEST_F(ManyTools, InARowWithOneIdentityAllWorkAndLeaveNothingBehind) {
    // Half a second each: the daemon pauses after it has accepted a connection.
    constexpr int kWarmUp = kMemoryTells ? 100 : 10;
    constexpr int kCalls = kMemoryTells ? 1000 : 100;
    const auto call = [](int number) {
        if (number % 2 == 0)
            expectSuccess({"--identity", "1000", "status"});
        else
            expectSuccess({"--identity", "1000", "info", sample::shortSound()});
    };
    for (int number = 0; number < kWarmUp; ++number)
        call(number);
    const auto descriptors = mpDaemon->descriptorCount();
    const auto threads = mpDaemon->threadCount();
    const auto memory = mpDaemon->residentBytes();
    for (int number = 0; number < kCalls; ++number)
        call(number);
    EXPECT_TRUE(mpDaemon->waitForResources(descriptors, threads))
        << mpDaemon->descriptorCount() << " descriptors, " << mpDaemon->threadCount() << " threads";
    EXPECT_LT(memoryGrownSince(*mpDaemon, memory), 500 * kCalls);
}

} // namespace
