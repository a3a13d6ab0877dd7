// SPDX-License-Identifier: MIT
#include "bench/rpc/FloorPeer.h"

namespace bench {

FloorPeer::Serve sendBack(Hop hop) {
    return [hop](uint16_t servicePort, const std::vector<uint16_t>& clientPorts) {
        serveFloor(servicePort, clientPorts, hop);
    };
}

FloorPeer::FloorPeer(uint16_t servicePort, uint16_t firstClientPort, int clients,
                     const Serve& serve) {
    std::vector<uint16_t> ports;
    for (int i = 0; i < clients; ++i)
        ports.push_back(static_cast<uint16_t>(firstClientPort + i));
    mServer = ChildProcess::call([&] { serve(servicePort, ports); });
    for (const uint16_t port : ports)
        mReady = mReady && mClients.emplace_back(servicePort, port).awaitConnectionBack(nullptr);
}

FloorPeer::FloorPeer(uint16_t servicePort, uint16_t clientPort, Hop hop)
    : FloorPeer(servicePort, clientPort, 1, sendBack(hop)) {}

} // namespace bench
