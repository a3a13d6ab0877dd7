// SPDX-License-Identifier: MIT
#include "tests/daemon/support/DaemonTest.h"

void DaemonTest::SetUp() {
    start();
    ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
}

void DaemonTest::TearDown() {
    if (mpDaemon && mpDaemon->isRunning()) {
        EXPECT_EQ(mpDaemon->terminate(), 0) << mpDaemon->output().joined();
    }
}

DaemonOptions DaemonTest::withEngineDouble() {
    DaemonOptions options;
    options.preferLibraries(QNS_ENGINE_DOUBLE_DIR);
    return options;
}

void DaemonTest::start(const DaemonOptions& options) {
    mpDaemon = std::make_unique<DaemonProcess>(options);
}

void ScriptedDaemonTest::SetUp() {
    startScripted();
}

void ScriptedDaemonTest::startScripted(DaemonOptions options) {
    options.environment["QNS_ENGINE_DOUBLE"] = mEngine.address();
    start(options);
    mEngine.expectCall("player create null 15");
    ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
}

void ScriptedDaemonTest::makeReady() {
    mEngine.notify({1, 0, L"/ready", 1, 1, 0, 1, 0, 5});
}

void ScriptedDaemonTest::powerOff(PlayerClient& client) {
    client.request(request::kPowerOffMediaPlayer);
    mEngine.expectCall("player destroy");
}
