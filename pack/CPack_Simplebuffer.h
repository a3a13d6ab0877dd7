// SPDX-License-Identifier: MIT
#pragma once

#include "pack/CPack.h"
#include "pack/CSimpleBuffer.h"

#include <cstdint>
#include <string>

/**
 * Appends one encoded value to a simplebuffer. Every operation returns 1, or 0 with the buffer
 * unchanged when memory is out or a raw is longer than 32 bits can say. Stateless: any thread
 * may use it on a buffer of its own.
 */
class CPack_Simplebuffer {
public:
    int pack_simplebuffer_nil(simplebuffer* buffer) {
        return append(buffer, 1, [](uint8_t* to) { CPack().pack_nil(to); });
    }
    int pack_simplebuffer_bool(simplebuffer* buffer, bool value) {
        return append(buffer, 1, [=](uint8_t* to) { CPack().pack_bool(to, value); });
    }
    int pack_simplebuffer_float(simplebuffer* buffer, float value) {
        return append(buffer, 5, [=](uint8_t* to) { CPack().pack_float(to, value); });
    }
    int pack_simplebuffer_double(simplebuffer* buffer, double value) {
        return append(buffer, 9, [=](uint8_t* to) { CPack().pack_double(to, value); });
    }
    int pack_simplebuffer_fixuint(simplebuffer* buffer, uint8_t value) {
        return append(buffer, 1, [=](uint8_t* to) { CPack().pack_fixuint(to, value); });
    }
    int pack_simplebuffer_uint8(simplebuffer* buffer, uint8_t value) {
        return append(buffer, 2, [=](uint8_t* to) { CPack().pack_uint8(to, value); });
    }
    int pack_simplebuffer_uint16(simplebuffer* buffer, uint16_t value) {
        return append(buffer, 3, [=](uint8_t* to) { CPack().pack_uint16(to, value); });
    }
    int pack_simplebuffer_uint32(simplebuffer* buffer, uint32_t value) {
        return append(buffer, 5, [=](uint8_t* to) { CPack().pack_uint32(to, value); });
    }
    int pack_simplebuffer_uint64(simplebuffer* buffer, uint64_t value) {
        return append(buffer, 9, [=](uint8_t* to) { CPack().pack_uint64(to, value); });
    }
    int pack_simplebuffer_fixint(simplebuffer* buffer, int8_t value) {
        return append(buffer, 1, [=](uint8_t* to) { CPack().pack_fixint(to, value); });
    }
    int pack_simplebuffer_int8(simplebuffer* buffer, int8_t value) {
        return append(buffer, 2, [=](uint8_t* to) { CPack().pack_int8(to, value); });
    }
    int pack_simplebuffer_int16(simplebuffer* buffer, int16_t value) {
        return append(buffer, 3, [=](uint8_t* to) { CPack().pack_int16(to, value); });
    }
    int pack_simplebuffer_int32(simplebuffer* buffer, int32_t value) {
        return append(buffer, 5, [=](uint8_t* to) { CPack().pack_int32(to, value); });
    }
    int pack_simplebuffer_int64(simplebuffer* buffer, int64_t value) {
        return append(buffer, 9, [=](uint8_t* to) { CPack().pack_int64(to, value); });
    }
    int pack_simplebuffer_uint(simplebuffer* buffer, uint32_t value) {
        return append(buffer, Encoding::sizeOfUint(value),
                      [=](uint8_t* to) { CPack().pack_uint(to, value); });
    }
    int pack_simplebuffer_int(simplebuffer* buffer, int32_t value) {
        return append(buffer, Encoding::sizeOfInt(value),
                      [=](uint8_t* to) { CPack().pack_int(to, value); });
    }
    int pack_simplebuffer_raw_header(simplebuffer* buffer, uint64_t length);
    int pack_simplebuffer_raw(simplebuffer* buffer, const void* bytes, uint64_t length);

    /** The text and a zero byte, as one raw: an empty string is two bytes on the wire. */
    int pack_simplebuffer_string(simplebuffer* buffer, const std::string& text);

    /** The same, in the environment's multibyte encoding, up to what does not convert. */
    int pack_simplebuffer_wstring(simplebuffer* buffer, const std::wstring& text);

    /** Writes nothing and returns 0: repeated fields travel as a flat run of values. */
    int pack_simplebuffer_array_header(simplebuffer*, uint32_t) { return 0; }

private:
    using Encoding = qns::Encoding;

    /** One size check for exactly `size` bytes, then `write` stores them. */
    template<class Write>
    static int append(simplebuffer* buffer, uint64_t size, Write write) {
        uint8_t* const to = CSimpleBuffer().simplebuffer_checksize(buffer, size);
        if (to == nullptr)
            return 0;
        write(to);
        return 1;
    }

    /** Reserves a raw of `length` bytes with its header; `write` fills in the contents. */
    template<class Write>
    static int appendRaw(simplebuffer* buffer, uint64_t length, Write write) {
        const uint32_t header = Encoding::sizeOfRawHeader(length);
        if (header == 0)
            return 0;
        return append(buffer, header + length,
                      [=](uint8_t* to) { write(to + CPack().pack_raw_header(to, length)); });
    }
};
