// SPDX-License-Identifier: MIT
#include "importer/MediaImporterServiceCallBackRemoteProxy.h"
#include "importer/MediaImporterServiceNotifyRemoteProxy.h"

#include <limits>

#include <gmock/gmock.h>

#include "tests/support/RecordingSender.h"

using testing::ElementsAre;

namespace {

class ImporterProxies : public testing::Test {
protected:
    ImporterProxies() {
        mCallback.setSender(&mSender);
        mNotify.setSender(&mSender);
    }
    ~ImporterProxies() override { EXPECT_TRUE(mSender.allForClients()); }

    RecordingSender mSender;
    MediaImporterServiceCallBackRemoteProxy mCallback{21};
    MediaImporterServiceNotifyRemoteProxy mNotify{22};
};

} // namespace

TEST_F(ImporterProxies, SendEveryResultAsFiveBytes) {
    mCallback.setImporterClientID(1);
    mCallback.initializeImporterCallBack(0);
    mCallback.importCallBack(std::numeric_limits<int>::max());
    mCallback.cancelCallBack(-1);
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{21, 1, {0xD2, 0, 0, 0, 1}},
                                            SentEvent{21, 2, {0xD2, 0, 0, 0, 0}},
                                            SentEvent{21, 3, {0xD2, 0x7F, 0xFF, 0xFF, 0xFF}},
                                            SentEvent{21, 4, {0xD2, 0xFF, 0xFF, 0xFF, 0xFF}}));
}

TEST_F(ImporterProxies, SendAStatusAs28Bytes) {
    mCallback.getImporterStatusCallBack({1, 0, 5, -6});
    const auto sent = mSender.take();
    EXPECT_THAT(sent, ElementsAre(SentEvent{21, 5, int32(1) + int32(0) + int64(5) + int64(-6)}));
    EXPECT_EQ(sent.at(0).bytes.size(), 28U);
}

TEST_F(ImporterProxies, SendANotificationWithItsTypeInTheSmallestForm) {
    mNotify.mediaImporterNotify({3, 0, L"a", L"b", L"", {1, 2, 3, 4, -5}});
    EXPECT_THAT(mSender.take(),
                ElementsAre(SentEvent{22, 1,
                                      Bytes{3} + Bytes{0xD2, 0, 0, 0, 0} + text("a") + text("b") +
                                          text("") + int32(1) + int32(2) + int32(3) + int32(4) +
                                          int32(-5)}));
}

TEST_F(ImporterProxies, SendAnEmptyNotificationAsSmallAsItCanBe) {
    mNotify.mediaImporterNotify({});
    EXPECT_EQ(mSender.take().at(0).bytes.size(), 1U + 5 + 3 * 2 + 5 * 5);
}
