// SPDX-License-Identifier: MIT
#include "tests/daemon/support/LoadTest.h"
#include "tests/daemon/support/Strangers.h"

using namespace std::chrono_literals;

namespace {

TEST_F(LoadTest, OfEightClientsIsAnsweredAllOnceAndInOrder) {
    run(2s);
    const auto before = holdings();
    run(3s);
    expectReturnTo(before);
}

TEST_F(LoadTest, IsAnsweredAlsoBesideStrangersWhoOnlyAsk) {
    run(1s);
    const auto before = holdings();
    {
        const Strangers strangers(6, 200);
        run(1s);
    }
    expectReturnTo(before);
}

TEST_F(LoadTest, DoesNotKeepTheDaemonFromEnding) {
    endDuringLoad(1s);
}

} // namespace
