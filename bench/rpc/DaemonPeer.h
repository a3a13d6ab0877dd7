// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>

#include "bench/ChildProcess.h"
#include "bench/rpc/RpcClient.h"

namespace bench {

/**
 * The daemon with an engine whose status() tells the time of its own call, and one registered
 * client.
 */
class DaemonPeer {
public:
    DaemonPeer();

    [[nodiscard]] bool ready() const { return mClientId > 0; }
    [[nodiscard]] RpcClient& client() { return mClient; }

    /** Asks for the player's status. */
    [[nodiscard]] const Packet& statusRequest() const { return mStatusRequest; }

    /**
     * Opens a file, so that from then on status requests go on to the main thread and the
     * engine; before, the worker answers them.
     */
    bool openFile();

    /** When the engine was called for this status reply, in CLOCK_MONOTONIC nanoseconds. */
    static int64_t engineCallTime(const Packet& reply);

private:
    ChildProcess mDaemon;
    RpcClient mClient;
    int mClientId = 0;
    Packet mStatusRequest{};
};

/** Folder of this program, which is also the daemon's. */
std::string programFolder();

} // namespace bench
