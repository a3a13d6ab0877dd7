// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include <gmock/gmock.h>

#include "tests/daemon/support/DaemonProcess.h"
#include "tests/daemon/support/PlayerClient.h"
#include "tests/daemon/support/SyslogServer.h"
#include "tests/engine_double/EngineScript.h"

/** A daemon whose engine answers 0 to everything at once, and a log daemon. */
class DaemonTest : public testing::Test {
protected:
    /** Starts the daemon. */
    void SetUp() override;

    /** Ends the daemon if it still runs: it must end with status 0. */
    void TearDown() override;

    /** Options that let the daemon find the quiet or scripted engine. */
    static DaemonOptions withEngineDouble();

    void start(const DaemonOptions& options = withEngineDouble());

    SyslogServer mSyslog;
    std::unique_ptr<DaemonProcess> mpDaemon;
};

/** The same with an engine that reports every call to the test and blocks until it is told. */
class ScriptedDaemonTest : public DaemonTest {
protected:
    void SetUp() override;

    /** Starts the daemon with the scripted engine and lets it create its player. */
    void startScripted(DaemonOptions options = withEngineDouble());

    /** Has the engine report a finished open, so that the player is ready. */
    void makeReady();

    /** Powers the daemon off at this client's request, as far as its last engine call. */
    void powerOff(PlayerClient& client);

    EngineScript mEngine;
};
