// SPDX-License-Identifier: MIT
#include "ptc/EventQueue.h"

#include <gtest/gtest.h>

using PTC::Event;
using PTC::EventQueue;

namespace {

Event* numbered(long method) {
    return new Event(0, method, nullptr, 0, true, false);
}

} // namespace

TEST(Event, TakesItsFlagsAndSizeInTheOrderOfTheConstructor) {
    char block[3] = {};
    const Event event(1, 2, block, 3, true, false);
    EXPECT_EQ(event.objectId, 1);
    EXPECT_EQ(event.methodId, 2);
    EXPECT_EQ(event.data, block);
    EXPECT_EQ(event.size, 3);
    EXPECT_TRUE(event.isRemote);
    EXPECT_FALSE(event.isCallback);
}

TEST(EventQueue, KeepsEventsInOrderOfArrival) {
    EventQueue queue;
    EXPECT_EQ(queue.count(), 0u);
    for (long method = 0; method < 3; ++method)
        queue.add(numbered(method));
    ASSERT_EQ(queue.count(), 3u);
    EXPECT_GE(queue.capacity(), 3u);
    for (long method = 0; method < 3; ++method)
        EXPECT_EQ(queue.at(static_cast<unsigned long>(method))->methodId, method);
}

TEST(EventQueue, HasNothingAtItsCount) {
    EventQueue queue;
    EXPECT_EQ(queue.at(0), nullptr);
    queue.add(numbered(1));
    EXPECT_EQ(queue.at(1), nullptr);
    EXPECT_EQ(queue.at(~0ul), nullptr);
}

TEST(EventQueue, RemovingClosesTheGap) {
    EventQueue queue;
    for (long method = 0; method < 4; ++method)
        queue.add(numbered(method));
    queue.remove(1);
    ASSERT_EQ(queue.count(), 3u);
    EXPECT_EQ(queue.at(0)->methodId, 0);
    EXPECT_EQ(queue.at(1)->methodId, 2);
    EXPECT_EQ(queue.at(2)->methodId, 3);
}

TEST(EventQueue, RemovingAtItsCountChangesNothing) {
    EventQueue queue;
    queue.remove(0);
    queue.add(numbered(7));
    queue.remove(1);
    ASSERT_EQ(queue.count(), 1u);
    EXPECT_EQ(queue.at(0)->methodId, 7);
}

TEST(EventQueue, LeavesTheArgumentBlocksAlone) {
    char block[] = "block";
    {
        EventQueue queue;
        queue.add(new Event(0, 1, block, 5, true, false));
        queue.add(new Event(0, 2, block, 5, true, false));
        queue.remove(0);
    }
    EXPECT_STREQ(block, "block");
}
