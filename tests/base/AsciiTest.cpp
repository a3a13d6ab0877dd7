// SPDX-License-Identifier: MIT
#include "base/Ascii.h"

#include <gtest/gtest.h>
#include <string>

namespace {

/** Puts each odd character at each place of texts of each length around the block size. */
template<class Character, class To>
void expectPrefixEndsAt(std::initializer_list<uint32_t> oddOnes) {
    for (std::size_t length = 1; length < 70; ++length)
        for (std::size_t place = 0; place < length; ++place)
            for (const uint32_t odd : oddOnes) {
                std::basic_string<Character> text(length, Character{'x'});
                text[place] = static_cast<Character>(odd);
                std::basic_string<To> to(length + 1, To{'#'});
                ASSERT_EQ(qns::copyAsciiPrefix(text.data(), length, to.data()), place)
                    << length << ' ' << odd;
                ASSERT_EQ(to.substr(0, place), std::basic_string<To>(place, To{'x'}));
                ASSERT_EQ(to.back(), To{'#'});
            }
}

template<class From, class To>
void expectCopies() {
    for (std::size_t length = 0; length < 70; ++length) {
        std::basic_string<From> from;
        std::basic_string<To> expected;
        for (std::size_t i = 0; i < length; ++i) {
            from += static_cast<From>(1 + (i * 37) % 127);
            expected += static_cast<To>(1 + (i * 37) % 127);
        }
        std::basic_string<To> to(length + 1, To{'#'});
        ASSERT_EQ(qns::copyAsciiPrefix(from.data(), length, to.data()), length);
        ASSERT_EQ(to, expected + To{'#'});
    }
}

} // namespace

TEST(Ascii, ThePrefixOfWideTextEndsAtTheFirstOddCharacter) {
    expectPrefixEndsAt<wchar_t, char>({0, 0x80, 0xFF, 0x100, 0x141, 0x7F80, 0x8041, 0xFF41, 0x10000,
                                       0x10041, 0x7FFFFFFF, 0x80000000, 0x80000041, 0xFFFFFFFF});
}

TEST(Ascii, ThePrefixOfBytesEndsAtTheFirstOddByte) {
    expectPrefixEndsAt<char, wchar_t>({0, 0x80, 0xC3, 0xFF});
}

// Takes the code that machines without vector instructions use.
TEST(Ascii, ThePrefixOfAnyOtherTextEndsAtTheFirstOddCharacter) {
    expectPrefixEndsAt<char16_t, char>({0, 0x80, 0x141, 0xFFFF});
}

TEST(Ascii, CopiesTextOfEveryLengthAndNothingBeyond) {
    expectCopies<wchar_t, char>();
    expectCopies<char, wchar_t>();
    expectCopies<char16_t, char>();
}
