// SPDX-License-Identifier: MIT
#include "pack/CSimpleBuffer.h"

#include "tests/pack/PackTestTools.h"

#include <array>
#include <cstring>
#include <gtest/gtest.h>

namespace {

void expectEmpty(simplebuffer* buffer) {
    EXPECT_EQ(buffer->size, 0u);
    EXPECT_EQ(buffer->data, nullptr);
    EXPECT_EQ(buffer->alloc, 0u);
}

} // namespace

TEST(CSimpleBuffer, TheRecordIsThreeWords) {
    EXPECT_EQ(sizeof(simplebuffer), 24u);
    EXPECT_EQ(offsetof(simplebuffer, size), 0u);
    EXPECT_EQ(offsetof(simplebuffer, data), 8u);
    EXPECT_EQ(offsetof(simplebuffer, alloc), 16u);
}

TEST(CSimpleBuffer, GrowsByTheRequestAgainOrByTheUnit) {
    const CountedAllocation policy;
    Buffer buffer;
    CSimpleBuffer operations;
    const uint8_t* room = operations.simplebuffer_checksize(buffer.get(), 1);
    EXPECT_EQ(room, buffer->data);
    EXPECT_EQ(buffer->alloc, 5u);
    room = operations.simplebuffer_checksize(buffer.get(), 5);
    EXPECT_EQ(room, buffer->data + 1);
    EXPECT_EQ(buffer->alloc, 11u);
    EXPECT_EQ(buffer->size, 6u);
    EXPECT_EQ(CountedAllocation::allocations(), 2);
    EXPECT_EQ(CountedAllocation::frees(), 1);
}

TEST(CSimpleBuffer, UsesTheRoomItHasBeforeItGrows) {
    const CountedAllocation policy;
    Buffer buffer;
    CSimpleBuffer operations;
    operations.simplebuffer_checksize(buffer.get(), 1);
    uint8_t* const data = buffer->data;
    EXPECT_EQ(operations.simplebuffer_checksize(buffer.get(), 4), data + 1);
    EXPECT_EQ(CountedAllocation::allocations(), 1);
}

TEST(CSimpleBuffer, ACountOfZeroOnAnEmptyBufferAllocatesNothing) {
    const CountedAllocation policy;
    Buffer buffer;
    EXPECT_EQ(CSimpleBuffer().simplebuffer_checksize(buffer.get(), 0), nullptr);
    EXPECT_EQ(CountedAllocation::allocations(), 0);
    expectEmpty(buffer.get());
}

TEST(CSimpleBuffer, WritingAppendsTheBytes) {
    Buffer buffer;
    CSimpleBuffer operations;
    EXPECT_EQ(operations.simplebuffer_write(buffer.get(), "abc", 3), 1);
    EXPECT_EQ(operations.simplebuffer_write(buffer.get(), "defghijkl", 9), 1);
    EXPECT_EQ(buffer.bytes(), bytesOf("abcdefghijkl"));
    EXPECT_EQ(operations.simplebuffer_write(buffer.get(), nullptr, 0), 1);
    EXPECT_EQ(buffer->size, 12u);
}

TEST(CSimpleBuffer, BorrowedMemoryIsCopiedOnTheFirstWriteAndNeverFreed) {
    const CountedAllocation policy;
    std::array<uint8_t, 3> foreign{1, 2, 3};
    Buffer buffer;
    CSimpleBuffer operations;
    operations.simplebuffer_init(buffer.get(), foreign.data(), foreign.size());
    EXPECT_EQ(buffer->alloc, 0u);
    EXPECT_EQ(buffer->data, foreign.data());
    EXPECT_EQ(operations.simplebuffer_write(buffer.get(), "\4", 1), 1);
    EXPECT_NE(buffer->data, foreign.data());
    EXPECT_EQ(buffer.bytes(), (Bytes{1, 2, 3, 4}));
    EXPECT_EQ(buffer->alloc, 8u);
    EXPECT_EQ(CountedAllocation::frees(), 0);
}

TEST(CSimpleBuffer, DestroyingABorrowingBufferOnlyResetsIt) {
    const CountedAllocation policy;
    std::array<uint8_t, 3> foreign{1, 2, 3};
    simplebuffer buffer;
    CSimpleBuffer operations;
    operations.simplebuffer_init(&buffer, foreign.data(), foreign.size());
    operations.simplebuffer_destroy(&buffer);
    EXPECT_EQ(CountedAllocation::frees(), 0);
    expectEmpty(&buffer);
}

TEST(CSimpleBuffer, DestroyingFreesOwnedMemoryOnce) {
    const CountedAllocation policy;
    Buffer buffer;
    CSimpleBuffer operations;
    operations.simplebuffer_write(buffer.get(), "abc", 3);
    operations.simplebuffer_destroy(buffer.get());
    operations.simplebuffer_destroy(buffer.get());
    EXPECT_EQ(CountedAllocation::frees(), 1);
    expectEmpty(buffer.get());
}

TEST(CSimpleBuffer, ReleaseHandsTheMemoryOver) {
    const CountedAllocation policy;
    Buffer buffer;
    CSimpleBuffer operations;
    operations.simplebuffer_write(buffer.get(), "abc", 4);
    uint8_t* const data = operations.simplebuffer_release(buffer.get());
    EXPECT_STREQ(reinterpret_cast<const char*>(data), "abc");
    expectEmpty(buffer.get());
    operations.simplebuffer_destroy(buffer.get());
    EXPECT_EQ(CountedAllocation::frees(), 0);
    std::free(data);
}

TEST(CSimpleBuffer, WithoutMemoryNothingChanges) {
    const CountedAllocation policy;
    Buffer buffer;
    CSimpleBuffer operations;
    operations.simplebuffer_write(buffer.get(), "abc", 3);
    const simplebuffer before = *buffer.get();
    CountedAllocation::fail(true);
    EXPECT_EQ(operations.simplebuffer_checksize(buffer.get(), 100), nullptr);
    EXPECT_EQ(operations.simplebuffer_write(buffer.get(), "abcdefgh", 8), 0);
    EXPECT_EQ(std::memcmp(&before, buffer.get(), sizeof before), 0);
    EXPECT_EQ(buffer.bytes(), bytesOf("abc"));
}

TEST(CSimpleBuffer, ASizeThatWouldWrapFails) {
    const CountedAllocation policy;
    Buffer buffer;
    CSimpleBuffer operations;
    operations.simplebuffer_write(buffer.get(), "abc", 3);
    for (const uint64_t count : {UINT64_MAX, UINT64_MAX - 2, UINT64_MAX - 3, UINT64_MAX / 2 + 1})
        EXPECT_EQ(operations.simplebuffer_checksize(buffer.get(), count), nullptr) << count;
    EXPECT_EQ(CountedAllocation::allocations(), 1);
    EXPECT_EQ(buffer.bytes(), bytesOf("abc"));
}
