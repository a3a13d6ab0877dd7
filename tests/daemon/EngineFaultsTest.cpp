// SPDX-License-Identifier: MIT
#include <climits>
#include <cstdint>
#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/DiscovererClient.h"
#include "tests/daemon/support/ImporterClient.h"

using LibMediaPlayer::MediaPlayerNotify;

namespace {

constexpr int kInternal = 9; ///< a result of the engine

class FaultyPlayer : public ScriptedDaemonTest {
protected:
    void SetUp() override {
        ScriptedDaemonTest::SetUp();
        if (!HasFatalFailure())
            mClient.registerCallBack();
    }

    /** Every operation once, which the engine answers with this. */
    void useAll(const std::string& result) {
        mClient.open("/a");
        mEngine.expectCall("player open \"/a\" 2", result);
        mClient.request(request::kPlay);
        mEngine.expectCall("player play", result);
        mClient.request(request::kPause);
        mEngine.expectCall("player pause", result);
        mClient.seek(1, 0);
        mEngine.expectCall("player seek 1 0", result);
        mClient.setRepeat(true, 0, 5);
        mEngine.expectCall("player repeat true 0 5", result);
        mClient.request(request::kClosePlayer);
        mEngine.expectCall("player close", result);
        for (const long answer : {callback::kOpenPlayer, callback::kPlay, callback::kPause,
                                  callback::kSeek, callback::kSetRepeat, callback::kClosePlayer})
            mClient.expectReply(answer, 0);
    }

    void expectState(const std::string& told, const PlayerStatus& status) {
        makeReady();
        mClient.request(request::kGetPlayerStatus);
        mEngine.expectCall("player status", told);
        EXPECT_EQ(mClient.receive(),
                  mClient.callbackPacket(callback::kGetPlayerStatus, encode(status)));
    }

    PlayerClient mClient{1000};
};

TEST_F(FaultyPlayer, IsAskedAgainWhateverItFailed) {
    for (const int result : {kInternal, -1, INT_MIN, 0})
        useAll("return " + std::to_string(result));
    expectState("return 3 4 5", {3, 4, 5});
    mClient.expectNothingElse();
}

TEST_F(FaultyPlayer, MayTellAnyState) {
    expectState("return -1 0 0", {-1, 0, 0});
    expectState("return 77 -5 -6", {77, -5, -6});
    expectState("return 3 9223372036854775807 -9223372036854775808", {3, INT64_MAX, INT64_MIN});
}

TEST_F(FaultyPlayer, MayNotifyFromManyThreadsUntilItIsDestroyed) {
    mClient.registerNotify();
    const std::vector<MediaPlayerNotify> burst(16, {4, kInternal, L"/a", 0, 0, 0, 0, 0, 0});
    mClient.request(request::kPowerOffMediaPlayer);
    EXPECT_EQ(mEngine.nextCall(), "player destroy");
    mEngine.notifyAtOnce(burst);
    mEngine.answer("return 0");
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
}

TEST_F(FaultyPlayer, ThatDoesNotComeBackLeavesTheOtherServicesAnswering) {
    mClient.callAccepted(request::kPlay, callback::kPlay);
    EXPECT_EQ(mEngine.nextCall(), "player play");
    ImporterClient other(1001);
    const auto id = other.registerCallBack(5);
    for (int i = 0; i < 100; ++i) {
        other.request(importer::kInitialize, id);
        other.expectResult(5, importer::kInitializeCallBack, 0);
    }
    mEngine.answer("return 0");
}

/** A daemon whose engine makes nothing at all. */
class MissingEngine : public DaemonTest {
protected:
    void SetUp() override {
        auto options = withEngineDouble();
        options.environment["QNS_ENGINE_DOUBLE"] = mPlayer.address();
        options.environment["QNS_DISCOVERER_DOUBLE"] = mDiscoverers.address();
        options.environment["QNS_IMPORTER_DOUBLE"] = mImporter.address();
        start(options);
        for (int number = 0; number < 10; ++number)
            refuse(mDiscoverers, "discoverer " + std::to_string(number) + " create");
        refuse(mImporter, "importer create");
        refuse(mDiscoverers, "discoverer 10 create");
        refuse(mPlayer, "player create null 15");
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
    }

    static void refuse(EngineScript& script, const std::string& creation) {
        script.expectCall(creation, "null");
    }

    EngineScript mPlayer;
    EngineScript mDiscoverers;
    EngineScript mImporter;
};

TEST_F(MissingEngine, IsNoReasonNotToAnswer) {
    PlayerClient player(1000);
    player.registerCallBack();
    player.callAccepted(request::kPlay, callback::kPlay);
    DiscovererClient discoverer(1001);
    const auto discovererId = discoverer.registerCallBack(5);
    discoverer.open(discovererId, "/a");
    discoverer.expectResult(5, discoverer::kOpenCallBack, 5);
    discoverer.request(discoverer::kGetExtensions, discovererId);
    discoverer.expectCallBack(5, discoverer::kExtensionsCallBack, discoverer::extensions("", 0));
    ImporterClient importer(1002);
    const auto importerId = importer.registerCallBack(6);
    importer.import(importerId, "/a");
    importer.expectResult(6, importer::kImportCallBack, 0);
    importer.request(importer::kGetStatus, importerId);
    importer.expectCallBack(6, importer::kStatusCallBack, importer::status(-1, 0, 0));
    player.request(request::kPowerOffMediaPlayer);
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
}

} // namespace
