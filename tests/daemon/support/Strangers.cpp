// SPDX-License-Identifier: MIT
#include "tests/daemon/support/Strangers.h"

#include <array>
#include <random>
#include <sys/socket.h>
#include <sys/time.h>

#include <gtest/gtest.h>

#include "tests/daemon/support/Life.h"
#include "tests/daemon/support/WireClient.h"

namespace {

/** An id that nobody has. */
constexpr std::int64_t kUnknownClient = 1'000'000;

wire::Bytes randomRequest(std::mt19937& random) {
    const auto& service = kAllServices[random() % 3];
    const auto method = 1 + static_cast<long>(random() % (service.registerCallBack - 1));
    return wire::toBytes({8, service.object, method, false, true, wire::integer(kUnknownClient)});
}

/** A daemon that takes nothing any more must not keep the test. */
void boundWaiting(int socket) {
    const timeval limit{patience::stretched(std::chrono::seconds(20)).count() / 1000, 0};
    ::setsockopt(socket, SOL_SOCKET, SO_SNDTIMEO, &limit, sizeof(limit));
    ::setsockopt(socket, SOL_SOCKET, SO_RCVTIMEO, &limit, sizeof(limit));
}

bool send(int socket, const wire::Bytes& packet) {
    const auto sent = ::send(socket, packet.data(), packet.size(), MSG_NOSIGNAL);
    return sent == static_cast<ssize_t>(packet.size());
}

} // namespace

Strangers::Strangers(std::size_t count, std::size_t requests) {
    while (mSockets.size() < count)
        connect();
    mThread = std::thread(&Strangers::work, this, requests);
}

Strangers::~Strangers() {
    mThread.join();
}

/** Acknowledged means accepted: the daemon's backlog is shorter than strangers may be many. */
void Strangers::connect() {
    mSockets.push_back(connectToDaemon());
    const int socket = mSockets.back().get();
    boundWaiting(socket);
    EXPECT_TRUE(send(socket, wire::toBytes({9, 62, 1, false, true, "x"})));
    std::array<char, wire::kAcknowledgement.size()> answer{};
    EXPECT_EQ(::recv(socket, answer.data(), answer.size(), MSG_WAITALL), answer.size());
}

void Strangers::work(std::size_t requests) {
    std::mt19937 random(1);
    std::array<char, 4096> acknowledgements{};
    for (std::size_t i = 0; i < requests; ++i)
        for (const auto& socket : mSockets) {
            if (!send(socket.get(), randomRequest(random)))
                return ADD_FAILURE() << "The daemon takes no more of a stranger.";
            ::recv(socket.get(), acknowledgements.data(), acknowledgements.size(), MSG_DONTWAIT);
        }
}
