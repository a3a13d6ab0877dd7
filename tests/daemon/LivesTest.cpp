// SPDX-License-Identifier: MIT
#include <cstddef>
#include <string>

#include "tests/daemon/support/DiscovererClient.h"
#include "tests/daemon/support/ImporterClient.h"
#include "tests/daemon/support/ItemReader.h"
#include "tests/daemon/support/Life.h"
#include "tests/daemon/support/LivesTest.h"
#include "tests/daemon/support/Patience.h"

namespace {

constexpr std::int32_t kPlaying = 3;
constexpr std::int64_t kImportFinished = 2;

class KilledClients : public LivesTest {
protected:
    /** Draws a picture as a new process with the identity that was the killed one's. */
    void drawPicture(const std::string& picture) const {
        Life client(1000);
        const auto id = client.registerCallBack(kDiscovererService);
        client.request(kDiscovererService, discoverer::kInitialize, wire::integer(id));
        client.expectResult(kDiscovererService, discoverer::kInitializeCallBack, 0);
        client.request(kDiscovererService, discoverer::kOpen,
                       wire::integer(id) + wire::text(sample::film()));
        client.expectResult(kDiscovererService, discoverer::kOpenCallBack, 0);
        client.request(kDiscovererService, discoverer::kGetImage,
                       wire::integer(id) + wire::integer(64) + wire::integer(0) + wire::integer(0) +
                           wire::text(mFolder.path(picture)) + wire::text(""));
        client.expectCallBack(kDiscovererService, discoverer::kImageCallBack,
                              discoverer::image(0, 0, sample::film(), mFolder.path(picture)));
        EXPECT_TRUE(mFolder.has(picture));
    }

    /** Waits for the end of an import; its result. */
    static std::int64_t finishedImport(Life& client) {
        while (const auto told = client.receive()) {
            ItemReader items(told->payload);
            if (items.integer() == kImportFinished)
                return items.integer();
        }
        ADD_FAILURE() << "The import does not end.";
        return -1;
    }

    /** Waits until the player plays, and is not only about to. */
    static void expectPlaying(Life& client, std::int32_t id) {
        const auto end = patience::deadline();
        PlayerStatus status;
        while (status.code != kPlaying && patience::Clock::now() < end) {
            client.request(kPlayerService, request::kGetPlayerStatus, wire::integer(id));
            status = decodeStatus(client.receive());
        }
        EXPECT_EQ(status.code, kPlaying);
    }
};

TEST_F(KilledClients, InTheMiddleOfAFilmLeaveItPlaying) {
    Life witness(1001);
    const auto witnessId = witness.registerCallBack(kPlayerService);
    killInTheMiddleOf("play", sample::film(), "-");
    Life next(1000);
    const auto id = next.registerCallBack(kPlayerService);
    EXPECT_EQ(id, witnessId + 2);
    expectPlaying(next, id);
    expectPlaying(witness, witnessId);
    EXPECT_EQ(witness.connectionCount(), 1U);
}

TEST_F(KilledClients, InTheMiddleOfAPictureLeaveTheDiscoverersToOthers) {
    for (int round = 0; round < 11; ++round) {
        killInTheMiddleOf("image", sample::film(), mFolder.path("killed.png"));
        drawPicture("own" + std::to_string(round) + ".png");
    }
}

TEST_F(KilledClients, InTheMiddleOfAnImportLeaveItToItsEnd) {
    Life witness(1001);
    const auto witnessId = witness.registerCallBack(kImporterService);
    witness.registerNotify(kImporterService, witnessId);
    killInTheMiddleOf("import", sample::film(), "Films");
    Life next(1000);
    EXPECT_EQ(next.registerCallBack(kImporterService), witnessId + 2);
    EXPECT_EQ(finishedImport(witness), 0);
}

/** The tool takes the first identity that is free. */
class Tools : public LivesTest {};

TEST_F(Tools, AtOnceTakeDifferentIdentities) {
    Tool player({"play", sample::film()}, Tool::Output::terminal);
    EXPECT_TRUE(player.waitFor("0:0"));
    expectSuccess({"status"});
    expectSuccess({"info", sample::film()});
    player.press("q");
    EXPECT_EQ(player.waitForExit(), 0) << player.output();
}

TEST_F(Tools, OneAfterTheOtherTakeTheSameIdentity) {
    for (int call = 0; call < 12; ++call)
        expectSuccess({"--identity", "1000", "info", sample::shortSound()});
}

TEST_F(Tools, TakeTheIdentityOfOneThatWasKilled) {
    Tool player({"--identity", "1000", "play", sample::film()}, Tool::Output::terminal);
    EXPECT_TRUE(player.waitFor("0:0"));
    player.signal(SIGKILL);
    EXPECT_EQ(player.waitForExit(), 128 + SIGKILL);
    expectSuccess({"--identity", "1000", "status"});
}

/** A daemon with an engine that does nothing. */
class AThousandLives : public DaemonTest {
protected:
    void SetUp() override {
        auto options = withEngineDouble();
        options.arguments = {"--reconnect-clients"};
        start(options);
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
        mRoad.connect();
    }

    /** A process that uses all services, and leaves all that it registered. */
    void live(int number) {
        Life client(mRoad, 1000);
        for (const auto& service : kAllServices) {
            const auto id = client.registerCallBack(service);
            EXPECT_EQ(id, number);
            if (service.registerNotify != 0)
                client.registerNotify(service, id);
        }
        client.request(kPlayerService, request::kPause, wire::integer(number));
        client.expectResult(kPlayerService, callback::kPause, 0);
    }

    WireClient mRoad{1007};
};

TEST_F(AThousandLives, OfOneIdentityAreAllServedAndLeaveNothingBehind) {
    constexpr int kWarmUp = 200;
    constexpr int kLives = 1000;
    for (int number = 1; number <= kWarmUp; ++number)
        live(number);
    const auto descriptors = mpDaemon->descriptorCount();
    const auto threads = mpDaemon->threadCount();
    const auto memory = mpDaemon->residentBytes();
    for (int number = kWarmUp + 1; number <= kWarmUp + kLives; ++number)
        live(number);
    EXPECT_LE(mpDaemon->descriptorCount(), descriptors);
    EXPECT_LE(mpDaemon->threadCount(), threads);
    // Less than the five proxies of every life need.
    EXPECT_LT(memoryGrownSince(*mpDaemon, memory), 100 * kLives);
}

} // namespace
