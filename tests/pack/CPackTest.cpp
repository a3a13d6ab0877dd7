// SPDX-License-Identifier: MIT
#include "pack/CPack.h"

#include "tests/pack/PackTestTools.h"

#include <array>
#include <cmath>
#include <gtest/gtest.h>

namespace {

/** What one operation of CPack writes; the room after it must stay untouched. */
template<class Operation, class... Arguments>
Bytes written(Operation operation, Arguments... arguments) {
    std::array<uint8_t, 80> room;
    room.fill(0x5A);
    CPack pack;
    const uint32_t count = (pack.*operation)(room.data(), arguments...);
    for (std::size_t i = count; i < room.size(); ++i)
        EXPECT_EQ(room[i], 0x5A);
    return {room.begin(), room.begin() + count};
}

} // namespace

TEST(CPack, NilAndTruthAreOneByte) {
    EXPECT_EQ(written(&CPack::pack_nil), (Bytes{0xC0}));
    EXPECT_EQ(written(&CPack::pack_bool, false), (Bytes{0xC2}));
    EXPECT_EQ(written(&CPack::pack_bool, true), (Bytes{0xC3}));
}

TEST(CPack, FloatingPointIsItsBitPatternBigEndian) {
    EXPECT_EQ(written(&CPack::pack_float, 1.0f), (Bytes{0xCA, 0x3F, 0x80, 0, 0}));
    EXPECT_EQ(written(&CPack::pack_float, -0.0f), (Bytes{0xCA, 0x80, 0, 0, 0}));
    EXPECT_EQ(written(&CPack::pack_double, 1.0), (Bytes{0xCB, 0x3F, 0xF0, 0, 0, 0, 0, 0, 0}));
    EXPECT_EQ(written(&CPack::pack_double, -HUGE_VAL), (Bytes{0xCB, 0xFF, 0xF0, 0, 0, 0, 0, 0, 0}));
}

TEST(CPack, FixedWidthsKeepTheirTagWhateverTheValue) {
    EXPECT_EQ(written(&CPack::pack_uint8, uint8_t{5}), (Bytes{0xCC, 5}));
    EXPECT_EQ(written(&CPack::pack_uint16, uint16_t{0x1234}), (Bytes{0xCD, 0x12, 0x34}));
    EXPECT_EQ(written(&CPack::pack_uint32, 0x12345678u), (Bytes{0xCE, 0x12, 0x34, 0x56, 0x78}));
    EXPECT_EQ(written(&CPack::pack_uint64, uint64_t{0x123456789ABCDEF0}),
              (Bytes{0xCF, 0x12, 0x34, 0x56, 0x78, 0x9A, 0xBC, 0xDE, 0xF0}));
    EXPECT_EQ(written(&CPack::pack_int8, int8_t{-2}), (Bytes{0xD0, 0xFE}));
    EXPECT_EQ(written(&CPack::pack_int16, int16_t{-2}), (Bytes{0xD1, 0xFF, 0xFE}));
    EXPECT_EQ(written(&CPack::pack_int32, 5), (Bytes{0xD2, 0, 0, 0, 5}));
    EXPECT_EQ(written(&CPack::pack_int32, -2), (Bytes{0xD2, 0xFF, 0xFF, 0xFF, 0xFE}));
    EXPECT_EQ(written(&CPack::pack_int64, int64_t{-2}),
              (Bytes{0xD3, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFE}));
}

TEST(CPack, FixedNumbersAreTheByteItself) {
    EXPECT_EQ(written(&CPack::pack_fixuint, uint8_t{0}), (Bytes{0x00}));
    EXPECT_EQ(written(&CPack::pack_fixuint, uint8_t{127}), (Bytes{0x7F}));
    EXPECT_EQ(written(&CPack::pack_fixint, int8_t{-1}), (Bytes{0xFF}));
    EXPECT_EQ(written(&CPack::pack_fixint, int8_t{-32}), (Bytes{0xE0}));
}

// The byte is not masked, which only shows outside the range that the operation is for.
TEST(CPack, AFixedNegativeNumberIsOredWithItsTag) {
    EXPECT_EQ(written(&CPack::pack_fixint, int8_t{1}), (Bytes{0xA1}));
}

TEST(CPack, UnsignedNumbersTakeTheSmallestForm) {
    const auto form = [](uint32_t value) { return written(&CPack::pack_uint, value); };
    EXPECT_EQ(form(0), (Bytes{0x00}));
    EXPECT_EQ(form(127), (Bytes{0x7F}));
    EXPECT_EQ(form(128), (Bytes{0xCC, 0x80}));
    EXPECT_EQ(form(255), (Bytes{0xCC, 0xFF}));
    EXPECT_EQ(form(256), (Bytes{0xCD, 0x01, 0x00}));
    EXPECT_EQ(form(65535), (Bytes{0xCD, 0xFF, 0xFF}));
    EXPECT_EQ(form(65536), (Bytes{0xCE, 0x00, 0x01, 0x00, 0x00}));
    EXPECT_EQ(form(UINT32_MAX), (Bytes{0xCE, 0xFF, 0xFF, 0xFF, 0xFF}));
}

TEST(CPack, SignedNumbersTakeTheSmallestForm) {
    const auto form = [](int32_t value) { return written(&CPack::pack_int, value); };
    EXPECT_EQ(form(127), (Bytes{0x7F}));
    EXPECT_EQ(form(200), (Bytes{0xCC, 0xC8}));
    EXPECT_EQ(form(-1), (Bytes{0xFF}));
    EXPECT_EQ(form(-32), (Bytes{0xE0}));
    EXPECT_EQ(form(-33), (Bytes{0xD0, 0xDF}));
    EXPECT_EQ(form(-128), (Bytes{0xD0, 0x80}));
    EXPECT_EQ(form(-129), (Bytes{0xD1, 0xFF, 0x7F}));
    EXPECT_EQ(form(-32768), (Bytes{0xD1, 0x80, 0x00}));
    EXPECT_EQ(form(-32769), (Bytes{0xD2, 0xFF, 0xFF, 0x7F, 0xFF}));
    EXPECT_EQ(form(INT32_MAX), (Bytes{0xCE, 0x7F, 0xFF, 0xFF, 0xFF}));
    EXPECT_EQ(form(INT32_MIN), (Bytes{0xD2, 0x80, 0x00, 0x00, 0x00}));
}

TEST(CPack, ARawHeaderHoldsTheLengthInItsSmallestForm) {
    const auto header = [](uint64_t length) { return written(&CPack::pack_raw_header, length); };
    EXPECT_EQ(header(0), (Bytes{0xA0}));
    EXPECT_EQ(header(31), (Bytes{0xBF}));
    EXPECT_EQ(header(32), (Bytes{0xDA, 0x00, 0x20}));
    EXPECT_EQ(header(65535), (Bytes{0xDA, 0xFF, 0xFF}));
    EXPECT_EQ(header(65536), (Bytes{0xDB, 0x00, 0x01, 0x00, 0x00}));
    EXPECT_EQ(header(UINT32_MAX), (Bytes{0xDB, 0xFF, 0xFF, 0xFF, 0xFF}));
    EXPECT_EQ(header(uint64_t{UINT32_MAX} + 1), Bytes{});
}

TEST(CPack, ARawIsItsHeaderAndItsBytes) {
    const void* const bytes = "abc";
    EXPECT_EQ(written(&CPack::pack_raw, bytes, uint64_t{3}), (Bytes{0xA3, 'a', 'b', 'c'}));
    EXPECT_EQ(written(&CPack::pack_raw, static_cast<const void*>(nullptr), uint64_t{0}),
              (Bytes{0xA0}));
}

TEST(CPack, ArrayAndMapHeadersAreNotWritten) {
    EXPECT_EQ(written(&CPack::pack_array_header, 5u), Bytes{});
    EXPECT_EQ(written(&CPack::pack_map_header, 5u), Bytes{});
}
