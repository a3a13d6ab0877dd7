// SPDX-License-Identifier: MIT
#pragma once

#include "pack/Encoding.h"

#include <cstdint>
#include <cstring>

/**
 * Writes one encoded value to `destination`, which must have room for it, and returns the number
 * of bytes written. Numbers are big-endian. The encoding is the first published MessagePack
 * form; see docs/protocol.md. Stateless: any thread may use it.
 */
class CPack {
    using Encoding = qns::Encoding;

public:
    uint32_t pack_nil(void* destination) { return Encoding::store(destination, Encoding::kNil); }
    uint32_t pack_bool(void* destination, bool value) {
        return Encoding::store(destination, value ? Encoding::kTrue : Encoding::kFalse);
    }
    uint32_t pack_float(void* destination, float value) {
        return Encoding::store(destination, Encoding::kFloat, Encoding::bitsOf<uint32_t>(value));
    }
    uint32_t pack_double(void* destination, double value) {
        return Encoding::store(destination, Encoding::kDouble, Encoding::bitsOf<uint64_t>(value));
    }

    /** The value itself as one byte; only for values below 128. */
    uint32_t pack_fixuint(void* destination, uint8_t value) {
        return Encoding::store(destination, value);
    }
    uint32_t pack_uint8(void* destination, uint8_t value) {
        return Encoding::store(destination, Encoding::kUint8, value);
    }
    uint32_t pack_uint16(void* destination, uint16_t value) {
        return Encoding::store(destination, Encoding::kUint16, value);
    }
    uint32_t pack_uint32(void* destination, uint32_t value) {
        return Encoding::store(destination, Encoding::kUint32, value);
    }
    uint32_t pack_uint64(void* destination, uint64_t value) {
        return Encoding::store(destination, Encoding::kUint64, value);
    }

    /** One byte; only for values from -32 to -1. */
    uint32_t pack_fixint(void* destination, int8_t value) {
        return Encoding::store(destination,
                               static_cast<uint8_t>(static_cast<uint8_t>(value) | 0xA0));
    }
    uint32_t pack_int8(void* destination, int8_t value) {
        return Encoding::store(destination, Encoding::kInt8, static_cast<uint8_t>(value));
    }
    uint32_t pack_int16(void* destination, int16_t value) {
        return Encoding::store(destination, Encoding::kInt16, static_cast<uint16_t>(value));
    }
    uint32_t pack_int32(void* destination, int32_t value) {
        return Encoding::store(destination, Encoding::kInt32, static_cast<uint32_t>(value));
    }
    uint32_t pack_int64(void* destination, int64_t value) {
        return Encoding::store(destination, Encoding::kInt64, static_cast<uint64_t>(value));
    }

    /** The smallest form that holds the value: 1, 2, 3 or 5 bytes. */
    uint32_t pack_uint(void* destination, uint32_t value) {
        if (value < 0x80)
            return pack_fixuint(destination, static_cast<uint8_t>(value));
        if (value < 0x100)
            return pack_uint8(destination, static_cast<uint8_t>(value));
        if (value < 0x10000)
            return pack_uint16(destination, static_cast<uint16_t>(value));
        return pack_uint32(destination, value);
    }
    uint32_t pack_int(void* destination, int32_t value) {
        if (value >= 0)
            return pack_uint(destination, static_cast<uint32_t>(value));
        if (value >= -32)
            return pack_fixint(destination, static_cast<int8_t>(value));
        if (value >= INT8_MIN)
            return pack_int8(destination, static_cast<int8_t>(value));
        if (value >= INT16_MIN)
            return pack_int16(destination, static_cast<int16_t>(value));
        return pack_int32(destination, value);
    }

    /** Both write nothing and return 0 for a length above 32 bits, which no form holds. */
    uint32_t pack_raw_header(void* destination, uint64_t length) {
        if (length <= Encoding::kLongestFixRaw)
            return Encoding::store(destination, static_cast<uint8_t>(Encoding::kFixRaw | length));
        if (length <= Encoding::kLongestRaw16)
            return Encoding::store(destination, Encoding::kRaw16, static_cast<uint16_t>(length));
        if (length <= Encoding::kLongestRaw32)
            return Encoding::store(destination, Encoding::kRaw32, static_cast<uint32_t>(length));
        return 0;
    }
    uint32_t pack_raw(void* destination, const void* bytes, uint64_t length) {
        const uint32_t header = pack_raw_header(destination, length);
        if (header == 0)
            return 0;
        if (length != 0)
            std::memcpy(static_cast<uint8_t*>(destination) + header, bytes, length);
        return header + static_cast<uint32_t>(length);
    }

    /** Records and arrays travel as a flat run of values: these write nothing and return 0. */
    uint32_t pack_array_header(void*, uint32_t) { return 0; }
    uint32_t pack_map_header(void*, uint32_t) { return 0; }
};
