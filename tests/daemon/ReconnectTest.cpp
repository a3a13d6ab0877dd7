// SPDX-License-Identifier: MIT
#include <memory>
#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/DiscovererClient.h"
#include "tests/daemon/support/Life.h"

using LibMediaPlayer::MediaPlayerNotify;

namespace {

constexpr int kDiscoverers = 10;

const MediaPlayerNotify kOpened{1, 0, L"/film", 1, 1, 0, 1, 0, 5};

/** A daemon with a scripted engine, and a client that lives through the whole test. */
class ClientsThatRestart : public DaemonTest {
protected:
    void SetUp() override {
        startDaemon();
        if (HasFatalFailure())
            return;
        mRoad.connect();
        mWitness = live(1001);
        mWitnessId = mWitness->registerCallBack(kPlayerService);
    }

    void TearDown() override {
        if (mWitness)
            powerOff();
        DaemonTest::TearDown();
    }

    /** Ends the daemon in order: it frees all that it has. */
    void powerOff() {
        mWitness->request(kPlayerService, request::kPowerOffMediaPlayer, wire::integer(mWitnessId));
        mEngine.expectCall("player destroy");
        for (int number = kDiscoverers; number >= 0; --number) {
            EXPECT_THAT(mDiscoverers.nextCall(), testing::EndsWith("destroy"));
            mDiscoverers.answer("return 0");
        }
        EXPECT_EQ(mpDaemon->waitForExit(), 0) << mpDaemon->output().joined();
    }

    void startDaemon() {
        auto options = withEngineDouble();
        options.arguments = arguments();
        options.environment["QNS_ENGINE_DOUBLE"] = mEngine.address();
        options.environment["QNS_DISCOVERER_DOUBLE"] = mDiscoverers.address();
        start(options);
        for (int number = 0; number <= kDiscoverers; ++number)
            mDiscoverers.expectCall("discoverer " + std::to_string(number) + " create");
        mEngine.expectCall("player create null 15");
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
    }

    virtual std::vector<std::string> arguments() { return {"--reconnect-clients"}; }

    std::unique_ptr<Life> live(long identity) { return std::make_unique<Life>(mRoad, identity); }

    /** The client ends, and begins again. */
    void restart(std::unique_ptr<Life>& client) {
        const long identity = client->identity();
        client.reset();
        client = live(identity);
    }

    /** The engine is reached by this request of the player's client, and by none before. */
    void expectPause(Life& client, std::int32_t id) {
        client.request(kPlayerService, request::kPause, wire::integer(id));
        mEngine.expectCall("player pause");
        client.expectResult(kPlayerService, callback::kPause, 0);
    }

    /** The engine is asked for the client's extensions by this discoverer. */
    void expectDiscoverer(Life& client, std::int32_t id, int number) {
        client.request(kDiscovererService, discoverer::kGetExtensions, wire::integer(id));
        mDiscoverers.expectCall("discoverer " + std::to_string(number) + " extensions",
                                "return 0 \"mp3\" 1");
        client.expectCallBack(kDiscovererService, discoverer::kExtensionsCallBack,
                              discoverer::extensions("mp3", 1));
    }

    /** Without a discoverer the answer would be 1. */
    static void expectSomeDiscoverer(Life& client, std::int32_t id) {
        client.request(kDiscovererService, discoverer::kInitialize, wire::integer(id));
        client.expectResult(kDiscovererService, discoverer::kInitializeCallBack, 0);
    }

    /** The client ids that were told of notifications, as the daemon prints them. */
    std::vector<std::string> told() { return mpDaemon->output().with("####### LOOP"); }

    EngineScript mEngine;
    EngineScript mDiscoverers;
    WireClient mRoad{1005};
    std::unique_ptr<Life> mWitness;
    std::int32_t mWitnessId = -1;
};

TEST_F(ClientsThatRestart, AreServedByAllServicesUnderNewIds) {
    std::vector<std::int32_t> ids;
    {
        Life first(mRoad, 1000);
        for (const auto& service : kAllServices)
            ids.push_back(first.registerCallBack(service));
    }
    Life second(mRoad, 1000);
    for (std::size_t service = 0; service < ids.size(); ++service)
        EXPECT_EQ(second.registerCallBack(kAllServices[service]), ids[service] + 1);
    EXPECT_EQ(second.connectionCount(), 1U);
    expectSomeDiscoverer(second, ids[0] + 1);
    second.request(kImporterService, 1, wire::integer(ids[1] + 1));
    second.expectResult(kImporterService, 2, 0);
    expectPause(second, ids[2] + 1);
}

TEST_F(ClientsThatRestart, AreServedWhicheverObjectTheyRegisterFirst) {
    auto client = live(1000);
    const auto id = client->registerCallBack(kPlayerService);
    restart(client);
    client->registerNotify(kPlayerService, id);
    expectPause(*mWitness, mWitnessId);
    mEngine.notify(kOpened);
    EXPECT_TRUE(client->receive());
}

TEST_F(ClientsThatRestart, CannotUseTheIdsOfTheirFormerLives) {
    auto client = live(1000);
    const auto player = client->registerCallBack(kPlayerService);
    const auto discoverer = client->registerCallBack(kDiscovererService);
    restart(client);
    const auto id = client->registerCallBack(kPlayerService);
    client->request(kPlayerService, request::kPlay, wire::integer(player));
    client->request(kDiscovererService, discoverer::kGetExtensions, wire::integer(discoverer));
    expectPause(*client, id);
    expectDiscoverer(*client, client->registerCallBack(kDiscovererService), 0);
}

TEST_F(ClientsThatRestart, AreNotNotifiedAnyMoreOnceAnyClientHasRegistered) {
    mWitness->registerNotify(kPlayerService, mWitnessId);
    auto client = live(1000);
    const auto id = client->registerCallBack(kPlayerService);
    client->registerNotify(kPlayerService, id);
    expectPause(*client, id);
    client.reset();
    Life other(mRoad, 1002);
    const auto otherId = other.registerCallBack(kPlayerService);
    client = live(1000);
    const auto newId = client->registerCallBack(kPlayerService);
    mEngine.notify(kOpened);
    EXPECT_EQ(mWitness->receive()->object, mWitness->notification(kPlayerService, {}).object);
    EXPECT_EQ(told(), std::vector<std::string>{"####### LOOP(" + std::to_string(mWitnessId) + ")"});
    expectPause(*client, newId);
    expectPause(other, otherId);
}

TEST_F(ClientsThatRestart, LeaveAllTheirDiscoverers) {
    auto client = live(1000);
    for (int number = 0; number < kDiscoverers; ++number)
        client->registerCallBack(kDiscovererService);
    restart(client);
    for (int number = 0; number < kDiscoverers; ++number)
        expectSomeDiscoverer(*client, client->registerCallBack(kDiscovererService));
}

TEST_F(ClientsThatRestart, AreClearedUpAfterByARegistrationOfAnotherClientWithAnotherService) {
    {
        Life client(mRoad, 1000);
        for (int number = 0; number < kDiscoverers; ++number)
            client.registerCallBack(kDiscovererService);
    }
    Life other(mRoad, 1002);
    other.registerCallBack(kPlayerService);
    expectSomeDiscoverer(other, other.registerCallBack(kDiscovererService));
}

TEST_F(ClientsThatRestart, GetNoResultsOfWhatTheyAskedForInAFormerLife) {
    auto client = live(1000);
    client->request(kDiscovererService, discoverer::kGetExtensions,
                    wire::integer(client->registerCallBack(kDiscovererService)));
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 0 extensions");
    restart(client);
    const auto id = client->registerCallBack(kDiscovererService);
    expectSomeDiscoverer(*client, id);
    client->request(kDiscovererService, discoverer::kGetExtensions, wire::integer(id));
    mDiscoverers.answer("return 0 \"old\" 1");
    mDiscoverers.expectCall("discoverer 1 extensions", "return 0 \"new\" 1");
    client->expectCallBack(kDiscovererService, discoverer::kExtensionsCallBack,
                           discoverer::extensions("new", 1));
    expectDiscoverer(*client, client->registerCallBack(kDiscovererService), 0);
}

TEST_F(ClientsThatRestart, GetNoStatusThatTheyAskedForInAFormerLife) {
    mEngine.notify(kOpened);
    auto client = live(1000);
    client->request(kPlayerService, request::kGetPlayerStatus,
                    wire::integer(client->registerCallBack(kPlayerService)));
    EXPECT_EQ(mEngine.nextCall(), "player status");
    restart(client);
    const auto id = client->registerCallBack(kPlayerService);
    mEngine.answer("return 3 5 9");
    expectPause(*client, id);
}

TEST_F(ClientsThatRestart, DoNotDisturbALivingClient) {
    Life living(mRoad, 1002);
    const auto player = living.registerCallBack(kPlayerService);
    const auto discoverer = living.registerCallBack(kDiscovererService);
    living.registerNotify(kPlayerService, player);
    for (int round = 0; round < 5; ++round) {
        Life client(mRoad, 1000);
        const auto id = client.registerCallBack(kPlayerService);
        client.registerNotify(kPlayerService, id);
        client.registerCallBack(kDiscovererService);
        expectPause(client, id);
    }
    expectPause(living, player);
    expectDiscoverer(living, discoverer, 0);
    mEngine.notify(kOpened);
    EXPECT_EQ(living.receive()->object, living.notification(kPlayerService, {}).object);
    EXPECT_EQ(living.connectionCount(), 1U);
}

TEST_F(ClientsThatRestart, LeaveThePlayerPlaying) {
    {
        Life client(mRoad, 1000);
        const auto id = client.registerCallBack(kPlayerService);
        client.request(kPlayerService, request::kOpenPlayer,
                       wire::integer(id) + wire::text("/film"));
        mEngine.expectCall("player open \"/film\" 2");
        mEngine.notify(kOpened);
        client.request(kPlayerService, request::kPlay, wire::integer(id));
        mEngine.expectCall("player play");
        client.expectResult(kPlayerService, callback::kOpenPlayer, 0);
        client.expectResult(kPlayerService, callback::kPlay, 0);
    }
    Life client(mRoad, 1000);
    client.request(kPlayerService, request::kGetPlayerStatus,
                   wire::integer(client.registerCallBack(kPlayerService)));
    mEngine.expectCall("player status", "return 3 5 9");
    client.expectCallBack(kPlayerService, callback::kGetPlayerStatus, encode({3, 5, 9}));
}

TEST_F(ClientsThatRestart, MayChangeTheIdentityOfTheirModule) {
    {
        Life sixth(mRoad, 1006);
        EXPECT_GT(sixth.registerCallBack(kPlayerService), 0);
        Life unknown(mRoad, 1009);
        unknown.sendRegistration(kPlayerService);
        EXPECT_TRUE(sixth.receive()) << "it lives, and the module is its own";
    }
    Life unknown(mRoad, 1009);
    expectPause(unknown, unknown.registerCallBack(kPlayerService));
}

TEST_F(ClientsThatRestart, ThatDoNotListenYetMayTryAgain) {
    auto client = live(1000);
    client->registerCallBack(kPlayerService);
    client->stopListening();
    client->sendRegistration(kPlayerService);
    expectPause(*mWitness, mWitnessId);
    client = live(1000);
    expectPause(*client, client->registerCallBack(kPlayerService));
}

TEST_F(ClientsThatRestart, IncludeThoseThatWereGivenUpBecauseTheyReadNothing) {
    Life deaf(mRoad, 1000);
    std::int32_t id = -1;
    for (int number = 0; number < kDiscoverers; ++number)
        id = deaf.registerCallBack(kDiscovererService);
    // More than the sockets between the daemon and the client hold.
    for (int i = 0; i < 600; ++i)
        deaf.request(kDiscovererService, discoverer::kInitialize, wire::integer(id));
    Life other(mRoad, 1002);
    expectSomeDiscoverer(other, other.registerCallBack(kDiscovererService));
}

TEST_F(ClientsThatRestart, DoSoWhileTheEngineNotifies) {
    mWitness->registerNotify(kPlayerService, mWitnessId);
    const std::vector<MediaPlayerNotify> notifications(4, kOpened);
    constexpr int kRounds = 50;
    std::unique_ptr<Life> client;
    for (int round = 0; round < kRounds; ++round) {
        client = live(1000);
        const auto id = client->registerCallBack(kPlayerService);
        client->registerNotify(kPlayerService, id);
        expectPause(*mWitness, mWitnessId);
        mEngine.startNotify(notifications);
        restart(client);
        EXPECT_GT(client->registerCallBack(kDiscovererService), 0);
        mEngine.awaitNotified();
        for (std::size_t count = 0; count < notifications.size(); ++count)
            EXPECT_TRUE(mWitness->receive());
        client.reset();
    }
}

/** By default everything stays as it is. */
class ClientsThatRestartByDefault : public ClientsThatRestart {
protected:
    std::vector<std::string> arguments() override { return {}; }
};

TEST_F(ClientsThatRestartByDefault, AreNotConnectedAgainAndStayRegistered) {
    auto client = live(1000);
    const auto id = client->registerCallBack(kPlayerService);
    client->registerNotify(kPlayerService, id);
    restart(client);
    client->sendRegistration(kPlayerService);
    client->request(kPlayerService, request::kPlay, wire::integer(id));
    mEngine.expectCall("player play");
    expectPause(*mWitness, mWitnessId);
    mEngine.notify(kOpened);
    EXPECT_EQ(told(), std::vector<std::string>{"####### LOOP(" + std::to_string(id) + ")"});
    Life other(mRoad, 1002);
    EXPECT_EQ(other.registerCallBack(kPlayerService), id + 2) << "the second life got an id";
    EXPECT_EQ(client->connectionCount(), 0U);
}

TEST_F(ClientsThatRestartByDefault, KeepTheirDiscoverers) {
    {
        Life client(mRoad, 1000);
        for (int number = 0; number < kDiscoverers; ++number)
            client.registerCallBack(kDiscovererService);
    }
    Life other(mRoad, 1002);
    const auto id = other.registerCallBack(kDiscovererService);
    other.request(kDiscovererService, discoverer::kInitialize, wire::integer(id));
    other.expectResult(kDiscovererService, discoverer::kInitializeCallBack, 1);
}

} // namespace
