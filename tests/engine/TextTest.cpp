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
