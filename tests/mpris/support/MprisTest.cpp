// SPDX-License-Identifier: MIT
#include "tests/mpris/support/MprisTest.h"

#include <csignal>

void MprisTest::SetUp() {
    ASSERT_NO_FATAL_FAILURE(ToolTest::SetUp());
    startBridge();
}

void MprisTest::TearDown() {
    if (mBridge)
        endBridge();
    ToolTest::TearDown();
}

void MprisTest::startBridge(const std::vector<std::string>& arguments) {
    mBridge.emplace(QNS_MPRIS, withIdentity(arguments), Tool::Output::pipe);
    ASSERT_TRUE(mDesktop.waitForName(true)) << mBridge->errors();
}

void MprisTest::endBridge() {
    mBridge->signal(SIGTERM);
    EXPECT_EQ(mBridge->waitForExit(), 128 + SIGTERM) << mBridge->errors();
    mBridge.reset();
}

std::string MprisTest::playerctl(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), {"--player", "qnsmedia"});
    Tool tool(QNS_PLAYERCTL, arguments, Tool::Output::pipe);
    EXPECT_EQ(tool.waitForExit(), 0) << tool.errors();
    const std::string& output = tool.output();
    return output.substr(0, output.find_last_not_of('\n') + 1);
}

void MprisTest::play(const std::string& path) {
    mDesktop.call("OpenUri", path);
    EXPECT_TRUE(mDesktop.waitForChange<std::string>("PlaybackStatus", "Playing"));
}
