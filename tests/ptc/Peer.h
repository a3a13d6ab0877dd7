// SPDX-License-Identifier: MIT
#pragma once

#include "base/UniqueFd.h"
#include "ptc/EventPacket.h"

#include <cstddef>
#include <string>
#include <string_view>

/** The bytes of one packet, as a peer writes them. */
std::string packetBytes(long receiverId, long methodId, std::string_view payload);
/** The same with another size field; the payload stands there all the same. */
std::string packetBytes(long receiverId, long methodId, std::string_view payload, long size);

/** A bare end of a connection. Nothing waits for longer than the patience of a test. */
class Peer {
public:
    Peer();
    explicit Peer(int socket) : mSocket(socket) {}

    [[nodiscard]] bool connectTo(int port);
    [[nodiscard]] int socket() const { return mSocket.get(); }

    bool write(std::string_view bytes);
    void endWriting();

    /** Up to `length` bytes; fewer when the connection ends before. */
    [[nodiscard]] std::string read(std::size_t length);
    /** Everything up to the end of the connection. */
    [[nodiscard]] std::string readAll();

    /** True when the next three bytes are an acknowledgement. */
    [[nodiscard]] bool isAcknowledged();
    /** Writes, and waits for one acknowledgement. */
    [[nodiscard]] bool writeAcknowledged(std::string_view bytes);
    [[nodiscard]] bool isClosedByOther();

private:
    qns::UniqueFd mSocket;
};

/** A bare listening socket on 127.0.0.1. */
class BareServer {
public:
    /** `receiveBuffer` in bytes; 0: the system's choice. */
    explicit BareServer(int port, int backlog = 10, int receiveBuffer = 0);

    [[nodiscard]] Peer accept();

private:
    qns::UniqueFd mSocket;
};

/** A connected peer at `port`. The test fails when there is none. */
Peer connectedPeer(int port);
