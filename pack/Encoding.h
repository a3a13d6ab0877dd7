// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <cstring>

namespace qns {

/** First bytes and byte order of the encoding, shared by the writers and the reader. */
struct Encoding {
    enum Tag : uint8_t {
        kFixUint = 0x00,
        kFixRaw = 0xA0,
        kNil = 0xC0,
        kFalse = 0xC2,
        kTrue = 0xC3,
        kFloat = 0xCA,
        kDouble = 0xCB,
        kUint8 = 0xCC,
        kUint16 = 0xCD,
        kUint32 = 0xCE,
        kUint64 = 0xCF,
        kInt8 = 0xD0,
        kInt16 = 0xD1,
        kInt32 = 0xD2,
        kInt64 = 0xD3,
        kRaw16 = 0xDA,
        kRaw32 = 0xDB,
        kFixInt = 0xE0
    };

    static constexpr uint64_t kLongestFixRaw = 31;
    static constexpr uint64_t kLongestRaw16 = 0xFFFF;
    static constexpr uint64_t kLongestRaw32 = 0xFFFFFFFF;

    static constexpr bool kSwapped = __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__;

    static uint8_t bigEndian(uint8_t value) { return value; }
    static uint16_t bigEndian(uint16_t value) {
        return kSwapped ? __builtin_bswap16(value) : value;
    }
    static uint32_t bigEndian(uint32_t value) {
        return kSwapped ? __builtin_bswap32(value) : value;
    }
    static uint64_t bigEndian(uint64_t value) {
        return kSwapped ? __builtin_bswap64(value) : value;
    }

    /** Writes the tag and the number; returns how many bytes that were. */
    template<class Unsigned>
    static uint32_t store(void* destination, uint8_t tag, Unsigned value) {
        auto* bytes = static_cast<uint8_t*>(destination);
        const Unsigned ordered = bigEndian(value);
        bytes[0] = tag;
        std::memcpy(bytes + 1, &ordered, sizeof ordered);
        return 1 + sizeof ordered;
    }

    static uint32_t store(void* destination, uint8_t byte) {
        *static_cast<uint8_t*>(destination) = byte;
        return 1;
    }

    template<class Unsigned>
    static Unsigned load(const uint8_t* bytes) {
        Unsigned value;
        std::memcpy(&value, bytes, sizeof value);
        return bigEndian(value);
    }

    template<class To, class From>
    static To bitsOf(From value) {
        static_assert(sizeof(To) == sizeof(From));
        To bits;
        std::memcpy(&bits, &value, sizeof bits);
        return bits;
    }

    /** What the smallest form of a number takes. */
    static uint32_t sizeOfUint(uint32_t value) {
        return value < 0x80 ? 1 : value < 0x100 ? 2 : value < 0x10000 ? 3 : 5;
    }

    static uint32_t sizeOfInt(int32_t value) {
        if (value >= 0)
            return sizeOfUint(static_cast<uint32_t>(value));
        return value >= -32 ? 1 : value >= INT8_MIN ? 2 : value >= INT16_MIN ? 3 : 5;
    }

    /** What the header of a raw takes; 0 for a length that no form holds. */
    static uint32_t sizeOfRawHeader(uint64_t length) {
        if (length <= kLongestFixRaw)
            return 1;
        return length <= kLongestRaw16 ? 3 : length <= kLongestRaw32 ? 5 : 0;
    }
};

} // namespace qns
