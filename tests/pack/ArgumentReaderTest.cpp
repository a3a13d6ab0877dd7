// SPDX-License-Identifier: MIT
#include "pack/ArgumentReader.h"

#include "pack/PackedArguments.h"
#include "tests/pack/PackTestTools.h"

#include <gtest/gtest.h>
#include <random>

namespace {

enum SystemFormat : int {};

class Block {
public:
    explicit Block(const Bytes& bytes)
        : mBlock(bytes), mReader(mBlock.data(), static_cast<long>(mBlock.size())) {}

    template<class T>
    T next(T preset) {
        mReader.read(preset);
        return preset;
    }

private:
    ExactBlock mBlock;
    ArgumentReader mReader;
};

/** Reads one of each kind; what it gives is not of interest, only that it stays inside. */
void readMixedFields(const void* data, long size) {
    ArgumentReader reader(data, size);
    for (int round = 0; round < 4; ++round) {
        int number = -1;
        std::wstring text = L"preset";
        long position = 0;
        bool option = false;
        reader.read(number);
        reader.read(text);
        reader.read(position);
        reader.read(option);
    }
}

} // namespace

TEST(ArgumentReader, ReadsFieldsInOrder) {
    PackedArguments arguments;
    arguments.int32(7).integer(1).int64(-5'000'000'000).boolean(true).text(L"/m/\u97f3.mp3");
    ArgumentReader reader(arguments.data(), static_cast<long>(arguments.size()));
    int client = -1;
    SystemFormat format{};
    long position = 0;
    bool option = false;
    std::wstring text;
    reader.read(client);
    reader.read(format);
    reader.read(position);
    reader.read(option);
    reader.read(text);
    EXPECT_EQ(client, 7);
    EXPECT_EQ(format, 1);
    EXPECT_EQ(position, -5'000'000'000);
    EXPECT_TRUE(option);
    EXPECT_EQ(text, L"/m/\u97f3.mp3");
}

TEST(ArgumentReader, AnIntegerIsCutToTheFieldsWidth) {
    const Bytes wide{0xCF, 0, 0, 0, 1, 0, 0, 0, 2};
    EXPECT_EQ(Block(wide).next(-1), 2);
    EXPECT_EQ(Block(wide).next(-1L), 4294967298L);
    EXPECT_EQ(Block(wide).next(static_cast<SystemFormat>(9)), 2);
    EXPECT_EQ(Block({0xCD, 0x12, 0x34}).next(uint8_t{0}), 0x34);
    EXPECT_EQ(Block({0xFF}).next(0u), UINT32_MAX);
}

TEST(ArgumentReader, ATruthIsWhetherAnyBitIsSet) {
    EXPECT_FALSE(Block({0xC2}).next(true));
    EXPECT_TRUE(Block({0xC3}).next(false));
    EXPECT_FALSE(Block({0x00}).next(true));
    EXPECT_TRUE(Block({0xFF}).next(false));
    EXPECT_TRUE(Block({0xCF, 0, 0, 0, 1, 0, 0, 0, 0}).next(false));
}

TEST(ArgumentReader, AnUnknownTagGivesWhatWasDecodedLastAndStays) {
    Block first({0x91, 5});
    EXPECT_EQ(first.next(-1), 0);
    EXPECT_EQ(first.next(-1), 0);
    Block later({5, 0x91, 6});
    EXPECT_EQ(later.next(-1), 5);
    EXPECT_EQ(later.next(-1), 5);
    EXPECT_EQ(later.next(-1L), 5);
    EXPECT_EQ(later.next(std::wstring(L"preset")), L"preset");
}

TEST(ArgumentReader, AnUnknownTagAfterATextGivesTheTextAgain) {
    Block block({0xA3, 'a', 'b', 0, 0xC1});
    EXPECT_EQ(block.next(std::wstring()), L"ab");
    EXPECT_EQ(block.next(std::wstring()), L"ab");
    EXPECT_EQ(block.next(-1), 3);
}

TEST(ArgumentReader, NilKeepsTheValueBeforeIt) {
    Block block({5, 0xC0, 6});
    EXPECT_EQ(block.next(-1), 5);
    EXPECT_EQ(block.next(-1), 5);
    EXPECT_EQ(block.next(-1), 6);
}

TEST(ArgumentReader, WhatIsCutOffKeepsItsPresetAndSoDoesTheRest) {
    Block block({5, 0xD2, 0, 0});
    EXPECT_EQ(block.next(-1), 5);
    EXPECT_EQ(block.next(-1), -1);
    EXPECT_EQ(block.next(uint8_t{9}), 9);
    EXPECT_EQ(block.next(std::wstring(L"preset")), L"preset");
    EXPECT_TRUE(block.next(true));
}

TEST(ArgumentReader, ARawThatClaimsTooMuchKeepsThePreset) {
    Block block({0xDA, 0xFF, 0xFF, 'a', 0, 5});
    EXPECT_EQ(block.next(std::wstring(L"preset")), L"preset");
    EXPECT_EQ(block.next(-1), -1);
}

TEST(ArgumentReader, PastTheEndFieldsKeepTheirPresets) {
    Block block({5});
    EXPECT_EQ(block.next(-1), 5);
    EXPECT_EQ(block.next(-1), -1);
}

TEST(ArgumentReader, ATextTakesOnlyARaw) {
    Block block({5, 0xC3, 0xA2, 'a', 0});
    EXPECT_EQ(block.next(std::wstring(L"preset")), L"preset");
    EXPECT_EQ(block.next(std::wstring(L"preset")), L"preset");
    EXPECT_EQ(block.next(std::wstring(L"preset")), L"a");
}

TEST(ArgumentReader, ATextWithoutATerminatingZeroEndsWithItsRaw) {
    Block block({0xA2, 'a', 'b', 'c'});
    EXPECT_EQ(block.next(std::wstring()), L"ab");
    EXPECT_EQ(block.next(0), 'c');
}

TEST(ArgumentReader, NoDataIsAnEmptyBlock) {
    const uint8_t byte = 5;
    for (const ArgumentReader& empty :
         {ArgumentReader(nullptr, 8), ArgumentReader(&byte, 0), ArgumentReader(&byte, -1)}) {
        ArgumentReader reader = empty;
        int number = -1;
        reader.read(number);
        EXPECT_EQ(number, -1);
    }
}

TEST(ArgumentReader, StaysInsideEveryPrefixOfABlock) {
    PackedArguments arguments;
    arguments.int32(7).text(L"/media/\u97f3\u697d/a film.mp4").int64(1).boolean(true);
    const Bytes whole(arguments.data(), arguments.data() + arguments.size());
    for (std::size_t length = 0; length <= whole.size(); ++length) {
        const ExactBlock block({whole.begin(), whole.begin() + static_cast<long>(length)});
        readMixedFields(block.data(), static_cast<long>(block.size()));
    }
}

TEST(ArgumentReader, StaysInsideRandomBlocks) {
    std::mt19937 random(2);
    for (int round = 0; round < 20000; ++round) {
        Bytes bytes(random() % 64);
        for (uint8_t& byte : bytes)
            byte = static_cast<uint8_t>(random());
        const ExactBlock block(bytes);
        readMixedFields(block.data(), static_cast<long>(block.size()));
    }
}
