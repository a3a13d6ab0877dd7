// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <utility>
#include <vector>

#include <gmock/gmock.h>

#include "tests/cli/support/Tool.h"
#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/SampleMedia.h"

/** The tool against the daemon with the engine that plays, as the service unit starts it. */
class ToolTest : public DaemonTest {
protected:
    void SetUp() override {
        DaemonOptions options;
        options.arguments = {"--reconnect-clients"};
        start(options);
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
    }

    /** Puts an identity before the arguments that no tool of the test had before. */
    std::vector<std::string> withIdentity(std::vector<std::string> arguments) {
        arguments.insert(arguments.begin(), {"--identity", std::to_string(mNextIdentity++)});
        return arguments;
    }

    /**
     * The daemon has closed the medium. A notification that was on its way makes the daemon ask
     * the engine, which says the same in another word.
     */
    void expectClosed() {
        Tool status(withIdentity({"status"}));
        EXPECT_EQ(status.waitForExit(), 0) << status.errors();
        EXPECT_THAT(status.output(), testing::AnyOf(testing::StartsWith("not ready"),
                                                    testing::StartsWith("closed")));
    }

private:
    int mNextIdentity = 1000;
};
