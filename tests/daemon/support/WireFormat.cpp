// SPDX-License-Identifier: MIT
#include "tests/daemon/support/WireFormat.h"

#include <algorithm>
#include <cctype>
#include <ostream>
#include <tuple>

#include <gtest/gtest.h>

namespace wire {

namespace {

void putField(Bytes& bytes, std::size_t offset, std::int64_t value) {
    auto rest = static_cast<std::uint64_t>(value);
    for (std::size_t i = 0; i < 8; ++i, rest >>= 8)
        bytes[offset + i] = static_cast<char>(rest & 0xFF);
}

std::int64_t getField(std::string_view bytes, std::size_t offset) {
    std::uint64_t value = 0;
    for (std::size_t i = 8; i-- > 0;)
        value = value << 8 | static_cast<unsigned char>(bytes[offset + i]);
    return static_cast<std::int64_t>(value);
}

Bytes bigEndian(std::uint64_t value, std::size_t width) {
    Bytes bytes(width, '\0');
    for (std::size_t i = width; i-- > 0; value >>= 8)
        bytes[i] = static_cast<char>(value & 0xFF);
    return bytes;
}

Bytes tagged(int tag, std::uint64_t value, std::size_t width) {
    return static_cast<char>(tag) + bigEndian(value, width);
}

Bytes shortestUnsigned(std::uint64_t value) {
    if (value < 0x80)
        return Bytes(1, static_cast<char>(value));
    if (value < 0x100)
        return tagged(0xCC, value, 1);
    if (value < 0x10000)
        return tagged(0xCD, value, 2);
    if (value < 0x100000000)
        return tagged(0xCE, value, 4);
    return tagged(0xCF, value, 8);
}

Bytes shortestNegative(std::int64_t value) {
    const auto bits = static_cast<std::uint64_t>(value);
    if (value >= -32)
        return Bytes(1, static_cast<char>(bits & 0xFF));
    if (value >= INT8_MIN)
        return tagged(0xD0, bits, 1);
    if (value >= INT16_MIN)
        return tagged(0xD1, bits, 2);
    if (value >= INT32_MIN)
        return tagged(0xD2, bits, 4);
    return tagged(0xD3, bits, 8);
}

Bytes rawHeader(std::size_t length) {
    if (length < 32)
        return Bytes(1, static_cast<char>(0xA0 | length));
    if (length < 0x10000)
        return tagged(0xDA, length, 2);
    return tagged(0xDB, length, 4);
}

bool isZero(std::string_view bytes) {
    return std::all_of(bytes.begin(), bytes.end(), [](char byte) { return byte == 0; });
}

int digit(char character) {
    if (character >= '0' && character <= '9')
        return character - '0';
    const int letter = std::tolower(static_cast<unsigned char>(character));
    return letter >= 'a' && letter <= 'f' ? letter - 'a' + 10 : -1;
}

std::uint64_t readTagged(std::string_view bytes, std::size_t offset, int tag, std::size_t width) {
    if (bytes.size() < offset + 1 + width || bytes[offset] != static_cast<char>(tag)) {
        ADD_FAILURE() << "No item with tag " << tag << " at " << offset << " in " << toHex(bytes);
        return 0;
    }
    std::uint64_t value = 0;
    for (std::size_t i = 1; i <= width; ++i)
        value = value << 8 | static_cast<unsigned char>(bytes[offset + i]);
    return value;
}

} // namespace

bool operator==(const Packet& left, const Packet& right) {
    const auto fields = [](const Packet& packet) {
        return std::tie(packet.receiver, packet.object, packet.method, packet.callback,
                        packet.remote, packet.payload);
    };
    return fields(left) == fields(right);
}

void PrintTo(const Packet& packet, std::ostream* out) {
    *out << "receiver " << packet.receiver << " object " << packet.object << " method "
         << packet.method << (packet.callback ? " callback" : " request")
         << (packet.remote ? " remote" : " local") << " payload " << toHex(packet.payload);
}

Bytes toBytes(const Packet& packet) {
    return toBytes(packet, static_cast<std::int64_t>(packet.payload.size()));
}

Bytes toBytes(const Packet& packet, std::int64_t size) {
    EXPECT_LE(packet.payload.size(), kMaxPayload);
    Bytes bytes(kHeaderSize, '\0');
    putField(bytes, 0, packet.receiver);
    putField(bytes, 8, packet.object);
    putField(bytes, 16, packet.method);
    bytes[32] = packet.callback ? 1 : 0;
    putField(bytes, 40, size);
    bytes[48] = packet.remote ? 1 : 0;
    bytes += packet.payload;
    bytes.resize(kPacketSize, '\0');
    return bytes;
}

Packet fromBytes(std::string_view bytes) {
    EXPECT_EQ(bytes.size(), kPacketSize);
    const auto size = getField(bytes, 40);
    if (size < 0 || size > static_cast<std::int64_t>(kMaxPayload)) {
        ADD_FAILURE() << "A packet with a size field of " << size;
        return {};
    }
    const auto length = static_cast<std::size_t>(size);
    EXPECT_TRUE(isZero(bytes.substr(33, 7))) << "reserved bytes after isCallback";
    EXPECT_TRUE(isZero(bytes.substr(49, 7))) << "reserved bytes after isRemote";
    EXPECT_TRUE(isZero(bytes.substr(kHeaderSize + length))) << "padding";
    EXPECT_LE(bytes[32] | bytes[48], 1) << "flags";
    return {getField(bytes, 0), getField(bytes, 8), getField(bytes, 16),
            bytes[32] != 0,     bytes[48] != 0,     Bytes(bytes.substr(kHeaderSize, length))};
}

Bytes hex(std::string_view digits) {
    Bytes bytes;
    for (std::size_t i = 0; i < digits.size();) {
        if (std::isspace(static_cast<unsigned char>(digits[i])) != 0) {
            ++i;
            continue;
        }
        const int high = digit(digits[i]);
        const int low = i + 1 < digits.size() ? digit(digits[i + 1]) : -1;
        if (high < 0 || low < 0) {
            ADD_FAILURE() << "Not hexadecimal: " << digits;
            return bytes;
        }
        bytes += static_cast<char>(high << 4 | low);
        i += 2;
    }
    return bytes;
}

std::string toHex(std::string_view bytes) {
    constexpr std::string_view kDigits = "0123456789ABCDEF";
    std::string text;
    for (const char byte : bytes) {
        const auto value = static_cast<unsigned char>(byte);
        text += text.empty() ? "" : " ";
        text += kDigits[value >> 4];
        text += kDigits[value & 15];
    }
    return text;
}

Bytes integer(std::int64_t value) {
    return value >= 0 ? shortestUnsigned(static_cast<std::uint64_t>(value))
                      : shortestNegative(value);
}

Bytes int32(std::int32_t value) {
    return tagged(0xD2, static_cast<std::uint32_t>(value), 4);
}

Bytes int64(std::int64_t value) {
    return tagged(0xD3, static_cast<std::uint64_t>(value), 8);
}

Bytes uint64(std::uint64_t value) {
    return tagged(0xCF, value, 8);
}

Bytes boolean(bool value) {
    return Bytes(1, static_cast<char>(value ? 0xC3 : 0xC2));
}

Bytes raw(std::string_view bytes) {
    return rawHeader(bytes.size()) + Bytes(bytes);
}

Bytes text(std::string_view text) {
    return raw(Bytes(text) + '\0');
}

std::int32_t readInt32(std::string_view item) {
    EXPECT_EQ(item.size(), 5U);
    return static_cast<std::int32_t>(readTagged(item, 0, 0xD2, 4));
}

std::int64_t readInt64(std::string_view bytes, std::size_t offset) {
    return static_cast<std::int64_t>(readTagged(bytes, offset, 0xD3, 8));
}

} // namespace wire
