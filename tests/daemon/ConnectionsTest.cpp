// SPDX-License-Identifier: MIT
#include <chrono>
#include <memory>
#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/Patience.h"

using namespace std::chrono_literals;

namespace {

class Connections : public DaemonTest {
protected:
    /** A packet that nobody is to get: for its acknowledgement. */
    static void exchangePacket(WireClient& client) {
        client.send({9, 62, request::kPlay, false, true, wire::integer(1)});
        EXPECT_TRUE(client.waitForAcknowledgements(1));
    }
};

TEST_F(Connections, AreAcceptedHalfASecondApart) {
    WireClient first(1000);
    WireClient second(1001);
    first.connect();
    exchangePacket(first);
    const auto start = patience::Clock::now();
    second.connect();
    WireClient third(1002);
    third.connect();
    exchangePacket(second);
    exchangePacket(third);
    EXPECT_GE(patience::Clock::now() - start, 800ms);
}

TEST_F(Connections, LeaveNothingBehindWhenTheyEnd) {
    PlayerClient client(1000);
    client.registerCallBack();
    const auto descriptors = mpDaemon->descriptorCount();
    const auto threads = mpDaemon->threadCount();
    for (int i = 0; i < 24; ++i) {
        WireClient visitor(1001);
        visitor.connect();
        if (i % 3 == 0)
            exchangePacket(visitor);
        else if (i % 3 == 1)
            visitor.sendBytes("half a packet");
    }
    // Connections are accepted in order: after this one's all others have been.
    WireClient last(1001);
    last.connect();
    exchangePacket(last);
    last.disconnect();
    EXPECT_TRUE(mpDaemon->waitForResources(descriptors, threads))
        << mpDaemon->descriptorCount() << " descriptors, " << descriptors << " before; "
        << mpDaemon->threadCount() << " threads, " << threads << " before";
    client.callAccepted(request::kPlay, callback::kPlay);
}

TEST_F(Connections, OfAClientThatReadsNoAcknowledgementsEndWithIt) {
    PlayerClient client(1000);
    client.registerCallBack();
    const auto descriptors = mpDaemon->descriptorCount();
    const auto threads = mpDaemon->threadCount();
    {
        WireClient careless(1001);
        careless.connect(2304);
        const auto packet = wire::toBytes({9, 62, 1, false, true, "x"});
        for (int i = 0; i < 3000; ++i)
            if (careless.sendSome(packet, 300ms) < packet.size())
                break;
    }
    EXPECT_TRUE(mpDaemon->waitForResources(descriptors, threads));
}

TEST_F(Connections, ThatDoNotFitAreRefusedAloudAndServedWhenOthersLeave) {
    PlayerClient client(1000);
    client.registerCallBack();
    mpDaemon->limitFreeDescriptors(1);
    auto first = std::make_unique<WireClient>(1001);
    first->connect();
    exchangePacket(*first);
    WireClient second(1002);
    second.connect();
    EXPECT_TRUE(mpDaemon->waitForLine("[Error]bad client!"));
    client.callAccepted(request::kPlay, callback::kPlay);
    first.reset();
    exchangePacket(second);
    client.callAccepted(request::kPlay, callback::kPlay);
}

TEST_F(Connections, WithoutDescriptorsForASenderThereIsNoAnswerAndALaterTryWorks) {
    PlayerClient client(1000);
    client.registerCallBack();
    PlayerClient second(1001);
    second.connect();
    exchangePacket(second);
    const auto descriptors = mpDaemon->descriptorCount();
    mpDaemon->limitFreeDescriptors(0);
    second.request(request::kRegisterCallBack, wire::integer(9) + wire::integer(1001));
    EXPECT_TRUE(mpDaemon->waitForLine("[Error]Socket Server create failed!"));
    client.callAccepted(request::kPlay, callback::kPlay);
    second.disconnect();
    EXPECT_TRUE(mpDaemon->waitForResources(descriptors - 1, mpDaemon->threadCount()));
    client.request(request::kRegisterCallBack, wire::integer(9) + wire::integer(1001));
    EXPECT_TRUE(second.receive());
}

TEST_F(Connections, ABrokenConnectionEndsLikeAClosedOne) {
    PlayerClient client(1000);
    client.registerCallBack();
    const auto descriptors = mpDaemon->descriptorCount();
    {
        WireClient visitor(1001);
        visitor.connect();
        visitor.send({9, 62, 1, false, true, "x"});
        // The acknowledgement is not read: closing resets the connection.
    }
    WireClient last(1001);
    last.connect();
    exchangePacket(last);
    last.disconnect();
    EXPECT_TRUE(mpDaemon->waitForResources(descriptors, mpDaemon->threadCount()));
    client.callAccepted(request::kPlay, callback::kPlay);
}

} // namespace
