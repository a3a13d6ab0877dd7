// SPDX-License-Identifier: MIT
#include "platform/qnsys/src/SystemLogSocket.h"

#include <cerrno>
#include <cstddef>
#include <sys/socket.h>
#include <sys/un.h>

namespace qnsys {
namespace {

constexpr sockaddr_un kLogDaemon{AF_UNIX, "/dev/log"};

bool isBusy(int error) {
    return error == EAGAIN || error == EWOULDBLOCK || error == ENOBUFS;
}

} // namespace

/** Returns 0 or the error. */
int SystemLogSocket::connectAs(int type) {
    qns::UniqueFd socket(::socket(AF_UNIX, type | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
    if (!socket || ::connect(socket.get(), reinterpret_cast<const sockaddr*>(&kLogDaemon),
                             sizeof kLogDaemon) != 0)
        return errno;
    mSocket = std::move(socket);
    mIsStream = type == SOCK_STREAM;
    return 0;
}

bool SystemLogSocket::connect() {
    const int error = connectAs(SOCK_DGRAM);
    return error == 0 || (error == EPROTOTYPE && connectAs(SOCK_STREAM) == 0);
}

SystemLogSocket::Outcome SystemLogSocket::trySend(const std::string& line) {
    const std::size_t size = line.size() + (mIsStream ? 1 : 0);
    ssize_t sent;
    do
        sent = ::send(mSocket.get(), line.c_str(), size, MSG_NOSIGNAL | MSG_DONTWAIT);
    while (sent < 0 && errno == EINTR);
    if (sent < 0)
        return isBusy(errno) ? Outcome::busy : Outcome::failed;
    if (static_cast<std::size_t>(sent) == size)
        return Outcome::taken;
    mSocket.reset(); // a stream took a part: the next line must not continue it
    return Outcome::busy;
}

bool SystemLogSocket::send(const std::string& line) {
    if (mSocket) {
        const Outcome outcome = trySend(line);
        if (outcome != Outcome::failed)
            return outcome == Outcome::taken;
        mSocket.reset(); // the log daemon was restarted, and its old socket is gone
    }
    return connect() && trySend(line) == Outcome::taken;
}

} // namespace qnsys
