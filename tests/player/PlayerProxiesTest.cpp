// SPDX-License-Identifier: MIT
#include "player/MediaPlayerServiceCallBackRemoteProxy.h"
#include "player/MediaPlayerServiceNotifyRemoteProxy.h"

#include <limits>

#include <gmock/gmock.h>

#include "tests/support/RecordingSender.h"

using testing::ElementsAre;

namespace {

class PlayerProxies : public testing::Test {
protected:
    PlayerProxies() {
        mCallback.setSender(&mSender);
        mNotify.setSender(&mSender);
    }
    ~PlayerProxies() override { EXPECT_TRUE(mSender.allForClients()); }

    Bytes notified(const MediaServiceDefine::_tagMediaPlayerNotify& notification) {
        mNotify.mediaPlayerNotify(notification);
        const auto sent = mSender.take();
        EXPECT_EQ(sent.size(), 1U);
        EXPECT_EQ(sent.at(0).objectId, 22);
        EXPECT_EQ(sent.at(0).methodId, 1);
        return sent.at(0).bytes;
    }

    RecordingSender mSender;
    MediaPlayerServiceCallBackRemoteProxy mCallback{21};
    MediaPlayerServiceNotifyRemoteProxy mNotify{22};
};

} // namespace

TEST_F(PlayerProxies, SendEveryResultAsFiveBytes) {
    mCallback.setPlayerClientID(1);
    mCallback.initializePlayerCallBack(0);
    mCallback.openPlayerCallBack(1);
    mCallback.closePlayerCallBack(-1);
    mCallback.playCallBack(127);
    mCallback.pauseCallBack(128);
    mCallback.seekCallBack(std::numeric_limits<int>::max());
    mCallback.setRepeatCallBack(std::numeric_limits<int>::min());
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{21, 1, {0xD2, 0, 0, 0, 1}},
                                            SentEvent{21, 2, {0xD2, 0, 0, 0, 0}},
                                            SentEvent{21, 3, {0xD2, 0, 0, 0, 1}},
                                            SentEvent{21, 4, {0xD2, 0xFF, 0xFF, 0xFF, 0xFF}},
                                            SentEvent{21, 5, {0xD2, 0, 0, 0, 0x7F}},
                                            SentEvent{21, 6, {0xD2, 0, 0, 0, 0x80}},
                                            SentEvent{21, 7, {0xD2, 0x7F, 0xFF, 0xFF, 0xFF}},
                                            SentEvent{21, 9, {0xD2, 0x80, 0, 0, 0}}));
}

TEST_F(PlayerProxies, SendAStatusAsFourFixedFields) {
    mCallback.getPlayerStatusCallBack({3, 0, 0x0102030405060708, -2});
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{
                                    21, 8, {0xD2, 0,    0,    0,    3,    0xD2, 0,    0,   0, 0,
                                            0xD3, 1,    2,    3,    4,    5,    6,    7,   8, 0xD3,
                                            0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFE}}));
}

TEST_F(PlayerProxies, SendPowerOffAsFourBytesThatAreNotEncoded) {
    mCallback.powerOffMediaPlayerCallBack();
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{21, 10, {0, 0, 0, 0}}));
}

TEST_F(PlayerProxies, SendAnEmptyNotification) {
    EXPECT_EQ(notified({}),
              (Bytes{0, 0xD2, 0, 0, 0, 0, 0xA1, 0, 0, 0, 0} + uint64(0) + uint64(0) + int64(0)));
}

TEST_F(PlayerProxies, SendTheResultOfANotificationFixedAndItsIntegersShort) {
    const Bytes expected = Bytes{7} + int32(5) + text("a\xC3\xBC%s") + Bytes{0xCC, 200} +
                           Bytes{0xFF} + Bytes{0xD1, 0xFE, 0xD4} + uint64(18446744073709551615U) +
                           uint64(1) + int64(-9);
    EXPECT_EQ(notified({7, 5, L"a\u00fc%s", 200, -1, -300, 18446744073709551615U, 1, -9}),
              expected);
}

TEST_F(PlayerProxies, SendEveryWidthOfANotificationsIntegers) {
    const auto firstBytes = [&](int type) {
        const Bytes bytes = notified({type, 0, L"", 0, 0, 0, 0, 0, 0});
        return Bytes(bytes.begin(), bytes.end() - (5 + 2 + 3 + 27));
    };
    EXPECT_EQ(firstBytes(127), (Bytes{0x7F}));
    EXPECT_EQ(firstBytes(128), (Bytes{0xCC, 0x80}));
    EXPECT_EQ(firstBytes(256), (Bytes{0xCD, 1, 0}));
    EXPECT_EQ(firstBytes(65536), (Bytes{0xCE, 0, 1, 0, 0}));
    EXPECT_EQ(firstBytes(-32), (Bytes{0xE0}));
    EXPECT_EQ(firstBytes(-33), (Bytes{0xD0, 0xDF}));
    EXPECT_EQ(firstBytes(-129), (Bytes{0xD1, 0xFF, 0x7F}));
    EXPECT_EQ(firstBytes(-32769), (Bytes{0xD2, 0xFF, 0xFF, 0x7F, 0xFF}));
}

TEST_F(PlayerProxies, SendALongTextWhole) {
    const Bytes bytes = notified({1, 0, std::wstring(5000, L'x'), 0, 0, 0, 0, 0, 0});
    EXPECT_EQ(Bytes(bytes.begin() + 6, bytes.begin() + 9), (Bytes{0xDA, 0x13, 0x89}));
    EXPECT_EQ(bytes.size(), 6U + 3 + 5001 + 3 + 27);
}

TEST_F(PlayerProxies, TakeTheLowHalfOfTheObjectId) {
    EXPECT_EQ(MediaPlayerServiceCallBackRemoteProxy((1L << 32) + 5).getId(), 5);
    EXPECT_EQ(MediaPlayerServiceNotifyRemoteProxy((1L << 32) + 6).getId(), 6);
}
