// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "tests/cli/support/ToolTest.h"
#include "tests/mpris/support/BusClient.h"
#include "tests/mpris/support/BusProcess.h"

/** The daemon with the engine that plays, its player on a bus, and a desktop there. */
class MprisTest : public ToolTest {
protected:
    /** Starts daemon and bridge. */
    void SetUp() override;

    /** Ends the bridge if it still runs, and then the daemon. */
    void TearDown() override;

    void startBridge(const std::vector<std::string>& arguments = {});

    /** Ends it with a signal. */
    void endBridge();

    /** Runs it for the player on the bus; returns its output without the last line's end. */
    static std::string playerctl(std::vector<std::string> arguments);

    /** Opens a file, and waits until it plays. */
    void play(const std::string& path);

    BusProcess mBus;
    BusClient mDesktop;
    std::optional<Tool> mBridge;
};
