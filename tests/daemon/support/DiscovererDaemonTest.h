// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <set>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/DiscovererClient.h"

/** A daemon whose discoverers report every call to the test and block until they are told. */
class DiscovererDaemonTest : public DaemonTest {
protected:
    void SetUp() override;

    /** Starts the daemon; the engine does not make the discoverers with these numbers. */
    void startDiscoverers(const std::set<int>& refused = {},
                          DaemonOptions options = withEngineDouble());

    /** One for each client that can be served, and the importer's. */
    static constexpr int kDiscoverers = 11;

    EngineScript mDiscoverers;
};
