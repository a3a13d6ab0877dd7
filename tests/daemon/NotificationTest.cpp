// SPDX-License-Identifier: MIT
#include <climits>
#include <set>
#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"

using LibMediaPlayer::MediaPlayerNotify;
using testing::ElementsAre;

namespace {

class Notification : public ScriptedDaemonTest {
protected:
    static void registerBoth(PlayerClient& client) {
        client.registerCallBack();
        client.registerNotify();
    }

    std::vector<std::string> trace() {
        auto lines = mpDaemon->output().with("openNotify");
        for (auto& line : mpDaemon->output().with("#######"))
            lines.push_back(line);
        return lines;
    }

    PlayerClient mClient{1000};
};

TEST_F(Notification, HasAllNineFields) {
    registerBoth(mClient);
    mEngine.notify({1, 0, L"/m/\u00fc.mp4", 1, 2, 3, 1, 2, 5'000'000'000});
    EXPECT_EQ(mClient.receive(),
              mClient.notifyPacket(wire::hex("01  D2 00 00 00 00  AA 2F 6D 2F C3 BC 2E 6D 70 34 00"
                                             "01 02 03"
                                             "CF 00 00 00 00 00 00 00 01"
                                             "CF 00 00 00 00 00 00 00 02"
                                             "D3 00 00 00 01 2A 05 F2 00")));
}

TEST_F(Notification, KeepsTheShortestAndTheFixedIntegerForms) {
    registerBoth(mClient);
    mEngine.notify({200, 200, L"", -33, 70000, INT_MIN, ULONG_MAX, 0, LONG_MIN});
    EXPECT_EQ(mClient.receive(), mClient.notifyPacket(wire::hex("CC C8  D2 00 00 00 C8  A1 00"
                                                                "D0 DF  CE 00 01 11 70"
                                                                "D2 80 00 00 00"
                                                                "CF FF FF FF FF FF FF FF FF"
                                                                "CF 00 00 00 00 00 00 00 00"
                                                                "D3 80 00 00 00 00 00 00 00")));
    mEngine.notify({-1, -1, std::wstring(31, L'x'), 127, 128, -32, 0, 1, -1});
    EXPECT_EQ(mClient.receive(), mClient.notifyPacket(wire::hex("FF  D2 FF FF FF FF  DA 00 20") +
                                                      std::string(31, 'x') +
                                                      wire::hex("00  7F  CC 80  E0"
                                                                "CF 00 00 00 00 00 00 00 00"
                                                                "CF 00 00 00 00 00 00 00 01"
                                                                "D3 FF FF FF FF FF FF FF FF")));
}

TEST_F(Notification, GoesToEveryRegisteredClientInOrderOfIdsWhoeverOpened) {
    PlayerClient second(1001);
    PlayerClient opener(1002);
    mClient.registerCallBack();
    second.registerCallBack();
    opener.registerCallBack();
    second.registerNotify();
    mClient.registerNotify();
    opener.open("/a");
    opener.expectReply(callback::kOpenPlayer, 0);
    mEngine.expectCall("player open \"/a\" 2");
    makeReady();
    const auto payload = wire::integer(1) + wire::int32(0) + wire::text("/ready") +
                         wire::integer(1) + wire::integer(1) + wire::integer(0) + wire::uint64(1) +
                         wire::uint64(0) + wire::int64(5);
    EXPECT_EQ(mClient.receive(), mClient.notifyPacket(payload));
    EXPECT_EQ(second.receive(), second.notifyPacket(payload));
    opener.expectNothingElse();
    EXPECT_THAT(mpDaemon->output().with("#######"),
                ElementsAre("####### LOOP(1)", "####### LOOP(2)"));
    EXPECT_THAT(mpDaemon->output().with("openNotify"),
                ElementsAre("MediaPlayerController::openNotify", "MediaPlayerService::openNotify"));
    EXPECT_TRUE(mSyslog.waitForLine("MediaPlayerService 101: MediaPlayerController::openNotify"));
}

TEST_F(Notification, WithoutANotifyObjectThereIsNone) {
    mClient.registerCallBack();
    makeReady();
    mClient.expectNothingElse();
    EXPECT_TRUE(mpDaemon->output().with("#######").empty());
}

TEST_F(Notification, EndsWithTheUnregistration) {
    registerBoth(mClient);
    makeReady();
    ASSERT_TRUE(mClient.receive());
    mClient.request(request::kUnregisterNotify);
    mClient.expectNothingElse();
    makeReady();
    mClient.expectNothingElse();
}

TEST_F(Notification, GoesOnWhenOnlyTheCallbackObjectIsUnregistered) {
    registerBoth(mClient);
    mClient.request(request::kUnregisterCallBack);
    mClient.expectNothingElse();
    makeReady();
    const auto packet = mClient.receive();
    ASSERT_TRUE(packet);
    EXPECT_EQ(packet->object, mClient.notifyObject());
}

TEST_F(Notification, MayBeRegisteredUnderAnIdThatNobodyHas) {
    mClient.registerCallBack();
    mClient.request(request::kRegisterNotify,
                    wire::integer(mClient.notifyObject()) + wire::integer(1000) + wire::int32(-5));
    mClient.expectNothingElse();
    makeReady();
    ASSERT_TRUE(mClient.receive());
    EXPECT_THAT(mpDaemon->output().with("#######"), ElementsAre("####### LOOP(-5)"));
}

TEST_F(Notification, GoesToTheObjectThatWasRegisteredFirst) {
    registerBoth(mClient);
    mClient.request(request::kRegisterNotify,
                    wire::integer(555) + wire::integer(1000) + wire::integer(mClient.id()));
    mClient.expectNothingElse();
    makeReady();
    const auto packet = mClient.receive();
    ASSERT_TRUE(packet);
    EXPECT_EQ(packet->object, mClient.notifyObject());
    mClient.expectNothingElse();
}

TEST_F(Notification, OfAFailureLeavesThePlayerAsReadyAsItWas) {
    mClient.registerCallBack();
    const auto failure = [&] { mEngine.notify({4, 3, L"broken", 0, 0, 0, 0, 0, 0}); };
    failure();
    mClient.request(request::kGetPlayerStatus);
    EXPECT_EQ(decodeStatus(mClient.receive()).code, 2);
    makeReady();
    failure();
    mClient.request(request::kGetPlayerStatus);
    mEngine.expectCall("player status", "return 5 0 0");
    EXPECT_EQ(decodeStatus(mClient.receive()).code, 5);
}

TEST_F(Notification, ThatDoesNotFitIntoAPacketIsNotSent) {
    registerBoth(mClient);
    // Type, result, the text's header and zero, three small integers, three wide ones.
    const std::size_t longest = wire::kMaxPayload - (1 + 5 + 3 + 1 + 3 + 9 + 9 + 9);
    mEngine.notify({1, 0, std::wstring(longest + 1, L'x'), 0, 0, 0, 0, 0, 0});
    mEngine.notify({1, 0, std::wstring(100000, L'x'), 0, 0, 0, 0, 0, 0});
    mEngine.notify({1, 0, std::wstring(longest, L'y'), 0, 0, 0, 0, 0, 0});
    const auto packet = mClient.receive();
    ASSERT_TRUE(packet);
    EXPECT_EQ(packet->payload.size(), wire::kMaxPayload);
    EXPECT_EQ(packet->payload[20], 'y');
    mClient.expectNothingElse();
}

TEST_F(Notification, AtTheSameTimeFromSeveralThreadsArriveWhole) {
    registerBoth(mClient);
    PlayerClient second(1001);
    registerBoth(second);
    std::vector<MediaPlayerNotify> notifications(8);
    std::set<wire::Bytes> expected;
    for (int i = 0; i < 8; ++i) {
        const auto unsignedValue = static_cast<unsigned long>(i);
        notifications[unsignedValue] = {
            i, i, std::wstring(1000, L'a' + i), i, i, i, unsignedValue, unsignedValue, i};
        expected.insert(wire::integer(i) + wire::int32(i) +
                        wire::text(std::string(1000, static_cast<char>('a' + i))) +
                        wire::integer(i) + wire::integer(i) + wire::integer(i) +
                        wire::uint64(unsignedValue) + wire::uint64(unsignedValue) + wire::int64(i));
    }
    mEngine.notifyAtOnce(notifications);
    for (PlayerClient* client : {&mClient, &second}) {
        std::set<wire::Bytes> seen;
        for (int i = 0; i < 8; ++i)
            if (const auto packet = client->receive())
                seen.insert(packet->payload);
        EXPECT_EQ(seen.size(), expected.size());
        EXPECT_TRUE(seen == expected);
    }
}

TEST_F(Notification, AndRepliesToOneClientArriveWholeFromDifferentThreads) {
    registerBoth(mClient);
    constexpr int kCount = 100;
    std::vector<MediaPlayerNotify> burst(4);
    for (auto& notification : burst)
        notification = {6, 0, std::wstring(2000, L'z'), 50, 0, 0, 0, 0, 0};
    int replies = 0;
    int notified = 0;
    for (int i = 0; i < kCount; ++i)
        mClient.request(request::kSetRepeat, wire::integer(mClient.id()) + wire::boolean(true) +
                                                 wire::integer(i) + wire::integer(-1));
    for (int i = 0; i < 5; ++i)
        mEngine.notifyAtOnce(burst);
    while (replies < kCount || notified < 20) {
        const auto packet = mClient.receive();
        ASSERT_TRUE(packet);
        ++(packet->object == mClient.notifyObject() ? notified : replies);
    }
    EXPECT_EQ(replies, kCount);
    EXPECT_EQ(notified, 20);
    for (int i = 0; i < kCount; ++i) {
        EXPECT_THAT(mEngine.nextCall(), testing::StartsWith("player repeat true "));
        mEngine.answer("return 0");
    }
}

TEST_F(Notification, ToAClientThatHasGoneDoesNotKeepItFromOthers) {
    registerBoth(mClient);
    PlayerClient second(1001);
    registerBoth(second);
    mClient.stopListening();
    mClient.disconnect();
    for (int i = 0; i < 3; ++i) {
        makeReady();
        ASSERT_TRUE(second.receive());
    }
}

} // namespace
