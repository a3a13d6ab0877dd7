// SPDX-License-Identifier: MIT
#include "tests/daemon/support/DiscovererDaemonTest.h"

void DiscovererDaemonTest::SetUp() {
    startDiscoverers();
}

void DiscovererDaemonTest::startDiscoverers(const std::set<int>& refused, DaemonOptions options) {
    options.environment["QNS_DISCOVERER_DOUBLE"] = mDiscoverers.address();
    start(options);
    for (int number = 0; number < kDiscoverers; ++number)
        mDiscoverers.expectCall("discoverer " + std::to_string(number) + " create",
                                refused.count(number) != 0 ? "null" : "return 0");
    ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
}
