// SPDX-License-Identifier: MIT
#include "tests/daemon/support/WireClient.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <sys/socket.h>
#include <thread>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

namespace {

using patience::Clock;

sockaddr_in loopback(long port) {
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(static_cast<std::uint16_t>(port));
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    return address;
}

qns::UniqueFd makeSocket() {
    return qns::UniqueFd(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
}

void setOption(int socket, int level, int option, int value) {
    EXPECT_EQ(::setsockopt(socket, level, option, &value, sizeof(value)), 0);
}

bool waitReadable(int socket, Clock::time_point deadline) {
    pollfd poll{socket, POLLIN, 0};
    return ::poll(&poll, 1, patience::pollTimeout(deadline)) == 1;
}

bool tryConnect(int socket) {
    const auto address = loopback(kDaemonPort);
    return ::connect(socket, reinterpret_cast<const sockaddr*>(&address), sizeof(address)) == 0;
}

} // namespace

qns::UniqueFd listenOn(long port) {
    auto socket = makeSocket();
    setOption(socket.get(), SOL_SOCKET, SO_REUSEADDR, 1);
    const auto address = loopback(port);
    if (::bind(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)) != 0 ||
        ::listen(socket.get(), 100) != 0)
        ADD_FAILURE() << "Cannot listen on " << port << ": " << std::strerror(errno);
    return socket;
}

qns::UniqueFd startConnecting(long port) {
    auto socket = qns::UniqueFd(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
    const auto address = loopback(port);
    static_cast<void>(
        ::connect(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)));
    return socket;
}

qns::UniqueFd connectToDaemon(int receiveBuffer) {
    const auto deadline = patience::deadline();
    do {
        auto connection = makeSocket();
        if (receiveBuffer > 0)
            setOption(connection.get(), SOL_SOCKET, SO_RCVBUF, receiveBuffer);
        if (tryConnect(connection.get())) {
            setOption(connection.get(), IPPROTO_TCP, TCP_NODELAY, 1);
            return connection;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    } while (Clock::now() < deadline);
    ADD_FAILURE() << "Nobody listens on the daemon's port: " << std::strerror(errno);
    return {};
}

WireClient::WireClient(long identity) : mIdentity(identity) {
    startListening();
}

void WireClient::stopListening() {
    mListener.reset();
    mIncoming.clear();
}

void WireClient::startListening() {
    mListener = listenOn(mIdentity);
    mConnectionCount = 0;
}

void WireClient::connect(int receiveBuffer) {
    mConnection = connectToDaemon(receiveBuffer);
    mAcknowledged = 0;
}

void WireClient::disconnect() {
    mConnection.reset();
}

void WireClient::sendBytes(std::string_view bytes) {
    const auto end = deadline();
    while (!bytes.empty()) {
        const auto count = sendSome(bytes, std::chrono::milliseconds(100));
        bytes.remove_prefix(count);
        readAcknowledgements(Clock::now());
        if (mMayEnd && mBroken)
            return;
        if (Clock::now() > end) {
            mWaitedInVain = true;
            ADD_FAILURE() << "The daemon takes no more; " << bytes.size() << " bytes are left";
            return;
        }
    }
}

std::size_t WireClient::sendSome(std::string_view bytes, std::chrono::milliseconds wait) {
    std::size_t sent = 0;
    while (sent < bytes.size()) {
        pollfd poll{mConnection.get(), POLLOUT, 0};
        if (::poll(&poll, 1, static_cast<int>(wait.count())) != 1)
            break;
        const auto count = ::send(mConnection.get(), bytes.data() + sent, bytes.size() - sent,
                                  MSG_NOSIGNAL | MSG_DONTWAIT);
        mBroken = count <= 0 && errno != EAGAIN;
        if (mBroken)
            break;
        sent += static_cast<std::size_t>(std::max<ssize_t>(count, 0));
    }
    return sent;
}

bool WireClient::waitForAcknowledgements(std::size_t count) {
    const auto end = deadline();
    while (mAcknowledged < 3 * count && readAcknowledgements(end)) {
    }
    mWaitedInVain = mWaitedInVain || mAcknowledged < 3 * count;
    return mAcknowledged >= 3 * count;
}

bool WireClient::waitForHangUp() {
    const auto end = deadline();
    while (readAcknowledgements(end)) {
    }
    return Clock::now() < end;
}

std::optional<wire::Packet> WireClient::receive() {
    const auto bytes = receiveBytes();
    if (bytes.empty())
        return std::nullopt;
    return wire::fromBytes(bytes);
}

wire::Bytes WireClient::receiveBytes() {
    const auto end = deadline();
    do {
        if (auto packet = takePacket())
            return *std::move(packet);
    } while (waitForInput(end));
    mWaitedInVain = true;
    return {};
}

Clock::time_point WireClient::deadline() const {
    return mWaitedInVain ? Clock::now() : patience::deadline();
}

bool WireClient::readAcknowledgements(Clock::time_point deadline) {
    if (!mConnection || !waitReadable(mConnection.get(), deadline))
        return false;
    std::array<char, 4096> buffer{};
    const auto count = ::recv(mConnection.get(), buffer.data(), buffer.size(), MSG_DONTWAIT);
    if (count <= 0)
        return false;
    for (ssize_t i = 0; i < count; ++i, ++mAcknowledged)
        EXPECT_EQ(buffer[static_cast<std::size_t>(i)], wire::kAcknowledgement[mAcknowledged % 3]);
    return true;
}

bool WireClient::waitForInput(Clock::time_point deadline) {
    std::vector<pollfd> polls{{mListener.get(), POLLIN, 0}};
    for (const auto& incoming : mIncoming)
        polls.push_back({incoming.ended ? -1 : incoming.socket.get(), POLLIN, 0});
    // The daemon does not connect again: when it has hung up, nothing more comes.
    const int timeout = isHungUp() ? 0 : patience::pollTimeout(deadline);
    if (::poll(polls.data(), polls.size(), timeout) <= 0)
        return false;
    std::size_t index = 1;
    for (auto& incoming : mIncoming)
        if (polls[index++].revents != 0)
            readFrom(incoming);
    if (polls[0].revents != 0)
        acceptConnection();
    return true;
}

bool WireClient::isHungUp() const {
    return !mIncoming.empty() &&
           std::all_of(mIncoming.begin(), mIncoming.end(),
                       [](const Incoming& incoming) { return incoming.ended; });
}

std::optional<wire::Bytes> WireClient::takePacket() {
    for (auto& incoming : mIncoming) {
        if (incoming.received.size() < wire::kPacketSize)
            continue;
        auto packet = incoming.received.substr(0, wire::kPacketSize);
        incoming.received.erase(0, wire::kPacketSize);
        return packet;
    }
    return std::nullopt;
}

void WireClient::acceptConnection() {
    qns::UniqueFd socket(::accept4(mListener.get(), nullptr, nullptr, SOCK_CLOEXEC));
    if (!socket)
        return;
    ++mConnectionCount;
    mIncoming.push_back({std::move(socket), {}, false});
}

void WireClient::readFrom(Incoming& incoming) const {
    std::array<char, wire::kPacketSize> buffer{};
    const auto count = ::recv(incoming.socket.get(), buffer.data(), buffer.size(), MSG_DONTWAIT);
    if (count <= 0) {
        incoming.ended = true;
        return;
    }
    incoming.received.append(buffer.data(), static_cast<std::size_t>(count));
    if (mAcknowledges)
        ::send(incoming.socket.get(), wire::kAcknowledgement.data(), wire::kAcknowledgement.size(),
               MSG_NOSIGNAL);
}
