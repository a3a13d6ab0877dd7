// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstdint>

#include "base/UniqueFd.h"
#include "ptc/EventPacket.h"

namespace bench {

using Packet = std::array<char, PTC::kPacketSize>;

/**
 * The bare minimum that both ends of the protocol must do with a socket, written as tightly as it
 * goes: it is the floor that the daemon is measured against.
 */
qns::UniqueFd listenOn(uint16_t port);
qns::UniqueFd acceptOne(int listener);
/** Tries for up to ten seconds: the other end may still be starting. */
qns::UniqueFd connectTo(uint16_t port);

/** Reads one packet, acknowledging every read. False when the peer has gone. */
bool readPacket(int socket, Packet& packet);

/** Drops acknowledgements that have come, then writes one packet. */
bool writePacket(int socket, const Packet& packet);

/**
 * Gives this process a loopback network of its own, so that the fixed ports are free; where that
 * is not allowed it says so and goes on with the machine's.
 */
void isolateNetwork();

} // namespace bench
