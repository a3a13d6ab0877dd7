// SPDX-License-Identifier: MIT
#pragma once

#include <netinet/in.h>

namespace PTC {

/** What both ends of a connection ask for, in bytes: room for six packets. */
constexpr int kReceiveBufferSize = 122880;

/** 127.0.0.1 and the port of that identity. */
sockaddr_in loopbackAddress(long identity);

/** The result of setsockopt(2): 0, or -1. */
int setSocketOption(int socket, int level, int option, int value);

/** Sends small writes at once; without it an acknowledgement can wait for 40 ms. */
void disableDelay(int socket);

} // namespace PTC
