// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <type_traits>

/**
 * The part of text conversion that needs no locale: every locale the C library installs keeps
 * ASCII as it is. Blocks of a fixed size with no branch inside, so that they become vector code;
 * the last block overlaps its neighbour rather than leaving single characters over.
 */
namespace qns {

inline constexpr std::size_t kAsciiBlock = 8;

/** True when all of `count` characters are ASCII and none is NUL. */
template<class Character>
[[nodiscard]] inline bool isAsciiBlock(const Character* text, std::size_t count) {
    using Unit = std::make_unsigned_t<Character>;
    Unit seen = 0;
    for (std::size_t i = 0; i < count; ++i) {
        const auto unit = static_cast<Unit>(text[i]);
        // NUL is found by the borrow of the subtraction.
        seen = static_cast<Unit>(seen | unit | static_cast<Unit>(unit - 1u));
    }
    return (seen & static_cast<Unit>(~Unit{0x7F})) == 0;
}

/** How many characters come before the first that is NUL or not ASCII. */
template<class Character>
[[nodiscard]] inline std::size_t asciiPrefix(const Character* text, std::size_t count) {
    std::size_t at = 0;
    while (count - at >= kAsciiBlock && isAsciiBlock(text + at, kAsciiBlock))
        at += kAsciiBlock;
    if (count >= kAsciiBlock && count - at < kAsciiBlock &&
        isAsciiBlock(text + count - kAsciiBlock, kAsciiBlock))
        return count;
    while (at < count && isAsciiBlock(text + at, 1))
        ++at;
    return at;
}

/** Copies `count` ASCII characters, widening or narrowing each. */
template<class From, class To>
inline void copyAscii(const From* from, std::size_t count, To* to) {
    const auto copyBlock = [from, to](std::size_t at) {
        for (std::size_t i = 0; i < kAsciiBlock; ++i)
            to[at + i] = static_cast<To>(from[at + i]);
    };
    if (count < kAsciiBlock) {
        for (std::size_t i = 0; i < count; ++i)
            to[i] = static_cast<To>(from[i]);
        return;
    }
    for (std::size_t at = 0; count - at >= kAsciiBlock; at += kAsciiBlock)
        copyBlock(at);
    copyBlock(count - kAsciiBlock);
}

} // namespace qns
