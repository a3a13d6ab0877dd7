// SPDX-License-Identifier: MIT
#include "tests/daemon/support/LoadTest.h"
#include "tests/daemon/support/Memory.h"
#include "tests/daemon/support/Strangers.h"

using namespace std::chrono_literals;

namespace {

/** A tenth of the time that the load is kept up. */
constexpr std::chrono::seconds kTenth = kMemoryTells ? 60s : 6s;

class LongLoad : public LoadTest {
protected:
    /** Less than a tenth more memory: the engine may keep another idle thread, with its heap. */
    void expectSameMemoryAs(const Holdings& before) const {
        const auto grown = memoryGrownSince(*mpDaemon, before.bytes);
        EXPECT_LT(grown, static_cast<long>(before.bytes / 10));
    }
};

TEST_F(LongLoad, TakesNoMoreOfAnythingAfterItsFirstTenth) {
    run(kTenth);
    const auto before = holdings();
    for (int tenth = 1; tenth < 10 && !HasFailure(); ++tenth)
        run(kTenth);
    expectSameMemoryAs(before);
    expectReturnTo(before);
    endDuringLoad(1s);
}

TEST_F(LongLoad, BesideTwoHundredStrangersLeavesNothingBehind) {
    run(kTenth / 6);
    const auto before = holdings();
    {
        const Strangers strangers(200, 100);
        run(kTenth / 2);
    }
    run(kTenth / 6);
    expectReturnTo(before);
}

} // namespace
