// SPDX-License-Identifier: MIT
#include "tests/mpris/support/BusProcess.h"

#include <csignal>
#include <cstdlib>

#include <gtest/gtest.h>

BusProcess::BusProcess()
    : mProcess(QNS_DBUS_DAEMON,
               {"--session", "--nofork", "--print-address=1",
                "--address=unix:path=" + mFolder.path("session-bus")},
               Tool::Output::pipe) {
    EXPECT_TRUE(mProcess.waitFor("\n"));
    const std::string& output = mProcess.output();
    ::setenv("DBUS_SESSION_BUS_ADDRESS", output.substr(0, output.find('\n')).c_str(), 1);
    ::setenv("XDG_RUNTIME_DIR", mFolder.path("").c_str(), 1);
}

BusProcess::~BusProcess() {
    ::unsetenv("DBUS_SESSION_BUS_ADDRESS");
    ::unsetenv("XDG_RUNTIME_DIR");
}

void BusProcess::kill() {
    mProcess.signal(SIGKILL);
    mProcess.waitForExit();
}
