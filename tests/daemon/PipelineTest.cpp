// SPDX-License-Identifier: MIT
#include <cstddef>
#include <thread>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/Memory.h"

using namespace std::chrono_literals;

namespace {

/** Requests in a row whose acknowledgements nobody reads. */
class Pipeline : public DaemonTest {
protected:
    void SetUp() override {
        DaemonTest::SetUp();
        if (HasFatalFailure())
            return;
        mClient.registerCallBack();
        mMemory = mpDaemon->residentBytes();
    }

    [[nodiscard]] wire::Bytes playRequest() const {
        return wire::toBytes({8, 62, request::kPlay, false, true, wire::integer(mClient.id())});
    }

    void expectAnswers(int count) {
        for (int i = 0; i < count && !HasFailure(); ++i)
            mClient.expectReply(callback::kPlay, 0);
    }

    /** What a queue of these requests may take, and far less than their packets. */
    void expectLittleMemory() const { EXPECT_LT(memoryGrownSince(*mpDaemon, mMemory), 16'000'000); }

    PlayerClient mClient{1000};
    WireClient mRoad{1001}; ///< a second connection: requests may come over any
    std::size_t mMemory = 0;
};

TEST_F(Pipeline, OfTenThousandRequestsIsAnsweredWholeAndInOrder) {
    constexpr int kCount = 10'000;
    mRoad.connect();
    std::thread sender([this, request = playRequest()] {
        std::size_t sent = 0;
        for (int i = 0; i < kCount; ++i)
            sent += mRoad.sendSome(request, patience::stretched(20s));
        EXPECT_EQ(sent, kCount * wire::kPacketSize);
    });
    expectAnswers(kCount);
    sender.join();
    mClient.expectNothingElse();
    EXPECT_TRUE(mRoad.waitForAcknowledgements(kCount));
    expectLittleMemory();
}

TEST_F(Pipeline, OfAClientThatNeverReadsAcknowledgementsTakesNeitherTimeNorMemoryOfOthers) {
    mRoad.connect(2304);
    const auto request = wire::toBytes({9, 62, 1, false, true, "x"});
    for (int i = 0; i < 5000; ++i) {
        mRoad.sendSome(request, 100ms);
        mClient.callAccepted(request::kPlay, callback::kPlay);
    }
    expectLittleMemory();
}

} // namespace
