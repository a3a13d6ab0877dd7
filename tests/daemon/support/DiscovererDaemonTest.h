// SPDX-License-Identifier: MIT
#pragma once

#include <set>
#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/DiscovererClient.h"

/** A daemon whose discoverers report every call to the test and block until they are told. */
class DiscovererDaemonTest : public DaemonTest {
protected:
    /** Starts the daemon. */
    void SetUp() override;

    /** Starts the daemon; the engine does not make the discoverers with these numbers. */
    void startDiscoverers(const std::set<int>& refused = {});

    EngineScript mDiscoverers;
};

/** The same with a client, which has the first discoverer. */
class DiscovererClientTest : public DiscovererDaemonTest {
protected:
    void SetUp() override;

    /** Opens a file for the client. */
    void open(const std::string& file);

    /** All that the service has written to the system log, without what all lines begin with. */
    void expectServiceLog(const std::vector<std::string>& events);

    /** The controller has written this line. */
    void expectEngineFailure(const std::string& event);

    static constexpr long kObject = 100;

    DiscovererClient mClient{1000};
    std::int32_t mId = -1;
};
