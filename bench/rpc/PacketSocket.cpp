// SPDX-License-Identifier: MIT
#include "bench/rpc/PacketSocket.h"

#include <arpa/inet.h>
#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <net/if.h>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <sched.h>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <thread>

namespace bench {
namespace {

sockaddr_in loopback(uint16_t port) {
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    address.sin_port = htons(port);
    return address;
}

qns::UniqueFd makeSocket() {
    qns::UniqueFd fd(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
    const int one = 1;
    const int receiveBuffer = 122880;
    ::setsockopt(fd.get(), SOL_SOCKET, SO_REUSEADDR, &one, sizeof one);
    ::setsockopt(fd.get(), SOL_SOCKET, SO_RCVBUF, &receiveBuffer, sizeof receiveBuffer);
    return fd;
}

void disableNagle(int socket) {
    const int one = 1;
    ::setsockopt(socket, IPPROTO_TCP, TCP_NODELAY, &one, sizeof one);
}

bool enterOwnNetwork() {
    if (::unshare(CLONE_NEWNET) != 0)
        return false;
    const qns::UniqueFd fd(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0));
    ifreq request{};
    std::strncpy(request.ifr_name, "lo", sizeof request.ifr_name - 1);
    if (::ioctl(fd.get(), SIOCGIFFLAGS, &request) != 0)
        return false;
    request.ifr_flags |= IFF_UP;
    return ::ioctl(fd.get(), SIOCSIFFLAGS, &request) == 0;
}

} // namespace

qns::UniqueFd listenOn(uint16_t port) {
    qns::UniqueFd fd = makeSocket();
    const sockaddr_in address = loopback(port);
    if (::bind(fd.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0 ||
        ::listen(fd.get(), 10) != 0)
        return {};
    return fd;
}

qns::UniqueFd acceptOne(int listener) {
    qns::UniqueFd fd(::accept4(listener, nullptr, nullptr, SOCK_CLOEXEC));
    if (fd)
        disableNagle(fd.get());
    return fd;
}

qns::UniqueFd connectTo(uint16_t port) {
    const sockaddr_in address = loopback(port);
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(10);
    while (std::chrono::steady_clock::now() < deadline) {
        qns::UniqueFd fd = makeSocket();
        if (::connect(fd.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0) {
            disableNagle(fd.get());
            return fd;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    return {};
}

bool readPacket(int socket, Packet& packet) {
    std::size_t got = 0;
    while (got < packet.size()) {
        const ssize_t count = ::recv(socket, packet.data() + got, packet.size() - got, 0);
        if (count <= 0)
            return false;
        got += static_cast<std::size_t>(count);
        if (::send(socket, PTC::kAcknowledgement, sizeof PTC::kAcknowledgement, MSG_NOSIGNAL) < 0)
            return false;
    }
    return true;
}

bool writePacket(int socket, const Packet& packet) {
    char acknowledgements[64];
    ::recv(socket, acknowledgements, sizeof acknowledgements, MSG_DONTWAIT);
    std::size_t sent = 0;
    while (sent < packet.size()) {
        const ssize_t count =
            ::send(socket, packet.data() + sent, packet.size() - sent, MSG_NOSIGNAL);
        if (count <= 0)
            return false;
        sent += static_cast<std::size_t>(count);
    }
    return true;
}

void isolateNetwork() {
    if (!enterOwnNetwork())
        std::fputs("qnsmedia-bench: no network of its own; using the machine's ports\n", stderr);
}

} // namespace bench
