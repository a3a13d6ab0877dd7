// SPDX-License-Identifier: MIT
#include "ptc/LoopbackSocket.h"

#include <arpa/inet.h>
#include <cstdint>
#include <netinet/tcp.h>
#include <sys/socket.h>

namespace PTC {

sockaddr_in loopbackAddress(long identity) {
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = inet_addr("127.0.0.1");
    address.sin_port = htons(static_cast<uint16_t>(identity));
    return address;
}

int setSocketOption(int socket, int level, int option, int value) {
    return ::setsockopt(socket, level, option, &value, sizeof(value));
}

void disableDelay(int socket) {
    setSocketOption(socket, IPPROTO_TCP, TCP_NODELAY, 1);
}

} // namespace PTC
