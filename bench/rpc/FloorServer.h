// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

namespace bench {

enum class Hop {
    none,     ///< the thread that reads a request answers it
    semaphore ///< a worker answers, handed over by the process-shared mutex and semaphore
};

/** Serves one client in the calling process until the client leaves: every packet is sent back. */
void serveFloor(uint16_t servicePort, uint16_t clientPort, Hop hop);

} // namespace bench
