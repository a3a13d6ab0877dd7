// SPDX-License-Identifier: MIT
#include "text/Text.h"

#include <cstdlib>
#include <gtest/gtest.h>

namespace {

/** The environment's character set, until the test ends. */
class Charset {
public:
    explicit Charset(const char* locale) : mPrevious(std::getenv("LC_ALL")) {
        setenv("LC_ALL", locale, 1);
    }
    ~Charset() { setenv("LC_ALL", mPrevious.c_str(), 1); }
    Charset(const Charset&) = delete;
    Charset& operator=(const Charset&) = delete;

private:
    std::string mPrevious;
};

} // namespace

TEST(Text, IsInTheEnvironmentsCharacterSet) {
    const Charset charset("C.UTF-8");
    EXPECT_EQ(engine::toBytes(L"/a b/\u00e9\u20ac\U0001f600%#.mp4"),
              "/a b/\xc3\xa9\xe2\x82\xac\xf0\x9f\x98\x80%#.mp4");
}

TEST(Text, IsUtf8WhereTheCharacterSetLacksACharacter) {
    const Charset charset("C");
    EXPECT_EQ(engine::toBytes(L"/plain.mp4"), "/plain.mp4");
    EXPECT_EQ(engine::toBytes(L"\u00e9\u20ac\U0001f600"), "\xc3\xa9\xe2\x82\xac\xf0\x9f\x98\x80");
}

TEST(Text, ComesBackFromTheEnvironmentsCharacterSet) {
    const Charset charset("C.UTF-8");
    EXPECT_EQ(engine::toWide("/a b/\xc3\xa9\xe2\x82\xac\xf0\x9f\x98\x80%#.mp4"),
              L"/a b/\u00e9\u20ac\U0001f600%#.mp4");
    EXPECT_EQ(engine::toWide(std::string_view("a\0b", 3)), std::wstring_view(L"a\0b", 3));
}

TEST(Text, ComesBackFromUtf8WhereTheCharacterSetLacksACharacter) {
    const Charset charset("C");
    EXPECT_EQ(engine::toWide("\xc3\xa9\xe2\x82\xac\xf0\x9f\x98\x80."), L"\u00e9\u20ac\U0001f600.");
}

TEST(Text, HasAMarkWhereBytesAreNoCharacter) {
    const Charset charset("C.UTF-8");
    for (const char* const bytes : {"a\xff", "a\xc3", "a\xc0\x80", "a\xe0\x80\x80", "a\xed\xa0\x80",
                                    "a\xf4\x90\x80\x80", "a\xf8", "a\xe2\x82"}) {
        const std::wstring text = engine::toWide(bytes);
        EXPECT_EQ(text.substr(0, 2), L"a\ufffd") << text.size();
    }
    EXPECT_EQ(engine::toWide("\xe2\x82z"), L"\ufffdz");
}

TEST(Text, IsUtf8ForOthersWhateverTheEnvironmentSays) {
    const Charset charset("C");
    EXPECT_EQ(engine::toUtf8(L"\u00e9\u20ac\U0001f600"), "\xc3\xa9\xe2\x82\xac\xf0\x9f\x98\x80");
}
