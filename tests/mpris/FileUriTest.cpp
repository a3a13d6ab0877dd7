// SPDX-License-Identifier: MIT
#include "mpris/FileUri.h"

#include <gtest/gtest.h>

using mpris::filePath;
using mpris::fileUri;
using mpris::isFileUri;
using mpris::isUri;

namespace {

TEST(FileUri, EncodesAllButPlainLetters) {
    EXPECT_EQ(fileUri("/a-Z_0.~/b"), "file:///a-Z_0.~/b");
    EXPECT_EQ(fileUri("/a b%#?\xC3\xBC"), "file:///a%20b%25%23%3F%C3%BC");
    EXPECT_EQ(fileUri("/\xFF\n"), "file:///%FF%0A");
}

TEST(FileUri, IsReadBackAsThePathThatItWasMadeOf) {
    std::string path = "/";
    for (int byte = 1; byte < 256; ++byte)
        path += static_cast<char>(byte);
    EXPECT_EQ(filePath(fileUri(path)), path);
}

TEST(FileUri, MayHaveNoHostOrThisOne) {
    EXPECT_EQ(filePath("file:/a"), "/a");
    EXPECT_EQ(filePath("file:///a"), "/a");
    EXPECT_EQ(filePath("FILE://localhost/a%20b"), "/a b");
}

TEST(FileUri, NamesNoFileOfAnotherHost) {
    EXPECT_EQ(filePath("file://elsewhere/a"), std::nullopt);
}

TEST(FileUri, NamesNoFileWhenItIsMalformed) {
    for (const char* const uri : {"file:", "file://", "file://localhost", "file:a", "file:///a%",
                                  "file:///a%2", "file:///a%zz", "file:///a%2z", "file:///a%00"})
        EXPECT_EQ(filePath(uri), std::nullopt) << uri;
}

TEST(FileUri, IsToldFromOtherTexts) {
    EXPECT_TRUE(isFileUri("file:anything"));
    EXPECT_FALSE(isFileUri("http://host/file:"));
    EXPECT_FALSE(isFileUri("fil"));
    EXPECT_EQ(filePath("http://host/a"), std::nullopt);
    EXPECT_EQ(filePath("/a"), std::nullopt);
}

TEST(Uri, HasASchemeAndAPlace) {
    EXPECT_TRUE(isUri("http://host/a"));
    EXPECT_TRUE(isUri("x-1.y+z://"));
    EXPECT_FALSE(isUri("/a://b"));
    EXPECT_FALSE(isUri("://b"));
    EXPECT_FALSE(isUri("mailto:a"));
    EXPECT_FALSE(isUri(""));
}

} // namespace
