// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <vector>

namespace bench {

enum class Hop {
    none,     ///< the thread that reads a request answers it
    semaphore ///< one worker answers, handed over by the process-shared mutex and semaphore
};

/**
 * Serves one client for each of the client ports in the calling process, until all have
 * left: every packet is sent back. A thread reads for each client.
 */
void serveFloor(uint16_t servicePort, const std::vector<uint16_t>& clientPorts, Hop hop);

/**
 * The least that telling many listeners takes: each packet from the client of the first port begins
 * with the number of listeners (4 bytes); so many packets go to all ports in turn, each beginning
 * with the CLOCK_MONOTONIC nanoseconds of the packet's arrival (8 bytes).
 */
void serveBroadcast(uint16_t servicePort, const std::vector<uint16_t>& clientPorts);

} // namespace bench
