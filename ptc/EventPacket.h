// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>

namespace PTC {

constexpr std::size_t kPacketSize = 20480;

/**
 * The header of a packet, in wire layout: 64-bit fields in host byte order (little-endian). A
 * one-byte flag is followed by seven reserved bytes. The payload follows the header; zeros fill
 * the packet up to kPacketSize.
 */
struct EventPacket {
    long receiverId;
    long objectId;
    long methodId;
    char* data; ///< on the wire: an address of the sending process, without meaning here
    uint8_t isCallback;
    uint8_t reservedAfterIsCallback[7];
    long size; ///< payload length in bytes
    uint8_t isRemote;
    uint8_t reservedAfterIsRemote[7];
};

static_assert(sizeof(EventPacket) == 56);
static_assert(offsetof(EventPacket, receiverId) == 0);
static_assert(offsetof(EventPacket, objectId) == 8);
static_assert(offsetof(EventPacket, methodId) == 16);
static_assert(offsetof(EventPacket, data) == 24);
static_assert(offsetof(EventPacket, isCallback) == 32);
static_assert(offsetof(EventPacket, size) == 40);
static_assert(offsetof(EventPacket, isRemote) == 48);

constexpr std::size_t kPacketHeaderSize = sizeof(EventPacket);
constexpr long kMaxPayloadSize = static_cast<long>(kPacketSize - kPacketHeaderSize);

/** Sent back for every successful read: the letters O and K and a zero byte. */
constexpr char kAcknowledgement[3] = {'O', 'K', '\0'};

} // namespace PTC
