// SPDX-License-Identifier: MIT
// What others pay for a client that does wrong: prints figures, and holds them to nothing but
// that everybody is answered.
#include <algorithm>
#include <chrono>
#include <cstdio>
#include <optional>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/Life.h"
#include "tests/daemon/support/Nuisance.h"
#include "tests/daemon/support/PlayerClient.h"

namespace {

constexpr int kRounds = 5;
constexpr int kRequests = 2000;

/** Times of plain requests, from the first byte to the answer. */
class Times {
public:
    void add(std::chrono::nanoseconds time) { mTimes.push_back(time); }

    [[nodiscard]] double microseconds(unsigned percent) {
        std::sort(mTimes.begin(), mTimes.end());
        const auto time = mTimes.at(mTimes.size() * percent / 100);
        return std::chrono::duration<double, std::micro>(time).count();
    }

private:
    std::vector<std::chrono::nanoseconds> mTimes;
};

class FaultTimes : public DaemonTest, public testing::WithParamInterface<Nuisance> {
protected:
    void SetUp() override {
        auto options = withEngineDouble();
        options.arguments = {"--reconnect-clients"};
        options.output = DaemonOptions::Output::discarded;
        mSyslog.keepOnly("nothing");
        start(options);
        mWitness.emplace(1001);
        mId = mWitness->registerCallBack(kPlayerService);
    }

    void measure(Times& times) {
        for (int i = 0; i < kRequests && !HasFailure(); ++i) {
            const auto start = std::chrono::steady_clock::now();
            mWitness->request(kPlayerService, request::kPause, wire::integer(mId));
            mWitness->expectResult(kPlayerService, callback::kPause, 0);
            times.add(std::chrono::steady_clock::now() - start);
        }
    }

    /** Over the bounded waits: connections are accepted, and a deaf client is given up. */
    void waitOut() {
        const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(5);
        for (Times ignored; std::chrono::steady_clock::now() < end && !HasFailure();)
            measure(ignored);
    }

    std::optional<Life> mWitness; ///< connects to the daemon
    std::int32_t mId = -1;
};

TEST_P(FaultTimes, AreMeasuredInTurnWithAndWithout) {
    Times without;
    Times with;
    for (int round = 0; round < kRounds; ++round) {
        measure(without);
        const Ongoing nuisance(GetParam());
        waitOut();
        measure(with);
    }
    std::printf("%s: p50 %.0f us, %.0f us without; p99 %.0f us, %.0f us without\n",
                GetParam().name.c_str(), with.microseconds(50), without.microseconds(50),
                with.microseconds(99), without.microseconds(99));
}

INSTANTIATE_TEST_SUITE_P(All, FaultTimes, testing::ValuesIn(allNuisances()),
                         [](const auto& test) { return test.param.name; });

} // namespace
