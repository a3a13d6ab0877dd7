// SPDX-License-Identifier: MIT
#include <csignal>
#include <list>
#include <optional>
#include <string>
#include <sys/socket.h>

#include "tests/cli/support/Tool.h"
#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/DiscovererClient.h"
#include "tests/daemon/support/Life.h"
#include "tests/daemon/support/Memory.h"
#include "tests/daemon/support/Nuisance.h"
#include "tests/daemon/support/Patience.h"
#include "tests/daemon/support/PlayerClient.h"

using namespace std::chrono_literals;

namespace {

/** A client that does everything well, beside others that do not. */
class ClientFaults : public DaemonTest {
protected:
    void SetUp() override {
        auto options = withEngineDouble();
        options.arguments = {"--reconnect-clients"};
        start(options);
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
        mWitness.emplace(1001);
        mId = mWitness->registerCallBack(kPlayerService);
    }

    /** The witness asks a hundred times, and is answered each time. */
    void expectService() {
        for (int i = 0; i < 100 && !HasFailure(); ++i) {
            mWitness->request(kPlayerService, request::kPause, wire::integer(mId));
            mWitness->expectResult(kPlayerService, callback::kPause, 0);
        }
    }

    std::optional<Life> mWitness; ///< connects to the daemon
    std::int32_t mId = -1;
};

TEST_F(ClientFaults, AStoppedProcessHoldsUpOthersForTwoSecondsAndTakesNoMemory) {
    Tool victim(QNS_TEST_CLIENT, {"1000", "image", "/a", "/nowhere/picture"}, Tool::Output::pipe);
    EXPECT_TRUE(victim.waitFor("asked")) << victim.errors();
    victim.signal(SIGSTOP);
    const auto memory = mpDaemon->residentBytes();
    const auto askForVictim = [this](int count) {
        for (int i = 0; i < count; ++i)
            mWitness->request(kDiscovererService, discoverer::kInitialize, wire::integer(1));
    };
    const auto start = patience::Clock::now();
    askForVictim(2000); // more than all sockets on the way hold
    expectService();
    EXPECT_GE(patience::Clock::now() - start, 1900ms);
    EXPECT_LT(patience::Clock::now() - start, patience::stretched(8s));
    const auto later = patience::Clock::now();
    askForVictim(100);
    expectService();
    EXPECT_LT(patience::Clock::now() - later, patience::stretched(1s));
    EXPECT_LT(memoryGrownSince(*mpDaemon, memory), 16'000'000);
    victim.signal(SIGKILL);
    EXPECT_EQ(victim.waitForExit(), 128 + SIGKILL);
    Life next(1000);
    EXPECT_EQ(next.registerCallBack(kDiscovererService), 2);
}

/** Listens on a port, and has as many connections wait there as the machine lets. */
class FullBacklog {
public:
    explicit FullBacklog(long port) : mListener(listenOn(port)) {
        ::listen(mListener.get(), 0);
        constexpr int kMoreThanFit = 4;
        for (int i = 0; i < kMoreThanFit; ++i)
            mWaiting.push_back(startConnecting(port));
    }

private:
    qns::UniqueFd mListener;
    std::list<qns::UniqueFd> mWaiting;
};

TEST_F(ClientFaults, APortThatNeverAcceptsHoldsUpOthersForTwoSecondsAndMayBeTriedAgain) {
    const auto start = patience::Clock::now();
    {
        const FullBacklog backlog(1002);
        mWitness->request(kPlayerService, request::kRegisterCallBack,
                          wire::integer(1) + wire::integer(1002));
        expectService();
    }
    EXPECT_GE(patience::Clock::now() - start, 1900ms);
    EXPECT_LT(patience::Clock::now() - start, patience::stretched(4s));
    Life next(1002);
    EXPECT_EQ(next.registerCallBack(kPlayerService), mId + 1);
}

class AClientThat : public ClientFaults, public testing::WithParamInterface<Nuisance> {
protected:
    /** Others are answered beside it, and it is forgotten when somebody registers. */
    void expectServiceBesideIt() {
        // Longer than a connection may wait to be accepted.
        const auto end = patience::Clock::now() + 1s;
        {
            const Ongoing nuisance(GetParam());
            while (patience::Clock::now() < end && !HasFailure())
                expectService();
        }
        EXPECT_GT(mWitness->registerCallBack(kPlayerService), mId);
        expectService();
    }
};

TEST_P(AClientThat, LeavesOthersAnsweredAndNothingBehind) {
    expectServiceBesideIt();
    const auto descriptors = mpDaemon->descriptorCount();
    const auto threads = mpDaemon->threadCount();
    expectServiceBesideIt();
    EXPECT_TRUE(mpDaemon->waitForResources(descriptors, threads))
        << mpDaemon->descriptorCount() << " descriptors, " << descriptors << " before; "
        << mpDaemon->threadCount() << " threads, " << threads << " before";
}

INSTANTIATE_TEST_SUITE_P(All, AClientThat, testing::ValuesIn(allNuisances()),
                         [](const auto& test) { return test.param.name; });

} // namespace
