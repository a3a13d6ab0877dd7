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

template<class Character>
inline bool isPlainBlock(const Character* text) {
    bool plain = true;
    for (std::size_t i = 0; i < kBlock; ++i)
        plain = plain && isPlain(text[i]);
    return plain;
}

template<class From, class To>
inline void copyBlock(const From* from, To* to) {
    for (std::size_t i = 0; i < kBlock; ++i)
        to[i] = static_cast<To>(from[i]);
}

#ifdef __SSE2__
// Compilers make poor vector code of the loops above. These overloads are for the two text types.
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

inline bool isPlainBlock(const wchar_t* text) {
    return isPlainBlock(narrowed(text));
}
inline bool isPlainBlock(const char* text) {
    return isPlainBlock(load(text));
}

template<class Byte>
inline void copyBlock(const wchar_t* from, Byte* to) {
    _mm_storeu_si128(reinterpret_cast<__m128i*>(to), narrowed(from));
}

inline void copyBlock(const char* from, wchar_t* to) {
    const __m128i zero = _mm_setzero_si128();
    const __m128i bytes = load(from);
    const __m128i low = _mm_unpacklo_epi8(bytes, zero);
    const __m128i high = _mm_unpackhi_epi8(bytes, zero);
    auto* const target = reinterpret_cast<__m128i*>(to);
    _mm_storeu_si128(target, _mm_unpacklo_epi16(low, zero));
    _mm_storeu_si128(target + 1, _mm_unpackhi_epi16(low, zero));
    _mm_storeu_si128(target + 2, _mm_unpacklo_epi16(high, zero));
    _mm_storeu_si128(target + 3, _mm_unpackhi_epi16(high, zero));
}
#endif

} // namespace ascii

/** How many characters come before the first that is NUL or not ASCII. */
template<class Character>
[[nodiscard]] inline std::size_t asciiPrefix(const Character* text, std::size_t count) {
    std::size_t at = 0;
    while (count - at >= ascii::kBlock && ascii::isPlainBlock(text + at))
        at += ascii::kBlock;
    const bool isTail = count - at < ascii::kBlock;
    if (isTail && count >= ascii::kBlock && ascii::isPlainBlock(text + count - ascii::kBlock))
        return count;
    while (at < count && ascii::isPlain(text[at]))
        ++at;
    return at;
}

/** Copies `count` ASCII characters, widening or narrowing each. */
template<class From, class To>
inline void copyAscii(const From* from, std::size_t count, To* to) {
    if (count < ascii::kBlock) {
        for (std::size_t i = 0; i < count; ++i)
            to[i] = static_cast<To>(from[i]);
        return;
    }
    for (std::size_t at = 0; count - at >= ascii::kBlock; at += ascii::kBlock)
        ascii::copyBlock(from + at, to + at);
    ascii::copyBlock(from + count - ascii::kBlock, to + count - ascii::kBlock);
}

} // namespace qns
