// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

#include "base/UniqueFd.h"
#include "bench/rpc/PacketSocket.h"

namespace bench {

/** The client's end of a packet conversation: one socket for requests, one for replies. */
class RpcClient {
public:
    /** Listens on `ownPort` and connects to `servicePort`. */
    RpcClient(uint16_t servicePort, uint16_t ownPort);

    /** Sends `first`, which makes the service connect back, and waits until it has. */
    bool awaitConnectionBack(const Packet* first);

    bool send(const Packet& request);
    bool receive(Packet& reply);

    /**
     * Sends `count` requests while replies are read, up to `inFlight` of them unanswered;
     * requests a second.
     */
    double pipeline(const Packet& request, int count, int inFlight);

private:
    qns::UniqueFd mListener;
    qns::UniqueFd mRequests;
    qns::UniqueFd mReplies;
};

} // namespace bench
