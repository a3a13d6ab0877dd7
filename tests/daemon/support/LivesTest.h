// SPDX-License-Identifier: MIT
#pragma once

#include <csignal>
#include <string>
#include <utility>
#include <vector>

#include "tests/cli/support/Tool.h"
#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/Memory.h"
#include "tests/daemon/support/SampleMedia.h"
#include "tests/support/TestFolder.h"

/** A daemon that serves clients that restart, with the engine that plays. */
class LivesTest : public DaemonTest {
protected:
    void SetUp() override {
        DaemonOptions options;
        options.arguments = {"--reconnect-clients"};
        options.environment["QNS_HV_DATA"] = mFolder.path("data");
        start(options);
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
    }

    /** A client process asks for something, and is killed as soon as it has. */
    void killInTheMiddleOf(const std::string& task, const std::string& file,
                           const std::string& target) {
        Tool victim(QNS_TEST_CLIENT, {"1000", task, file, target}, Tool::Output::pipe);
        EXPECT_TRUE(victim.waitFor("asked")) << victim.errors();
        victim.signal(SIGKILL);
        EXPECT_EQ(victim.waitForExit(), 128 + SIGKILL);
    }

    /** Calls the tool. */
    static void expectSuccess(std::vector<std::string> arguments) {
        Tool tool(std::move(arguments));
        EXPECT_EQ(tool.waitForExit(), 0) << tool.errors();
    }

    TestFolder mFolder;
};
