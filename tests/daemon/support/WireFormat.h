// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>
#include <iosfwd>
#include <string>
#include <string_view>

/**
 * Packets and argument encoding, written without the daemon's own code so that the tests prove
 * the format instead of agreeing with its mistakes.
 */
namespace wire {

using Bytes = std::string;

constexpr std::size_t kPacketSize = 20480;
constexpr std::size_t kHeaderSize = 56;
constexpr std::size_t kMaxPayload = kPacketSize - kHeaderSize;
constexpr std::string_view kAcknowledgement{"OK\0", 3};

/** One event as it stands in a packet. */
struct Packet {
    std::int64_t receiver = 8;
    std::int64_t object = 62;
    std::int64_t method = 0;
    bool callback = false;
    bool remote = true;
    Bytes payload;
};

bool operator==(const Packet& left, const Packet& right);
void PrintTo(const Packet& packet, std::ostream* out);

/** The 20480 bytes; `payload` must fit. */
Bytes toBytes(const Packet& packet);

/** The same with a size field that need not be the payload's. */
Bytes toBytes(const Packet& packet, std::int64_t size);

/** Reads 20480 bytes. Reserved bytes and padding that are not zero fail the test. */
Packet fromBytes(std::string_view bytes);

/** Bytes from pairs of hexadecimal digits; anything between the pairs must be white space. */
Bytes hex(std::string_view digits);
std::string toHex(std::string_view bytes);

/** Items, each in the form that its name says; integer() takes the shortest one. */
Bytes integer(std::int64_t value);
Bytes int32(std::int32_t value);
Bytes int64(std::int64_t value);
Bytes uint64(std::uint64_t value);
Bytes boolean(bool value);
Bytes raw(std::string_view bytes);

/** A raw whose bytes end with a zero. */
Bytes text(std::string_view text);

/** The value of an item that int32() made; anything else fails the test. */
std::int32_t readInt32(std::string_view item);

/** The same for int64(), at an offset. */
std::int64_t readInt64(std::string_view bytes, std::size_t offset);

} // namespace wire
