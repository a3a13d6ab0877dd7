// SPDX-License-Identifier: MIT
#include "ptc/SocketRemoteSender.h"

#include "base/StandardOutput.h"
#include "ptc/Event.h"
#include "ptc/LoopbackSocket.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <memory>
#include <poll.h>
#include <sys/socket.h>

using std::chrono::milliseconds;
using std::chrono::steady_clock;

namespace {

constexpr std::chrono::seconds kConnectLimit{2};
constexpr std::chrono::seconds kSendLimit{2};

/** Waits for `events` until the deadline; what happened, or 0. */
short waitFor(int socket, short events, steady_clock::time_point deadline) {
    for (;;) {
        const auto left = std::chrono::ceil<milliseconds>(deadline - steady_clock::now());
        if (left.count() <= 0)
            return 0;
        pollfd source{socket, events, 0};
        const int result = ::poll(&source, 1, static_cast<int>(left.count()));
        if (result > 0)
            return source.revents;
        if (result < 0 && errno != EINTR)
            return 0;
    }
}

/** connect(2), but not for ever: a server with a full backlog does not answer at all. */
int connectWithin(int socket, const sockaddr_in& address, std::chrono::seconds limit) {
    const auto deadline = steady_clock::now() + limit;
    if (::connect(socket, reinterpret_cast<const sockaddr*>(&address), sizeof(address)) == 0)
        return 0;
    if (errno != EINPROGRESS || !waitFor(socket, POLLOUT, deadline))
        return -1;
    int error = 0;
    socklen_t length = sizeof(error);
    const int result = ::getsockopt(socket, SOL_SOCKET, SO_ERROR, &error, &length);
    return result == 0 && error == 0 ? 0 : -1;
}

bool fits(const PTC::Event& event) {
    return event.size == 0 || (event.data && event.size > 0 && event.size <= PTC::kMaxPayloadSize);
}

PTC::EventPacket headerOf(const PTC::Event& event, long receiverId) {
    PTC::EventPacket header{};
    header.receiverId = receiverId;
    header.objectId = event.objectId;
    header.methodId = event.methodId;
    header.data = event.data;
    header.isCallback = event.isCallback ? 1 : 0;
    header.size = event.size;
    header.isRemote = event.isRemote ? 1 : 0;
    return header;
}

} // namespace

SocketRemoteSender::SocketRemoteSender(long moduleId) : RemoteSender(moduleId) {}

SocketRemoteSender::~SocketRemoteSender() {
    // Closing with unread bytes resets the connection, and the peer could lose the last packet.
    if (clientSocket)
        drainAcknowledgements();
}

bool SocketRemoteSender::initialize(long identity) {
    RemoteSender::initialize(identity);
    return connectServer() == 0;
}

int SocketRemoteSender::connectServer() {
    qns::UniqueFd connecting(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
    const int socket = connecting.get();
    if (!connecting) {
        qns::printLine("[Error]Socket Server create failed!");
        return -1;
    }
    if (const int result = PTC::setSocketOption(socket, SOL_SOCKET, SO_REUSEADDR, 1)) {
        qns::printLine("[Error]Socket client reuse address failed!");
        return result;
    }
    // The text names the other buffer; whoever reads these lines knows it so.
    if (const int result =
            PTC::setSocketOption(socket, SOL_SOCKET, SO_RCVBUF, PTC::kReceiveBufferSize)) {
        qns::printLine("[Error]Socket client set send buffer failed!");
        return result;
    }
    PTC::disableDelay(socket);
    if (const int result =
            connectWithin(socket, PTC::loopbackAddress(getIdentity()), kConnectLimit))
        return result;
    clientSocket = std::move(connecting);
    return 0;
}

void SocketRemoteSender::send(PTC::Event* event) {
    const std::unique_ptr<PTC::Event> owned(event);
    if (!event || !fits(*event) || mGivenUp)
        return;
    const std::lock_guard<std::mutex> lock(mSendMutex);
    if (mGivenUp || !clientSocket)
        return;
    fillPacket(*event);
    drainAcknowledgements();
    if (!writePacket())
        giveUp();
}

void SocketRemoteSender::fillPacket(const PTC::Event& event) {
    const PTC::EventPacket header = headerOf(event, getId());
    const std::size_t used = sizeof(header) + static_cast<std::size_t>(event.size);
    std::memcpy(mPacket.data(), &header, sizeof(header));
    std::copy_n(event.data, event.size, mPacket.data() + sizeof(header));
    if (used < mUsed)
        std::fill(mPacket.data() + used, mPacket.data() + mUsed, '\0');
    mUsed = used;
}

/** False when the peer will send no more. Takes what is there, and never waits. */
bool SocketRemoteSender::drainAcknowledgements() {
    // Bounded by what the socket can hold: a peer that floods us must not keep us here.
    constexpr int kMostReads = 64;
    char discarded[4096];
    for (int reads = 0; reads < kMostReads; ++reads) {
        const auto received =
            ::recv(clientSocket.get(), discarded, sizeof(discarded), MSG_DONTWAIT);
        if (received == 0)
            return false;
        if (received < 0 && errno != EINTR)
            return true;
        if (received > 0 && static_cast<std::size_t>(received) < sizeof(discarded))
            return true;
    }
    return true;
}

bool SocketRemoteSender::writePacket() {
    const auto deadline = steady_clock::now() + kSendLimit;
    short awaited = POLLIN | POLLOUT;
    for (std::size_t sent = 0; sent < mPacket.size();) {
        const auto written =
            ::send(clientSocket.get(), mPacket.data() + sent, mPacket.size() - sent, MSG_NOSIGNAL);
        if (written > 0) {
            sent += static_cast<std::size_t>(written);
            continue;
        }
        if (written == 0 || (errno != EAGAIN && errno != EINTR))
            return false;
        const short happened = waitFor(clientSocket.get(), awaited, deadline);
        if (happened == 0)
            return false;
        // A peer that waits for room for its acknowledgements reads nothing either.
        if ((happened & POLLIN) && !drainAcknowledgements())
            awaited = POLLOUT;
    }
    return true;
}

bool SocketRemoteSender::hasEnded() const {
    pollfd watched{clientSocket.get(), POLLRDHUP, 0};
    return ::poll(&watched, 1, 0) > 0;
}

void SocketRemoteSender::giveUp() {
    mGivenUp = true;
    ::shutdown(clientSocket.get(), SHUT_RDWR);
}
