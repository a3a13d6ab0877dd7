// SPDX-License-Identifier: MIT
#pragma once

#include "base/UniqueFd.h"
#include "ptc/EventPacket.h"
#include "ptc/RemoteSender.h"

#include <array>
#include <atomic>
#include <cstddef>
#include <mutex>

/**
 * Sends events to a process of this machine, one packet each. Any thread may call send().
 *
 * Packets never mix. A peer that has not taken one within two seconds is given up: its
 * connection ends there, and what is sent afterwards is dropped at once. Nothing of this is
 * reported, and there is no reconnect.
 */
class SocketRemoteSender : public PTC::RemoteSender {
public:
    /** `moduleId` is the id of the receiver in the other process. */
    explicit SocketRemoteSender(long moduleId);
    ~SocketRemoteSender() override;

    /** Connects to 127.0.0.1, port `identity`, within two seconds. */
    bool initialize(long identity) override;

    /** 0, or the result of the call that failed. */
    int connectServer();

    void send(PTC::Event* event) override;

    /** Whether the peer has closed its end, or was given up. Does not wait. */
    [[nodiscard]] bool hasEnded() const;

    /** From now on all is dropped. Does not wait; interrupts a thread that sends. */
    void giveUp();

    /** The connected socket, borrowed, to be watched for the peer's end; -1 before. */
    [[nodiscard]] int socket() const { return clientSocket.get(); }

private:
    void fillPacket(const PTC::Event& event);
    bool drainAcknowledgements();
    [[nodiscard]] bool writePacket();

    qns::UniqueFd clientSocket;
    std::atomic<bool> mGivenUp{false}; ///< read before locking: nobody queues up for a lost peer
    std::mutex mSendMutex;             ///< guards all below and the order of bytes on the socket
    std::size_t mUsed = 0;             ///< length of the header and payload that `mPacket` holds
    std::array<char, PTC::kPacketSize> mPacket{}; ///< zero beyond the bytes in use
};
