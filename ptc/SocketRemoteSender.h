// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <mutex>

#include "base/UniqueFd.h"
#include "ptc/EventPacket.h"
#include "ptc/RemoteSender.h"

/**
 * Sends events to a process of this machine, one packet each. Any thread may call send().
 *
 * A packet is written whole or not at all: a peer that takes nothing for two seconds is given up,
 * and what is sent to it afterwards is dropped at once. Nothing of this is reported, and there
 * is no reconnect.
 */
class SocketRemoteSender : public PTC::RemoteSender {
public:
    /** `moduleId` is the id of the receiver in the other process. */
    explicit SocketRemoteSender(long moduleId);

    /** Connects to 127.0.0.1, port `identity`. */
    bool initialize(long identity) override;

    /** 0, or the result of the call that failed. */
    int connectServer();

    void send(PTC::Event* event) override;

    /** The connected socket, borrowed, to be watched for the peer's end; -1 before. */
    [[nodiscard]] int socket() const { return clientSocket.get(); }

private:
    qns::UniqueFd clientSocket;
    std::mutex mSendMutex; ///< guards all below and the order of bytes on the socket
    bool mGivenUp = false;
    std::array<char, PTC::kPacketSize> mPacket{}; ///< zero beyond the bytes last used
};
