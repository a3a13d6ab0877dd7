// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <deque>
#include <functional>
#include <vector>

#include "bench/ChildProcess.h"
#include "bench/rpc/FloorServer.h"
#include "bench/rpc/RpcClient.h"

namespace bench {

/** A server of bare sockets in a process of its own, and the clients that call it. */
class FloorPeer {
public:
    using Serve =
        std::function<void(uint16_t servicePort, const std::vector<uint16_t>& clientPorts)>;

    /** The clients listen at `firstClientPort` and the following ports. */
    FloorPeer(uint16_t servicePort, uint16_t firstClientPort, int clients, const Serve& serve);
    /** One client that gets its packets back. */
    FloorPeer(uint16_t servicePort, uint16_t clientPort, Hop hop);

    [[nodiscard]] bool ready() const { return mReady; }
    [[nodiscard]] RpcClient& client(std::size_t index = 0) { return mClients[index]; }

private:
    ChildProcess mServer;
    std::deque<RpcClient> mClients;
    bool mReady = true;
};

/** Sends every packet back. */
FloorPeer::Serve sendBack(Hop hop);

} // namespace bench
