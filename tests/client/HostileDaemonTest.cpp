// SPDX-License-Identifier: MIT
#include <atomic>
#include <climits>
#include <random>
#include <string>

#include "tests/client/support/ConnectedPlayer.h"

using qnsmedia::PlayerNotification;

namespace {

/** Everything that comes must leave the library able to go on. */
class HostileDaemon : public ConnectedPlayer {
protected:
    void SetUp() override {
        ConnectedPlayer::SetUp();
        mPlayer->onNotification([this](const PlayerNotification&) { ++mNotifications; });
        expectAlive(); // the notify object is registered
    }

    [[nodiscard]] wire::Packet callbackPacket(long method, const wire::Bytes& payload) const {
        return {mDaemon.receiver(), mDaemon.callbackObject(), method, true, true, payload};
    }

    std::atomic<int> mNotifications{0};
};

TEST_F(HostileDaemon, MaySendAnswersThatNobodyWaitsFor) {
    for (long method = -2; method <= 20; ++method)
        mDaemon.callBack(method, wire::int32(0));
    mDaemon.callBack(LONG_MAX, wire::int32(1));
    expectAlive();
}

TEST_F(HostileDaemon, MayNameUnknownReceiversAndObjects) {
    wire::Packet packet = callbackPacket(callback::kPlay, wire::int32(1));
    for (const long number : {0L, -1L, 8L, 62L, LONG_MAX, LONG_MIN}) {
        packet.receiver = number;
        mDaemon.send(packet);
    }
    packet.receiver = mDaemon.receiver();
    for (const long number : {0L, -1L, 8L, 62L, LONG_MAX, LONG_MIN}) {
        packet.object = number;
        mDaemon.send(packet);
    }
    expectAlive();
}

TEST_F(HostileDaemon, MaySendSizesThatAreWrong) {
    const wire::Packet packet = callbackPacket(callback::kPlay, wire::int32(1));
    const auto most = static_cast<long>(wire::kMaxPayload);
    for (const long size : {0L, -1L, most + 1, most + 56, LONG_MAX, LONG_MIN})
        mDaemon.sendBytes(wire::toBytes(packet, size));
    expectAlive();
}

TEST_F(HostileDaemon, MaySendAPacketInPieces) {
    mDaemon.on(request::kPlay, nullptr);
    auto future = mPlayer->play();
    const wire::Bytes bytes = wire::toBytes(callbackPacket(callback::kPlay, wire::int32(0)));
    for (std::size_t at = 0; at < bytes.size(); at += 1000)
        mDaemon.sendBytes(std::string_view(bytes).substr(at, 1000));
    EXPECT_NO_THROW(future.get());
}

TEST_F(HostileDaemon, MayEndInTheMiddleOfAPacket) {
    mDaemon.on(request::kPlay, nullptr);
    auto future = mPlayer->play();
    EXPECT_TRUE(mDaemon.waitForRequest(request::kPlay));
    const wire::Bytes bytes = wire::toBytes(callbackPacket(callback::kPlay, wire::int32(0)));
    mDaemon.sendBytes(std::string_view(bytes).substr(0, 10'000));
    mDaemon.die();
    EXPECT_THROW(future.get(), qnsmedia::ConnectionLost);
}

TEST_F(HostileDaemon, MayCutAnswersAnywhere) {
    const wire::Bytes whole = encode(PlayerStatus{3, 1, 2});
    for (std::size_t length = 1; length < whole.size(); ++length) {
        mDaemon.on(request::kGetPlayerStatus, [&](const wire::Packet& request) {
            mDaemon.reply(request, callback::kGetPlayerStatus, whole.substr(0, length));
        });
        EXPECT_THROW((void)mPlayer->status().get(), qnsmedia::Error) << length;
    }
    expectAlive();
}

TEST_F(HostileDaemon, CutNotificationsAreNotTold) {
    const wire::Bytes whole = notification(1, 0, "/film", 1, 1, 1, 1, 1, 1);
    for (std::size_t length = 1; length < whole.size(); ++length)
        mDaemon.notify(whole.substr(0, length));
    expectAlive();
    EXPECT_EQ(mNotifications, 0);
    mDaemon.notify(whole);
    expectAlive();
    EXPECT_EQ(mNotifications, 1);
}

TEST_F(HostileDaemon, MaySendTextsThatClaimMoreThanIsThere) {
    mDaemon.notify(wire::integer(1) + wire::int32(0) + wire::hex("DB FF FF FF FF") + "abc");
    mDaemon.notify(wire::integer(1) + wire::int32(0) + wire::hex("DA FF FF") + "abc");
    mDaemon.notify(wire::integer(1) + wire::int32(0) + wire::hex("BF") + "abc");
    expectAlive();
    EXPECT_EQ(mNotifications, 0);
}

TEST_F(HostileDaemon, MaySendStatesAndKindsThatAreUnknown) {
    mDaemon.on(request::kGetPlayerStatus, [this](const wire::Packet& request) {
        mDaemon.reply(request, callback::kGetPlayerStatus, encode(PlayerStatus{99, -1, -1}));
    });
    EXPECT_EQ(static_cast<int>(mPlayer->status().get().state), 99);
    mDaemon.notify(notification(99, INT_MIN, "?", -1, -1, -1));
    expectAlive();
    EXPECT_EQ(mNotifications, 1);
}

TEST_F(HostileDaemon, MaySendNothingButNoise) {
    std::mt19937 random(1); // NOLINT: the same noise every time
    std::string noise(50 * wire::kPacketSize, '\0');
    for (char& byte : noise)
        byte = static_cast<char>(random());
    mDaemon.sendBytes(noise);
    expectAlive();
}

TEST_F(HostileDaemon, MaySendNoiseAsArguments) {
    std::mt19937 random(2); // NOLINT: the same noise every time
    for (int i = 0; i < 200; ++i) {
        wire::Bytes noise(1 + random() % 60, '\0');
        for (char& byte : noise)
            byte = static_cast<char>(random());
        // Not the answer that expectAlive() waits for.
        mDaemon.callBack(static_cast<long>(random() % callback::kSetRepeat), noise);
        mDaemon.notify(noise);
    }
    expectAlive();
}

TEST_F(HostileDaemon, MayAnswerBeforeItIsAsked) {
    mDaemon.on(request::kPlay, nullptr);
    mDaemon.callBack(callback::kPlay, wire::int32(1));
    expectAlive();
    auto future = mPlayer->play();
    mDaemon.callBack(callback::kPlay, wire::int32(0));
    EXPECT_NO_THROW(future.get());
}

} // namespace
