// SPDX-License-Identifier: MIT
#include <climits>
#include <memory>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"

using wire::Packet;

namespace {

class Registration : public DaemonTest {
protected:
    /** One client sends the registration of an object that may be another client's. */
    static void sendRegistration(PlayerClient& sender, long object, long identity) {
        sender.request(request::kRegisterCallBack, wire::integer(object) + wire::integer(identity));
    }

    /** What the first client sent has been worked off: its last request is answered to another. */
    static void waitUntilDone(PlayerClient& sender, PlayerClient& witness) {
        sender.request(request::kPlay, wire::integer(witness.id()));
        witness.expectReply(callback::kPlay, 0);
    }

    static void expectId(PlayerClient& receiver, std::int64_t receiverId, long object,
                         std::int32_t id) {
        EXPECT_EQ(receiver.receive(), (Packet{receiverId, object, callback::kSetPlayerClientId,
                                              true, true, wire::int32(id)}));
    }
};

TEST_F(Registration, ClientsAreNumberedFromOneInOrderOfRegistration) {
    PlayerClient first(1000);
    PlayerClient second(1001);
    PlayerClient third(1002);
    first.registerCallBack();
    second.registerCallBack();
    third.registerCallBack();
    EXPECT_EQ(first.id(), 1);
    EXPECT_EQ(second.id(), 2);
    EXPECT_EQ(third.id(), 3);
}

TEST_F(Registration, TheAnswerIsTheIdAsFiveBytes) {
    PlayerClient client(1000);
    client.connect();
    sendRegistration(client, 77, 1000);
    const auto reply = client.receive();
    ASSERT_TRUE(reply);
    EXPECT_EQ(reply->payload, wire::hex("D2 00 00 00 01"));
}

TEST_F(Registration, AnIdIsNeverUsedAgain) {
    PlayerClient client(1000);
    client.registerCallBack();
    client.request(request::kUnregisterCallBack);
    client.registerCallBack();
    EXPECT_EQ(client.id(), 2);
    client.request(request::kUnregisterCallBack);
    client.registerCallBack();
    EXPECT_EQ(client.id(), 3);
}

TEST_F(Registration, AnUnregisteredClientGetsNoAnswers) {
    PlayerClient client(1000);
    client.registerCallBack();
    client.callAccepted(request::kPlay, callback::kPlay);
    client.request(request::kUnregisterCallBack);
    client.request(request::kPlay);
    client.request(request::kGetPlayerStatus);
    client.expectNothingElse();
}

TEST_F(Registration, UnregisteringAnUnknownClientIsNothing) {
    PlayerClient client(1000);
    client.registerCallBack();
    client.request(request::kUnregisterCallBack, wire::integer(99));
    client.request(request::kUnregisterNotify, wire::integer(99));
    client.request(request::kUnregisterCallBack, wire::integer(-1));
    client.callAccepted(request::kPlay, callback::kPlay);
}

TEST_F(Registration, ANotifyRegistrationHasNoAnswer) {
    PlayerClient client(1000);
    client.registerCallBack();
    client.request(request::kRegisterNotify,
                   wire::integer(client.notifyObject()) + wire::integer(1000) + wire::integer(1));
    client.expectNothingElse();
}

TEST_F(Registration, EachIdentityHasTheReceiverIdOfItsModule) {
    std::vector<std::unique_ptr<PlayerClient>> clients;
    for (long identity = 1000; identity <= 1007; ++identity)
        clients.push_back(std::make_unique<PlayerClient>(identity));
    auto& sender = *clients.front();
    sender.connect();
    const std::vector<std::int64_t> receivers{1, 2, 3, 4, 5, 6, 8, 7};
    for (std::size_t i = 0; i < clients.size(); ++i) {
        sendRegistration(sender, 40, clients[i]->identity());
        expectId(*clients[i], receivers[i], 40, static_cast<std::int32_t>(i + 1));
    }
}

TEST_F(Registration, WithoutAListenerThereIsNoIdAndALaterTryWorks) {
    PlayerClient witness(1000);
    PlayerClient client(1003);
    client.stopListening();
    client.connect();
    witness.registerCallBack();
    EXPECT_EQ(witness.id(), 1);
    sendRegistration(client, 40, 1003);
    waitUntilDone(client, witness);
    client.startListening();
    sendRegistration(client, 40, 1003);
    expectId(client, 4, 40, 2);
}

TEST_F(Registration, ANotifyObjectThatCannotBeReachedIsNotRegistered) {
    PlayerClient client(1000);
    PlayerClient other(1001);
    other.stopListening();
    client.registerCallBack();
    client.request(request::kRegisterNotify,
                   wire::integer(5) + wire::integer(1001) + wire::integer(1));
    client.expectNothingElse();
    client.callAccepted(request::kPlay, callback::kPlay);
}

TEST_F(Registration, AnUnknownIdentityUsesTheConnectionOfModuleEight) {
    PlayerClient sixth(1006);
    sixth.connect();
    sendRegistration(sixth, 5, 1006);
    expectId(sixth, 8, 5, 1);
    std::int32_t id = 1;
    for (const long identity : {1009L, 0L, -1L, 999L, LONG_MAX, LONG_MIN}) {
        sendRegistration(sixth, 6, identity);
        expectId(sixth, 8, 6, ++id);
    }
    EXPECT_EQ(sixth.connectionCount(), 1U);
}

TEST_F(Registration, WhoeverIsFirstOfModuleEightGetsItsPackets) {
    PlayerClient unknown(1009);
    PlayerClient sixth(1006);
    unknown.connect();
    sendRegistration(unknown, 5, 1009);
    expectId(unknown, 8, 5, 1);
    sendRegistration(unknown, 6, 1006);
    expectId(unknown, 8, 6, 2);
    EXPECT_EQ(sixth.connectionCount(), 0U);
}

TEST_F(Registration, AllProxiesOfAClientShareOneConnection) {
    PlayerClient client(1002);
    client.registerCallBack();
    client.registerNotify();
    for (int i = 0; i < 5; ++i)
        client.registerCallBack();
    client.callAccepted(request::kPlay, callback::kPlay);
    EXPECT_EQ(client.connectionCount(), 1U);
}

TEST_F(Registration, AClientThatRestartsIsNotConnectedAgainAndOthersDoNotNotice) {
    PlayerClient other(1001);
    other.registerCallBack();
    PlayerClient client(1000);
    client.registerCallBack();
    client.stopListening();
    client.disconnect();
    client.startListening();
    client.connect();
    sendRegistration(client, 40, 1000);
    waitUntilDone(client, other);
    EXPECT_EQ(client.connectionCount(), 0U);
    sendRegistration(other, 41, 1001);
    expectId(other, 2, 41, 4);
}

TEST_F(Registration, TheDaemonsOwnPortAsAnIdentityHarmsNobody) {
    PlayerClient client(1000);
    client.registerCallBack();
    sendRegistration(client, 62, 1008);
    for (int i = 0; i < 20; ++i)
        client.request(request::kPlay, wire::integer(2));
    client.callAccepted(request::kPlay, callback::kPlay);
}

TEST_F(Registration, ObjectIdsAreCutToTheirLowHalf) {
    PlayerClient client(1000);
    client.connect();
    sendRegistration(client, (1L << 32) + 5, 1000);
    expectId(client, 1, 5, 1);
    sendRegistration(client, -7, 1000);
    expectId(client, 1, -7, 2);
}

TEST_F(Registration, FieldsMayComeInEveryIntegerForm) {
    PlayerClient client(1000);
    client.connect();
    std::int32_t id = 0;
    for (const auto* fields :
         {"05 CD 03 E8", "CC 05 D1 03 E8", "CD 00 05 CE 00 00 03 E8", "D0 05 D2 00 00 03 E8",
          "CF 00 00 00 00 00 00 00 05 "
          "D3 00 00 00 00 00 00 03 E8"}) {
        client.request(request::kRegisterCallBack, wire::hex(fields));
        expectId(client, 1, 5, ++id);
    }
}

} // namespace
