// SPDX-License-Identifier: MIT
#include "ptc/EventPacket.h"
#include "ptc/Receiver.h"
#include "ptc/RemoteReceiver.h"
#include "ptc/RemoteSender.h"
#include "tests/ptc/TestAdapter.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

namespace {

class Routing : public PTC::RemoteReceiver {
public:
    using RemoteReceiver::RemoteReceiver;
    void run() override {}
};

/** Keeps what it is given, and tells when it goes. */
class KeepingReceiver : public PTC::Receiver {
public:
    using Receiver::Receiver;
    ~KeepingReceiver() override {
        if (onDestroyed)
            onDestroyed();
    }
    void handleEvent(PTC::Event* event) override {
        events.push_back(*event);
        blocks.emplace_back(event->data, static_cast<std::size_t>(event->size));
    }

    std::vector<PTC::Event> events;
    std::vector<std::string> blocks;
    std::function<void()> onDestroyed;
};

PTC::EventPacket packetFor(long receiverId, std::string_view payload) {
    PTC::EventPacket packet{};
    packet.receiverId = receiverId;
    packet.objectId = 62;
    packet.methodId = 4;
    packet.data = new char[payload.size()];
    payload.copy(packet.data, payload.size());
    packet.size = static_cast<long>(payload.size());
    packet.isRemote = 1;
    return packet;
}

} // namespace

TEST(RemoteReceiver, HasNoIdentityUntilItIsInitialized) {
    Routing remote(3);
    EXPECT_EQ(remote.getId(), 3);
    EXPECT_EQ(remote.getIdentity(), -1);
    EXPECT_TRUE(remote.initialize(1008));
    EXPECT_EQ(remote.getIdentity(), 1008);
}

TEST(RemoteReceiver, LeavesThePayloadOfAPacketForAnUnknownReceiver) {
    Routing remote(0);
    auto* const receiver = new KeepingReceiver(8);
    remote.addReceiver(receiver);
    auto packet = packetFor(3, "abc");
    remote.handleEventPacket(&packet);
    EXPECT_TRUE(receiver->events.empty());
    ASSERT_NE(packet.data, nullptr);
    EXPECT_EQ(std::string(packet.data, 3), "abc");
    delete[] packet.data;
}

TEST(RemoteReceiver, TurnsAPacketIntoAnEventThatTakesThePayload) {
    Routing remote(0);
    auto* const receiver = new KeepingReceiver(8);
    remote.addReceiver(receiver);
    auto packet = packetFor(8, "abc");
    packet.isCallback = 0x80;
    packet.isRemote = 0;
    remote.handleEventPacket(&packet);
    EXPECT_EQ(packet.data, nullptr);
    ASSERT_EQ(receiver->events.size(), 1u);
    EXPECT_EQ(receiver->blocks[0], "abc");
    EXPECT_EQ(receiver->events[0].objectId, 62);
    EXPECT_EQ(receiver->events[0].methodId, 4);
    EXPECT_EQ(receiver->events[0].size, 3);
    EXPECT_TRUE(receiver->events[0].isCallback);
    EXPECT_FALSE(receiver->events[0].isRemote);
}

TEST(RemoteReceiver, DeliversPacketsInOrderOfArrival) {
    Routing remote(0);
    auto* const receiver = new KeepingReceiver(8);
    remote.addReceiver(receiver);
    for (const char* payload : {"first", "second"}) {
        auto packet = packetFor(8, payload);
        remote.handleEventPacket(&packet);
    }
    EXPECT_EQ(receiver->blocks, (std::vector<std::string>{"first", "second"}));
}

TEST(RemoteReceiver, KeepsTheFirstReceiverOfAnId) {
    Routing remote(0);
    auto* const kept = new KeepingReceiver(8);
    KeepingReceiver late(8);
    remote.addReceiver(kept);
    remote.addReceiver(&late);
    auto packet = packetFor(8, "x");
    remote.handleEventPacket(&packet);
    EXPECT_EQ(kept->events.size(), 1u);
    EXPECT_TRUE(late.events.empty());
}

TEST(RemoteReceiver, GivesAReceiverBack) {
    Routing remote(0);
    auto* const receiver = new KeepingReceiver(8);
    remote.addReceiver(receiver);
    EXPECT_EQ(remote.releaseReceiver(3), nullptr);
    EXPECT_EQ(remote.releaseReceiver(8).get(), receiver);
    EXPECT_EQ(remote.releaseReceiver(8), nullptr);
}

TEST(RemoteReceiver, DeletesItsReceivers) {
    int deleted = 0;
    {
        Routing remote(0);
        for (const long id : {8L, 9L}) {
            auto* const receiver = new KeepingReceiver(id);
            receiver->onDestroyed = [&deleted] { ++deleted; };
            remote.addReceiver(receiver);
        }
        const auto released = remote.releaseReceiver(9);
        EXPECT_EQ(deleted, 0);
    }
    EXPECT_EQ(deleted, 2);
}

TEST(RemoteSender, KnowsItsReceiverAndItsIdentity) {
    struct Sender : PTC::RemoteSender {
        using RemoteSender::RemoteSender;
        void send(PTC::Event*) override {}
    } sender(3);
    EXPECT_EQ(sender.getId(), 3);
    sender.setId(4);
    EXPECT_EQ(sender.getId(), 4);
    EXPECT_EQ(sender.getIdentity(), -1);
    EXPECT_TRUE(sender.initialize(1002));
    EXPECT_EQ(sender.getIdentity(), 1002);
}
