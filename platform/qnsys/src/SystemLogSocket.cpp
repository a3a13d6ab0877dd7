// SPDX-License-Identifier: MIT
#include "platform/qnsys/src/SystemLogSocket.h"

#include <cerrno>
#include <cstring>
#include <sys/socket.h>
#include <sys/un.h>
#include <syslog.h>

#ifndef _PATH_LOG
#define _PATH_LOG "/dev/log"
#endif

namespace qnsys {

bool SystemLogSocket::connect() {
    qns::UniqueFd socket(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::strncpy(address.sun_path, _PATH_LOG, sizeof address.sun_path - 1);
    if (!socket ||
        ::connect(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0)
        return false;
    mSocket = std::move(socket);
    return true;
}

bool SystemLogSocket::trySend(std::string_view line) {
    ssize_t sent;
    do
        sent = ::send(mSocket.get(), line.data(), line.size(), MSG_NOSIGNAL | MSG_DONTWAIT);
    while (sent < 0 && errno == EINTR);
    return sent >= 0;
}

bool SystemLogSocket::send(std::string_view line) {
    if (!mSocket && !connect())
        return false;
    if (trySend(line))
        return true;
    if (errno == EAGAIN || errno == EWOULDBLOCK || errno == ENOBUFS)
        return false;
    // The log daemon was restarted: its old socket is gone.
    mSocket.reset();
    return connect() && trySend(line);
}

} // namespace qnsys
