// SPDX-License-Identifier: MIT
#include "pack/CUnpack.h"

#include "tests/pack/PackTestTools.h"

#include <cstdlib>
#include <cstring>
#include <gtest/gtest.h>
#include <random>

namespace {

struct Decoded {
    uint32_t consumed;
    unpack_info_t info;
};

Decoded decode(const Bytes& bytes) {
    const ExactBlock block(bytes);
    Decoded decoded{0, {}};
    decoded.consumed = CUnpack().unpack(decoded.info, block.data(), block.size());
    return decoded;
}

void expectSigned(const Bytes& bytes, int64_t value) {
    const Decoded decoded = decode(bytes);
    EXPECT_EQ(decoded.consumed, bytes.size());
    EXPECT_EQ(decoded.info.type, UNPACK_SIGNED);
    EXPECT_EQ(decoded.info.value.signedInt, value);
}

void expectUnsigned(const Bytes& bytes, uint64_t value) {
    const Decoded decoded = decode(bytes);
    EXPECT_EQ(decoded.consumed, bytes.size());
    EXPECT_EQ(decoded.info.type, UNPACK_UNSIGNED);
    EXPECT_EQ(decoded.info.value.unsignedInt, value);
}

void expectUntouched(const Bytes& bytes) {
    const ExactBlock block(bytes);
    unpack_info_t info;
    std::memset(&info, 0x5A, sizeof info);
    const unpack_info_t before = info;
    EXPECT_EQ(CUnpack().unpack(info, block.data(), block.size()), 0u);
    EXPECT_EQ(std::memcmp(&info, &before, sizeof info), 0);
}

bool isUnknownTag(unsigned byte) {
    return (byte >= 0x80 && byte <= 0x9F) || byte == 0xC1 || (byte >= 0xC4 && byte <= 0xC9) ||
           (byte >= 0xD4 && byte <= 0xD9) || (byte >= 0xDC && byte <= 0xDF);
}

} // namespace

TEST(CUnpack, DecodesUnsignedNumbers) {
    expectUnsigned({0x00}, 0);
    expectUnsigned({0x7F}, 127);
    expectUnsigned({0xCC, 0xFF}, 255);
    expectUnsigned({0xCD, 0xFF, 0xFE}, 65534);
    expectUnsigned({0xCE, 0xFF, 0xFF, 0xFF, 0xFF}, 4294967295);
    expectUnsigned({0xCF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFE}, UINT64_MAX - 1);
}

TEST(CUnpack, DecodesSignedNumbersWithTheirSign) {
    expectSigned({0xFF}, -1);
    expectSigned({0xE0}, -32);
    expectSigned({0xD0, 0x80}, -128);
    expectSigned({0xD0, 0x7F}, 127);
    expectSigned({0xD1, 0x80, 0x00}, -32768);
    expectSigned({0xD2, 0xFF, 0xFF, 0xFF, 0xFE}, -2);
    expectSigned({0xD3, 0x80, 0, 0, 0, 0, 0, 0, 0}, INT64_MIN);
}

TEST(CUnpack, DecodesTruth) {
    EXPECT_EQ(decode({0xC2}).info.type, UNPACK_BOOLEAN);
    EXPECT_EQ(decode({0xC2}).info.value.boolean, 0u);
    EXPECT_EQ(decode({0xC3}).info.value.boolean, 1u);
    EXPECT_EQ(decode({0xC3}).consumed, 1u);
}

TEST(CUnpack, NilSetsOnlyTheType) {
    unpack_info_t info{};
    info.type = UNPACK_SIGNED;
    info.value.signedInt = -7;
    const uint8_t nil = 0xC0;
    EXPECT_EQ(CUnpack().unpack(info, &nil, 1), 1u);
    EXPECT_EQ(info.type, UNPACK_NIL);
    EXPECT_EQ(info.value.signedInt, -7);
}

TEST(CUnpack, DecodesFloatingPointAsBitPatterns) {
    unpack_info_t info{};
    info.value.unsignedInt = UINT64_MAX;
    const Bytes single{0xCA, 0x3F, 0x80, 0, 0};
    EXPECT_EQ(CUnpack().unpack(info, single.data(), single.size()), 5u);
    EXPECT_EQ(info.type, UNPACK_FLOAT);
    EXPECT_EQ(info.value.floatBits, 0x3F800000u);
    EXPECT_EQ(info.value.unsignedInt, 0x3F800000u);
    const Decoded wide = decode({0xCB, 0x3F, 0xF0, 0, 0, 0, 0, 0, 1});
    EXPECT_EQ(wide.info.type, UNPACK_DOUBLE);
    EXPECT_EQ(wide.info.value.doubleBits, 0x3FF0000000000001u);
    EXPECT_EQ(wide.consumed, 9u);
}

TEST(CUnpack, ARawPointsIntoThePacket) {
    for (const Bytes& header : {Bytes{0xA3}, Bytes{0xDA, 0, 3}, Bytes{0xDB, 0, 0, 0, 3}}) {
        const ExactBlock block(joined({header, {'a', 'b', 0}}));
        unpack_info_t info{};
        EXPECT_EQ(CUnpack().unpack(info, block.data(), block.size()), block.size());
        EXPECT_EQ(info.type, UNPACK_RAW);
        EXPECT_EQ(info.value.rawLength, 3u);
        EXPECT_EQ(info.ptr, block.data() + header.size());
    }
}

TEST(CUnpack, AnEmptyStringIsARawOfOneByte) {
    const Bytes bytes{0xA1, 0x00};
    unpack_info_t info{};
    EXPECT_EQ(CUnpack().unpack(info, bytes.data()), 2u);
    EXPECT_EQ(info.type, UNPACK_RAW);
    EXPECT_EQ(info.value.rawLength, 1u);
    EXPECT_EQ(s2ws(info.ptr, info.value.rawLength), L"");
}

TEST(CUnpack, AnUnknownTagConsumesNothing) {
    for (unsigned byte = 0; byte < 256; ++byte) {
        const Bytes bytes = joined({{static_cast<uint8_t>(byte)}, Bytes(40, 0)});
        if (isUnknownTag(byte)) {
            expectUntouched(bytes);
            const CUnpack::Header header = CUnpack().unpack_base(bytes.data());
            EXPECT_EQ(header.length, 0u);
            EXPECT_EQ(header.tag, byte);
            EXPECT_EQ(header.value, 0u);
        } else {
            EXPECT_NE(decode(bytes).consumed, 0u) << byte;
        }
    }
}

TEST(CUnpack, TheHeaderTellsItsLengthTagAndValue) {
    const auto expect = [](const Bytes& bytes, uint32_t length, uint8_t tag, uint64_t value) {
        const CUnpack::Header header = CUnpack().unpack_base(bytes.data());
        EXPECT_EQ(header.length, length);
        EXPECT_EQ(header.tag, tag);
        EXPECT_EQ(header.value, value);
    };
    expect({0x05}, 1, 0x00, 5);
    expect({0xE5}, 1, 0xE0, 0xE5);
    expect({0xB5}, 1, 0xA0, 0x15);
    expect({0xC0}, 1, 0xC0, 0);
    expect({0xC3}, 1, 0xC3, 0);
    expect({0xD0, 0x80}, 2, 0xD0, 0x80);
    expect({0xD1, 0x80, 0x01}, 3, 0xD1, 0x8001);
    expect({0xDA, 0x12, 0x34}, 3, 0xDA, 0x1234);
    expect({0xDB, 0x12, 0x34, 0x56, 0x78}, 5, 0xDB, 0x12345678);
    expect({0xCA, 0x12, 0x34, 0x56, 0x78}, 5, 0xCA, 0x12345678);
    expect({0xD3, 1, 2, 3, 4, 5, 6, 7, 8}, 9, 0xD3, 0x0102030405060708);
}

TEST(CUnpack, AHeaderThatIsCutOffStillTellsTheLengthItNeeds) {
    const Bytes bytes{0xD3, 1, 2, 3, 4, 5, 6, 7};
    const ExactBlock block(bytes);
    const CUnpack::Header header = CUnpack().unpack_base(block.data(), block.size());
    EXPECT_EQ(header.length, 9u);
    EXPECT_EQ(header.tag, 0xD3);
    EXPECT_EQ(header.value, 0u);
    EXPECT_EQ(CUnpack().unpack_base(nullptr, 0).length, 0u);
}

TEST(CUnpack, EveryPrefixOfEveryValueIsLeftAlone) {
    for (unsigned byte = 0; byte < 256; ++byte) {
        const Bytes room = joined({{static_cast<uint8_t>(byte)}, {0, 0, 0, 40}, Bytes(60, 0)});
        const uint32_t whole = decode(room).consumed;
        for (uint32_t length = 0; length < whole; ++length)
            expectUntouched({room.begin(), room.begin() + length});
    }
}

TEST(CUnpack, ARawThatClaimsMoreThanThereIsIsLeftAlone) {
    expectUntouched({0xBF, 1, 2, 3});
    expectUntouched({0xDA, 0xFF, 0xFF, 1, 2, 3});
    expectUntouched({0xDB, 0xFF, 0xFF, 0xFF, 0xFF, 1, 2, 3});
}

// The sum of header and contents would wrap around to 4.
TEST(CUnpack, ARawThatIsLongerThanTheCountCanSayIsLeftAlone) {
    const Bytes bytes{0xDB, 0xFF, 0xFF, 0xFF, 0xFF};
    unpack_info_t info{};
    EXPECT_EQ(CUnpack().unpack(info, bytes.data(), SIZE_MAX), 0u);
    EXPECT_EQ(info.type, UNPACK_NIL);
}

TEST(CUnpack, RandomBytesNeverReadPastTheirEnd) {
    std::mt19937 random(1);
    for (int round = 0; round < 20000; ++round) {
        Bytes bytes(random() % 24);
        for (uint8_t& byte : bytes)
            byte = static_cast<uint8_t>(random());
        const ExactBlock block(bytes);
        unpack_info_t info{};
        const uint32_t consumed = CUnpack().unpack(info, block.data(), block.size());
        ASSERT_LE(consumed, block.size());
        if (consumed != 0 && info.type == UNPACK_RAW) {
            ASSERT_EQ(info.ptr + info.value.rawLength, block.data() + consumed);
            s2ws(info.ptr, info.value.rawLength);
        }
    }
}

TEST(S2ws, MakesWideTextUpToTheFirstZero) {
    EXPECT_EQ(s2ws("ab\0cd", 5), L"ab");
    EXPECT_EQ(s2ws("\xE9\x9F\xB3\0", 4), L"\u97f3");
    EXPECT_EQ(s2ws("abcd", 2), L"ab");
    EXPECT_EQ(s2ws(nullptr, 5), L"");
    EXPECT_EQ(s2ws("", 0), L"");
}

TEST(S2ws, EndsWhereAByteDoesNotConvert) {
    EXPECT_EQ(s2ws("ab\xFF"
                   "cd",
                   5),
              L"ab");
    EXPECT_EQ(s2ws("\xE9\x9F", 2), L"");
}
