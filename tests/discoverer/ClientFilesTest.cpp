// SPDX-License-Identifier: MIT
#include "discoverer/BlackPicture.h"
#include "discoverer/ClientFile.h"

#include <climits>
#include <clocale>
#include <cstdint>

#include <sys/stat.h>

#include <gmock/gmock.h>

#include "tests/support/TestFolder.h"

namespace {

class ClientFiles : public testing::Test {
protected:
    void write(std::string_view name, std::string_view bytes) {
        qns::writeClientFile(mFolder.widePath(name), bytes.data(), bytes.size());
    }

    bool writeBlack(int32_t width, int32_t height) {
        return qns::writeBlackPicture(mFolder.widePath("black"), width, height);
    }

    TestFolder mFolder;
};

} // namespace

TEST_F(ClientFiles, AreWrittenWholeAndReplaceWhatWasThere) {
    write("file", "a longer text");
    write("file", std::string_view("a\0b", 3));
    EXPECT_EQ(mFolder.contents("file"), std::string("a\0b", 3));
    write("file", "");
    EXPECT_TRUE(mFolder.has("file"));
    EXPECT_EQ(mFolder.contents("file"), "");
}

TEST_F(ClientFiles, MayHaveNamesOfAnyCharacters) {
    std::setlocale(LC_CTYPE, "C.UTF-8");
    qns::writeClientFile(mFolder.widePath("") + L"\u00fc %s \U0001F3B5", "x", 1);
    EXPECT_EQ(mFolder.contents("\xC3\xBC %s \xF0\x9F\x8E\xB5"), "x");
}

TEST_F(ClientFiles, ThatCannotBeWrittenAreLeftOut) {
    qns::writeClientFile(L"", "x", 1);
    qns::writeClientFile(mFolder.widePath("none/file"), "x", 1);
    qns::writeClientFile(mFolder.widePath(""), "x", 1);
    qns::writeClientFile(L"/dev/full", "x", 1);
    qns::writeClientFile(std::wstring(10000, L'n'), "x", 1);
    EXPECT_FALSE(mFolder.has("none"));
}

TEST_F(ClientFiles, NeverWaitForThePipesReader) {
    ASSERT_EQ(::mkfifo(mFolder.path("pipe").c_str(), 0600), 0);
    write("pipe", "x");
    EXPECT_TRUE(std::filesystem::is_fifo(mFolder.path("pipe")));
}

TEST_F(ClientFiles, BlackPicturesHaveFourBytesAPixel) {
    EXPECT_TRUE(writeBlack(4, 2));
    std::string expected;
    for (int pixel = 0; pixel < 8; ++pixel)
        expected += std::string("\0\0\0\xFF", 4);
    EXPECT_EQ(mFolder.contents("black"), expected);
}

TEST_F(ClientFiles, BlackPicturesWithoutPixelsAreEmpty) {
    for (const auto& [width, height] : {std::pair{0, 2}, {4, 0}, {0, 0}, {INT_MAX, 0}}) {
        write("black", "before");
        EXPECT_TRUE(writeBlack(width, height));
        EXPECT_TRUE(mFolder.has("black"));
        EXPECT_EQ(mFolder.contents("black"), "");
    }
}

TEST_F(ClientFiles, BlackPicturesOfNoPossibleSizeAreNotWritten) {
    for (const auto& [width, height] : {std::pair{-1, 1},
                                        {1, -1},
                                        {-4, -2},
                                        {0, -1},
                                        {INT_MIN, INT_MIN},
                                        {100000, 100000},
                                        {65536, 65536},
                                        {INT_MAX, INT_MAX},
                                        {INT_MAX, 1},
                                        {8192, 4097}}) {
        EXPECT_FALSE(writeBlack(width, height)) << width << " x " << height;
        EXPECT_FALSE(mFolder.has("black"));
    }
}

TEST_F(ClientFiles, BlackPicturesMayHaveTheWholeLimit) {
    static_assert(qns::kMaxBlackPixels == 8192L * 4096);
    EXPECT_TRUE(writeBlack(8192, 4096));
    EXPECT_EQ(std::filesystem::file_size(mFolder.path("black")), 8192U * 4096 * 4);
}
