// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

/** What kind of value was decoded. */
enum unpack_type_t : int32_t {
    UNPACK_NIL = 0,
    UNPACK_BOOLEAN = 1,
    UNPACK_SIGNED = 2,
    UNPACK_UNSIGNED = 3,
    UNPACK_FLOAT = 4,
    UNPACK_DOUBLE = 5,
    UNPACK_RAW = 6
};

/** One decoded value. Clear it to zero (`unpack_info_t info{}`) before the first use. */
struct unpack_info_t {
    int32_t type;
    union {
        uint64_t boolean;     ///< 0 or 1
        int64_t signedInt;    ///< sign-extended
        uint64_t unsignedInt; ///< zero-extended
        uint32_t floatBits;
        uint64_t doubleBits;
        uint64_t rawLength;
    } value;
    const uint8_t* ptr; ///< a raw's first byte, inside the packet (not copied)
};

/**
 * Reads one encoded value. Stateless: any thread may use it.
 *
 * `available` is how many bytes may be read. A value that does not fit is treated as an unknown
 * tag is: nothing is consumed and `info` is left as it was.
 */
class CUnpack {
public:
    struct Header {
        uint32_t length; ///< of the header itself, 0 for an unknown tag
        uint8_t tag;     ///< ranges folded to 0x00, 0xE0 and 0xA0
        uint64_t value;
    };

    Header unpack_base(const void* data, size_t available = SIZE_MAX);

    /** Returns the number of bytes consumed: header plus, for a raw, its contents. */
    uint32_t unpack(unpack_info_t& info, const void* data, size_t available = SIZE_MAX);
};

/** Wide text from a decoded raw, up to its first NUL and to what does not convert. */
std::wstring s2ws(const void* text, uint64_t length);
