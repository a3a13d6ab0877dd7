// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

/** What stands on the wire, written down without the code under test. */
using Bytes = std::vector<uint8_t>;

inline Bytes tagged(uint8_t tag, uint64_t value, int length) {
    Bytes bytes{tag};
    for (int shift = 8 * (length - 1); shift >= 0; shift -= 8)
        bytes.push_back(static_cast<uint8_t>(value >> shift));
    return bytes;
}

inline Bytes int32(int32_t value) {
    return tagged(0xD2, static_cast<uint32_t>(value), 4);
}
inline Bytes int64(int64_t value) {
    return tagged(0xD3, static_cast<uint64_t>(value), 8);
}
inline Bytes uint64(uint64_t value) {
    return tagged(0xCF, value, 8);
}
inline Bytes boolean(bool value) {
    return {static_cast<uint8_t>(value ? 0xC3 : 0xC2)};
}

/** A text of at most 30 bytes. */
inline Bytes text(std::string_view value) {
    Bytes bytes(value.size() + 2);
    bytes[0] = static_cast<uint8_t>(0xA0 + value.size() + 1);
    value.copy(reinterpret_cast<char*>(&bytes[1]), value.size());
    return bytes;
}

inline Bytes operator+(Bytes first, const Bytes& second) {
    first.insert(first.end(), second.begin(), second.end());
    return first;
}
