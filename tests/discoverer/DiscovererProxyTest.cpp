// SPDX-License-Identifier: MIT
#include "discoverer/MediaDiscovererServiceCallBackRemoteProxy.h"

#include <limits>

#include <gmock/gmock.h>

#include "tests/support/RecordingSender.h"

using MediaServiceDefine::_tagMediaMetaInfo;
using testing::ElementsAre;

namespace {

class DiscovererProxy : public testing::Test {
protected:
    DiscovererProxy() { mCallback.setSender(&mSender); }
    ~DiscovererProxy() override { EXPECT_TRUE(mSender.allForClients()); }

    RecordingSender mSender;
    MediaDiscovererServiceCallBackRemoteProxy mCallback{21};
};

} // namespace

TEST_F(DiscovererProxy, SendsEveryResultAsFiveBytes) {
    mCallback.setDiscovererClientID(1);
    mCallback.initializeDiscovererCallBack(0);
    mCallback.openDiscovererCallBack(5);
    mCallback.closeDiscovererCallBack(std::numeric_limits<int>::min());
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{21, 1, {0xD2, 0, 0, 0, 1}},
                                            SentEvent{21, 2, {0xD2, 0, 0, 0, 0}},
                                            SentEvent{21, 3, {0xD2, 0, 0, 0, 5}},
                                            SentEvent{21, 4, {0xD2, 0x80, 0, 0, 0}}));
}

TEST_F(DiscovererProxy, SendsAPicturesResult) {
    mCallback.getImageCallBack({1, -7, L"/a\u00fc", L"/b"});
    EXPECT_THAT(
        mSender.take(),
        ElementsAre(SentEvent{21, 6, int32(1) + int32(-7) + text("/a\xC3\xBC") + text("/b")}));
    mCallback.getImageCallBack({});
    EXPECT_THAT(mSender.take(),
                ElementsAre(SentEvent{21, 6, int32(-1) + int32(0) + text("") + text("")}));
}

TEST_F(DiscovererProxy, SendsTheExtensionsWithAZeroBetween) {
    mCallback.getSupportedExtensionsCallBack({L"mp3,mp4", 0, 2});
    EXPECT_THAT(mSender.take(),
                ElementsAre(SentEvent{21, 7, text("mp3,mp4") + int32(0) + int32(2)}));
}

TEST_F(DiscovererProxy, SendsMetadataWithoutStreamsAsTwoEmptyBlocks) {
    mCallback.getMetaDataCallBack({});
    const Bytes empty{0xA0};
    EXPECT_THAT(
        mSender.take(),
        ElementsAre(SentEvent{21, 5,
                              int32(-1) + int32(0) + text("") + text("") + Bytes{0, 0} + int64(0) +
                                  empty + int32(0) + int32(0) + empty + int32(0) + int32(0)}));
}

TEST_F(DiscovererProxy, SendsMetadataInOrderAndTheFlagsAsIntegers) {
    const uint8_t video[] = {1, 2, 3};
    const uint8_t audio[] = {4, 5};
    _tagMediaMetaInfo info;
    info.iResult = 0;
    info.iRet = 9;
    info.systemInfo = {L"video/x", L"TITLE=a", 1, 200, 0x0102030405060708};
    info.pVideoData = video;
    info.iVideoDataSize = sizeof video;
    info.iVideoCount = 1;
    info.pAudioData = audio;
    info.iAudioDataSize = sizeof audio;
    info.iAudioCount = 8;
    mCallback.getMetaDataCallBack(info);
    EXPECT_THAT(mSender.take(),
                ElementsAre(SentEvent{21, 5,
                                      int32(0) + int32(9) + text("video/x") + text("TITLE=a") +
                                          Bytes{1, 0xCC, 200} + int64(0x0102030405060708) +
                                          Bytes{0xA3, 1, 2, 3} + int32(3) + int32(1) +
                                          Bytes{0xA2, 4, 5} + int32(2) + int32(8)}));
}

TEST_F(DiscovererProxy, TakesTheLowHalfOfTheObjectId) {
    EXPECT_EQ(MediaDiscovererServiceCallBackRemoteProxy((1L << 32) + 5).getId(), 5);
}
