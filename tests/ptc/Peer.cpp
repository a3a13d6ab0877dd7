// SPDX-License-Identifier: MIT
#include "tests/ptc/Peer.h"

#include "ptc/LoopbackSocket.h"
#include "tests/ptc/Gate.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <poll.h>
#include <sys/socket.h>

namespace {

bool waitUntilReady(int socket, short events) {
    const auto patience = std::chrono::milliseconds(kPatience);
    pollfd source{socket, events, 0};
    return ::poll(&source, 1, static_cast<int>(patience.count())) == 1;
}

} // namespace

std::string packetBytes(long receiverId, long methodId, std::string_view payload) {
    return packetBytes(receiverId, methodId, payload, static_cast<long>(payload.size()));
}

std::string packetBytes(long receiverId, long methodId, std::string_view payload, long size) {
    PTC::EventPacket header{};
    header.receiverId = receiverId;
    header.objectId = 62;
    header.methodId = methodId;
    header.size = size;
    header.isRemote = 1;
    std::string bytes(PTC::kPacketSize, '\0');
    std::memcpy(bytes.data(), &header, sizeof(header));
    payload.copy(bytes.data() + sizeof(header), bytes.size() - sizeof(header));
    return bytes;
}

Peer::Peer() : mSocket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)) {}

bool Peer::connectTo(int port) {
    const auto address = PTC::loopbackAddress(port);
    return ::connect(socket(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)) == 0;
}

bool Peer::write(std::string_view bytes) {
    while (!bytes.empty()) {
        if (!waitUntilReady(socket(), POLLOUT))
            return false;
        const auto sent = ::send(socket(), bytes.data(), bytes.size(), MSG_NOSIGNAL | MSG_DONTWAIT);
        if (sent < 0 && errno != EAGAIN && errno != EINTR)
            return false;
        bytes.remove_prefix(static_cast<std::size_t>(std::max<ssize_t>(sent, 0)));
    }
    return true;
}

void Peer::endWriting() {
    ::shutdown(socket(), SHUT_WR);
}

std::string Peer::read(std::size_t length) {
    std::string bytes(length, '\0');
    std::size_t got = 0;
    while (got < length && waitUntilReady(socket(), POLLIN)) {
        const auto received = ::recv(socket(), bytes.data() + got, length - got, 0);
        if (received <= 0)
            break;
        got += static_cast<std::size_t>(received);
    }
    bytes.resize(got);
    return bytes;
}

std::string Peer::readAll() {
    std::string all;
    for (std::string bytes = read(1); !bytes.empty(); bytes = read(1))
        all += bytes;
    return all;
}

bool Peer::isAcknowledged() {
    return read(3) == std::string("OK\0", 3);
}

bool Peer::writeAcknowledged(std::string_view bytes) {
    return write(bytes) && isAcknowledged();
}

bool Peer::isClosedByOther() {
    char byte;
    return waitUntilReady(socket(), POLLIN) && ::recv(socket(), &byte, 1, 0) <= 0;
}

BareServer::BareServer(int port, int backlog, int receiveBuffer)
    : mSocket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
    PTC::setSocketOption(mSocket.get(), SOL_SOCKET, SO_REUSEADDR, 1);
    if (receiveBuffer != 0)
        PTC::setSocketOption(mSocket.get(), SOL_SOCKET, SO_RCVBUF, receiveBuffer);
    const auto address = PTC::loopbackAddress(port);
    EXPECT_EQ(::bind(mSocket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)),
              0);
    EXPECT_EQ(::listen(mSocket.get(), backlog), 0);
}

Peer BareServer::accept() {
    EXPECT_TRUE(waitUntilReady(mSocket.get(), POLLIN));
    return Peer(::accept4(mSocket.get(), nullptr, nullptr, SOCK_CLOEXEC));
}

Peer connectedPeer(int port) {
    Peer peer;
    EXPECT_TRUE(peer.connectTo(port));
    return peer;
}
