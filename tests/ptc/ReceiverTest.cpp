// SPDX-License-Identifier: MIT
#include "ptc/Receiver.h"

#include "tests/ptc/TestAdapter.h"

#include <gtest/gtest.h>

#include <stdexcept>

using PTC::Receiver;

TEST(Receiver, HasTheIdThatItWasGiven) {
    EXPECT_EQ(Receiver(-5).getId(), -5);
}

TEST(Receiver, HandsAnEventToTheAdapterOfItsObject) {
    Receiver receiver(8);
    auto* const first = new TestAdapter(1);
    auto* const second = new TestAdapter(2);
    receiver.addAdapter(first);
    receiver.addAdapter(second);
    receiver.recv(makeEvent(2, 1).release());
    EXPECT_EQ(first->calls, 0);
    EXPECT_EQ(second->calls, 1);
}

// A leak or a second free is for the sanitizers to find.
TEST(Receiver, DropsAndFreesAnEventForAnUnknownObject) {
    Receiver receiver(8);
    auto* const adapter = new TestAdapter(1);
    auto* const callback = new TestAdapter(2);
    receiver.addAdapter(adapter);
    receiver.addCBAdapter(callback);
    receiver.recv(makeEvent(2, 1).release());
    receiver.recv(makeEvent(1, 1, true).release());
    EXPECT_EQ(adapter->calls, 0);
    EXPECT_EQ(callback->calls, 0);
}

TEST(Receiver, TellsTheTwoTablesApartByTheCallbackFlag) {
    Receiver receiver(8);
    auto* const adapter = new TestAdapter(1);
    auto* const callback = new TestAdapter(1);
    receiver.addAdapter(adapter);
    receiver.addCBAdapter(callback);
    receiver.recv(makeEvent(1, 1, true).release());
    EXPECT_EQ(adapter->calls, 0);
    EXPECT_EQ(callback->calls, 1);
    receiver.recv(makeEvent(1, 1, false).release());
    EXPECT_EQ(adapter->calls, 1);
    EXPECT_EQ(callback->calls, 1);
}

TEST(Receiver, KeepsTheFirstAdapterOfAnId) {
    Receiver receiver(8);
    auto* const kept = new TestAdapter(1);
    auto* const keptCallback = new TestAdapter(1);
    TestAdapter late(1);
    receiver.addAdapter(kept);
    receiver.addAdapter(&late);
    receiver.addCBAdapter(keptCallback);
    receiver.addCBAdapter(&late);
    receiver.recv(makeEvent(1, 1).release());
    receiver.recv(makeEvent(1, 1, true).release());
    EXPECT_EQ(kept->calls, 1);
    EXPECT_EQ(keptCallback->calls, 1);
    EXPECT_EQ(late.calls, 0);
}

TEST(Receiver, DeletesARemovedCallbackAdapterAtOnce) {
    Receiver receiver(8);
    auto* const adapter = new TestAdapter(1);
    auto* const callback = new TestAdapter(1);
    bool deleted = false;
    callback->onDestroyed = [&deleted] { deleted = true; };
    receiver.addAdapter(adapter);
    receiver.addCBAdapter(callback);
    receiver.removeCBAdapter(2);
    EXPECT_FALSE(deleted);
    receiver.removeCBAdapter(1);
    EXPECT_TRUE(deleted);
    receiver.removeCBAdapter(1);
    receiver.recv(makeEvent(1, 1).release());
    EXPECT_EQ(adapter->calls, 1);
}

TEST(Receiver, DeletesTheAdaptersOfBothTables) {
    int deleted = 0;
    {
        Receiver receiver(8);
        for (auto* adapter : {new TestAdapter(1), new TestAdapter(2)}) {
            adapter->onDestroyed = [&deleted] { ++deleted; };
            adapter->getId() == 1 ? receiver.addAdapter(adapter) : receiver.addCBAdapter(adapter);
        }
    }
    EXPECT_EQ(deleted, 2);
}

TEST(Receiver, IgnoresAnEventThatIsNotThere) {
    Receiver receiver(8);
    receiver.recv(nullptr);
    receiver.handleEvent(nullptr);
}

TEST(Receiver, RoutesThroughAnOverriddenHandler) {
    struct Rerouting : Receiver {
        using Receiver::Receiver;
        void handleEvent(PTC::Event* event) override { lastMethod = event->methodId; }
        long lastMethod = 0;
    } receiver(8);
    receiver.recv(makeEvent(1, 42).release());
    EXPECT_EQ(receiver.lastMethod, 42);
}

TEST(Receiver, FreesTheEventOfAnAdapterThatThrows) {
    Receiver receiver(8);
    receiver.addAdapter(new TestAdapter(1, [](PTC::Event&) { throw std::runtime_error("no"); }));
    EXPECT_THROW(receiver.recv(makeEvent(1, 1).release()), std::runtime_error);
}

TEST(Receiver, LetsAnAdapterTakeTheArgumentBlock) {
    Receiver receiver(8);
    std::unique_ptr<char[]> taken;
    receiver.addAdapter(new TestAdapter(
        1, [&taken](PTC::Event& event) { taken.reset(std::exchange(event.data, nullptr)); }));
    receiver.recv(makeEvent(1, 1, false, "abc").release());
    ASSERT_TRUE(taken);
    EXPECT_EQ(taken[2], 'c');
}
