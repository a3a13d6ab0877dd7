// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <type_traits>

#ifdef __SSE2__
#include <emmintrin.h>
#endif

/**
 * The part of text conversion that needs no locale: every locale the C library installs keeps
 * ASCII as it is. Text is handled in blocks, the last of which overlaps the one before rather
 * than leaving single characters over.
 */
namespace qns {
namespace ascii {

inline constexpr std::size_t kBlock = 16;

template<class Character>
inline bool isPlain(Character character) {
    return static_cast<std::make_unsigned_t<Character>>(character) - 1u < 0x7Fu;
}

/** Copies sixteen characters; false, and then what was copied means nothing, when one is not plain.
 */
template<class From, class To>
inline bool copyPlainBlock(const From* from, To* to) {
    bool plain = true;
    for (std::size_t i = 0; i < kBlock; ++i) {
        plain = plain && isPlain(from[i]);
        to[i] = static_cast<To>(from[i]);
    }
    return plain;
}

#ifdef __SSE2__
// Compilers make poor vector code of the loop above. These overloads are for the two text types.
static_assert(sizeof(wchar_t) == 4);

template<class Character>
inline __m128i load(const Character* text) {
    return _mm_loadu_si128(reinterpret_cast<const __m128i*>(text));
}

/** Sixteen wide characters as bytes, where what is above 0xFF becomes 0xFF, or 0 when negative. */
inline __m128i narrowed(const wchar_t* text) {
    const __m128i low = _mm_packs_epi32(load(text), load(text + 4));
    const __m128i high = _mm_packs_epi32(load(text + 8), load(text + 12));
    return _mm_packus_epi16(low, high);
}

inline bool isPlainBlock(__m128i bytes) {
    const __m128i nul = _mm_cmpeq_epi8(bytes, _mm_setzero_si128());
    return _mm_movemask_epi8(_mm_or_si128(bytes, nul)) == 0;
}

template<class Byte>
inline bool copyPlainBlock(const wchar_t* from, Byte* to) {
    const __m128i bytes = narrowed(from);
    _mm_storeu_si128(reinterpret_cast<__m128i*>(to), bytes);
    return isPlainBlock(bytes);
}

inline bool copyPlainBlock(const char* from, wchar_t* to) {
    const __m128i zero = _mm_setzero_si128();
    const __m128i bytes = load(from);
    const __m128i low = _mm_unpacklo_epi8(bytes, zero);
    const __m128i high = _mm_unpackhi_epi8(bytes, zero);
    auto* const target = reinterpret_cast<__m128i*>(to);
    _mm_storeu_si128(target, _mm_unpacklo_epi16(low, zero));
    _mm_storeu_si128(target + 1, _mm_unpackhi_epi16(low, zero));
    _mm_storeu_si128(target + 2, _mm_unpacklo_epi16(high, zero));
    _mm_storeu_si128(target + 3, _mm_unpackhi_epi16(high, zero));
    return isPlainBlock(bytes);
}
#endif

} // namespace ascii

/**
 * Copies characters up to the first that is NUL or not ASCII, widening or narrowing each, and
 * returns how many. `to` has room for `count`; what stands in it behind the copy means nothing.
 */
template<class From, class To>
inline std::size_t copyAsciiPrefix(const From* from, std::size_t count, To* to) {
    std::size_t at = 0;
    while (count - at >= ascii::kBlock && ascii::copyPlainBlock(from + at, to + at))
        at += ascii::kBlock;
    const bool isTail = count - at < ascii::kBlock;
    const std::size_t last = count - ascii::kBlock;
    if (isTail && count >= ascii::kBlock && ascii::copyPlainBlock(from + last, to + last))
        return count;
    for (; at < count && ascii::isPlain(from[at]); ++at)
        to[at] = static_cast<To>(from[at]);
    return at;
}

} // namespace qns
