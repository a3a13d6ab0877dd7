// SPDX-License-Identifier: MIT
#include "pack/PackedArguments.h"

#include "tests/pack/PackTestTools.h"

#include <gtest/gtest.h>
#include <utility>

namespace {

Bytes bytesOf(const PackedArguments& arguments) {
    return {arguments.data(), arguments.data() + arguments.size()};
}

} // namespace

TEST(PackedArguments, IsEmptyWithoutValues) {
    const PackedArguments arguments;
    EXPECT_EQ(arguments.size(), 0u);
}

TEST(PackedArguments, AllocatesOnceForAnOrdinaryBlock) {
    const CountedAllocation policy;
    PackedArguments arguments;
    arguments.int32(1).text(std::wstring(100, L'x')).uint64(2).uint64(3).int64(4);
    EXPECT_EQ(CountedAllocation::allocations(), 1);
}

TEST(PackedArguments, WithoutMemoryValuesAreLeftOut) {
    const CountedAllocation policy;
    CountedAllocation::fail(true);
    PackedArguments arguments;
    arguments.int32(1).text(L"text");
    EXPECT_EQ(arguments.size(), 0u);
}

TEST(PackedArguments, HoldsTheValuesInOrder) {
    PackedArguments arguments;
    arguments.int32(5).integer(-1).boolean(true).text(L"a").raw("xy", 2);
    arguments.int64(-2).uint64(3);
    EXPECT_EQ(bytesOf(arguments),
              (Bytes{0xD2, 0,   0,    0,    5,    0xFF, 0xC3, 0xA2, 'a',  0,    0xA2,
                     'x',  'y', 0xD3, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFE,
                     0xCF, 0,   0,    0,    0,    0,    0,    0,    3}));
}

TEST(PackedArguments, FreesItsMemory) {
    const CountedAllocation policy;
    {
        PackedArguments arguments;
        arguments.int32(1).int64(2);
    }
    EXPECT_GT(CountedAllocation::allocations(), 0);
    EXPECT_EQ(CountedAllocation::frees(), CountedAllocation::allocations());
}

TEST(PackedArguments, MovingHandsTheValuesOver) {
    PackedArguments first;
    first.integer(7);
    PackedArguments second(std::move(first));
    EXPECT_EQ(bytesOf(second), (Bytes{7}));
    PackedArguments third;
    third.integer(8);
    third = std::move(second);
    EXPECT_EQ(bytesOf(third), (Bytes{7}));
}
