// SPDX-License-Identifier: MIT
#include "mpris/Utf8.h"

#include <gtest/gtest.h>

using mpris::toUtf8;

namespace {

constexpr const char* kBad = "\xEF\xBF\xBD";

TEST(Utf8, LeavesCharactersOfAnyLengthAlone) {
    const std::string text = "a\x01\x7F \xC2\x80 \xDF\xBF \xE0\xA0\x80 \xED\x9F\xBF \xEE\x80\x80 "
                             "\xF0\x90\x80\x80 \xF4\x8F\xBF\xBF";
    EXPECT_EQ(toUtf8(text), text);
    EXPECT_EQ(toUtf8(""), "");
}

TEST(Utf8, ReplacesEachByteThatIsNoPartOfACharacter) {
    EXPECT_EQ(toUtf8("a\xFC"
                     "b"),
              std::string("a") + kBad + "b");
    EXPECT_EQ(toUtf8("\x80\xBF"), std::string(kBad) + kBad);
    EXPECT_EQ(toUtf8("\xC3"), kBad);
    EXPECT_EQ(toUtf8("\xE2\x82"), std::string(kBad) + kBad);
    EXPECT_EQ(toUtf8(std::string(1, '\0')), kBad);
}

TEST(Utf8, ReplacesWhatIsEncodedTooLongOrIsNoCharacter) {
    EXPECT_EQ(toUtf8("\xC0\xAF"), std::string(kBad) + kBad);
    EXPECT_EQ(toUtf8("\xE0\x9F\xBF"), std::string(kBad) + kBad + kBad);
    EXPECT_EQ(toUtf8("\xED\xA0\x80"), std::string(kBad) + kBad + kBad) << "half of a pair";
    EXPECT_EQ(toUtf8("\xF0\x8F\xBF\xBF"), std::string(kBad) + kBad + kBad + kBad);
    EXPECT_EQ(toUtf8("\xF4\x90\x80\x80"), std::string(kBad) + kBad + kBad + kBad);
    EXPECT_EQ(toUtf8("\xF5"), kBad);
}

} // namespace
