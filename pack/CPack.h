// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

/**
 * Writes one encoded value to `destination`, which must have room for it, and returns the number
 * of bytes written. Numbers are big-endian. The encoding is the first published MessagePack
 * form; see docs/protocol.md. Stateless: any thread may use it.
 */
class CPack {
public:
    uint32_t pack_nil(void* destination);
    uint32_t pack_bool(void* destination, bool value);
    uint32_t pack_float(void* destination, float value);
    uint32_t pack_double(void* destination, double value);

    /** The value itself as one byte; only for values below 128. */
    uint32_t pack_fixuint(void* destination, uint8_t value);
    uint32_t pack_uint8(void* destination, uint8_t value);
    uint32_t pack_uint16(void* destination, uint16_t value);
    uint32_t pack_uint32(void* destination, uint32_t value);
    uint32_t pack_uint64(void* destination, uint64_t value);

    /** One byte; only for values from -32 to -1. */
    uint32_t pack_fixint(void* destination, int8_t value);
    uint32_t pack_int8(void* destination, int8_t value);
    uint32_t pack_int16(void* destination, int16_t value);
    uint32_t pack_int32(void* destination, int32_t value);
    uint32_t pack_int64(void* destination, int64_t value);

    /** The smallest form that holds the value: 1, 2, 3 or 5 bytes. */
    uint32_t pack_uint(void* destination, uint32_t value);
    uint32_t pack_int(void* destination, int32_t value);

    uint32_t pack_raw_header(void* destination, uint64_t length);
    uint32_t pack_raw(void* destination, const void* bytes, uint64_t length);

    /** Records and arrays travel as a flat run of values: these write nothing and return 0. */
    uint32_t pack_array_header(void* destination, uint32_t count);
    uint32_t pack_map_header(void* destination, uint32_t count);
};
