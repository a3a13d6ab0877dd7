// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>

struct simplebuffer;

/**
 * Appends one encoded value to a simplebuffer. Every operation returns 1, or 0 with the buffer
 * unchanged when memory is out. Stateless: any thread may use it on a buffer of its own.
 */
class CPack_Simplebuffer {
public:
    int pack_simplebuffer_nil(simplebuffer* buffer);
    int pack_simplebuffer_bool(simplebuffer* buffer, bool value);
    int pack_simplebuffer_float(simplebuffer* buffer, float value);
    int pack_simplebuffer_double(simplebuffer* buffer, double value);
    int pack_simplebuffer_fixuint(simplebuffer* buffer, uint8_t value);
    int pack_simplebuffer_uint8(simplebuffer* buffer, uint8_t value);
    int pack_simplebuffer_uint16(simplebuffer* buffer, uint16_t value);
    int pack_simplebuffer_uint32(simplebuffer* buffer, uint32_t value);
    int pack_simplebuffer_uint64(simplebuffer* buffer, uint64_t value);
    int pack_simplebuffer_fixint(simplebuffer* buffer, int8_t value);
    int pack_simplebuffer_int8(simplebuffer* buffer, int8_t value);
    int pack_simplebuffer_int16(simplebuffer* buffer, int16_t value);
    int pack_simplebuffer_int32(simplebuffer* buffer, int32_t value);
    int pack_simplebuffer_int64(simplebuffer* buffer, int64_t value);
    int pack_simplebuffer_uint(simplebuffer* buffer, uint32_t value);
    int pack_simplebuffer_int(simplebuffer* buffer, int32_t value);
    int pack_simplebuffer_raw_header(simplebuffer* buffer, uint64_t length);
    int pack_simplebuffer_raw(simplebuffer* buffer, const void* bytes, uint64_t length);

    /** The text and a zero byte, as one raw: an empty string is two bytes on the wire. */
    int pack_simplebuffer_string(simplebuffer* buffer, const std::string& text);

    /** The same, in the environment's multibyte encoding, up to what does not convert. */
    int pack_simplebuffer_wstring(simplebuffer* buffer, const std::wstring& text);

    /** Writes nothing and returns 0: repeated fields travel as a flat run of values. */
    int pack_simplebuffer_array_header(simplebuffer* buffer, uint32_t count);
};
