// SPDX-License-Identifier: MIT
#include <chrono>
#include <climits>
#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/Patience.h"

using namespace std::chrono_literals;
using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

class Request : public ScriptedDaemonTest {
protected:
    void SetUp() override {
        ScriptedDaemonTest::SetUp();
        if (!HasFatalFailure())
            mClient.registerCallBack();
    }

    /** The lines of the player's service and controller on standard output. */
    std::vector<std::string> trace() { return mpDaemon->output().with("MediaPlayer"); }

    void expectStatus(const PlayerStatus& status) {
        EXPECT_EQ(mClient.receive(),
                  mClient.callbackPacket(callback::kGetPlayerStatus, encode(status)));
    }

    void expectNotReady() {
        mClient.request(request::kGetPlayerStatus);
        expectStatus({2, 0, 0});
    }

    void openAccepted(std::string_view name, const std::string& engineCall) {
        mClient.open(name);
        mClient.expectReply(callback::kOpenPlayer, 0);
        mEngine.expectCall(engineCall);
    }

    PlayerClient mClient{1000};
};

TEST_F(Request, PlayIsAnsweredBeforeTheEngineHasPlayed) {
    mClient.callAccepted(request::kPlay, callback::kPlay);
    mEngine.expectCall("player play", "return 9");
    EXPECT_THAT(trace(), ElementsAre("MediaPlayerService::play", "MediaPlayerController::play"));
    mClient.expectNothingElse();
}

TEST_F(Request, PauseIsAnsweredBeforeTheEngineHasPaused) {
    mClient.callAccepted(request::kPause, callback::kPause);
    mEngine.expectCall("player pause", "return -1");
    EXPECT_THAT(trace(), ElementsAre("MediaPlayerService::pause", "MediaPlayerController::pause"));
    mClient.expectNothingElse();
}

TEST_F(Request, CloseIsAnsweredBeforeTheEngineHasClosed) {
    mClient.callAccepted(request::kClosePlayer, callback::kClosePlayer);
    mEngine.expectCall("player close");
    EXPECT_THAT(trace(),
                ElementsAre("MediaPlayerService::closePlayer", "MediaPlayerController::close"));
    EXPECT_TRUE(mSyslog.waitForLine("MediaPlayerController::close"));
}

TEST_F(Request, OpenHandsTheNameAndTheFormatToTheEngine) {
    openAccepted("/media/a b.mp4", "player open \"/media/a b.mp4\" 2");
    EXPECT_THAT(trace(),
                ElementsAre("MediaPlayerService::openPlayer", "MediaPlayerController::open"));
    EXPECT_TRUE(mSyslog.waitForLine("<134>", 1));
    EXPECT_TRUE(
        mSyslog.waitForLine("MediaPlayerService 101: MediaPlayerController::open /media/a b.mp4"));
}

TEST_F(Request, AFailedOpenIsNotToldByTheAnswer) {
    mClient.open("/nothing");
    mClient.expectReply(callback::kOpenPlayer, 0);
    mEngine.expectCall("player open \"/nothing\" 2", "return 1");
    mClient.expectNothingElse();
    expectNotReady();
}

TEST_F(Request, ANameMayHaveAnyCharacters) {
    openAccepted("/m/\xC3\xBC \xF0\x9F\x8E\xB5 %s.mp4",
                 "player open \"/m/\\x{fc} \\x{1f3b5} %s.mp4\" 2");
}

TEST_F(Request, ANameEndsAtItsFirstZeroAndWithItsItem) {
    mClient.request(request::kOpenPlayer, wire::integer(1) + wire::raw({"/a\0b\0", 5}));
    mClient.expectReply(callback::kOpenPlayer, 0);
    mEngine.expectCall("player open \"/a\" 2");
    mClient.request(request::kOpenPlayer, wire::integer(1) + wire::raw("/no-zero"));
    mClient.expectReply(callback::kOpenPlayer, 0);
    mEngine.expectCall("player open \"/no-zero\" 2");
}

TEST_F(Request, ANameMayFillThePacket) {
    const std::string name(wire::kMaxPayload - 5, 'n');
    mClient.open(name);
    mClient.expectReply(callback::kOpenPlayer, 0);
    mEngine.expectCall("player open \"" + name + "\" 2");
}

TEST_F(Request, AnEmptyNameClosesAndIsRefused) {
    makeReady();
    mClient.open("");
    mClient.expectReply(callback::kOpenPlayer, 1);
    mEngine.expectCall("player close");
    expectNotReady();
    EXPECT_THAT(trace(), testing::IsSupersetOf(
                             {"MediaPlayerService::openPlayer", "MediaPlayerController::close"}));
}

TEST_F(Request, SeekHandsPositionAndModeToTheEngineAndNotTheOption) {
    for (const bool option : {false, true}) {
        mClient.seek(-1'500'000'000, 2, option);
        mClient.expectReply(callback::kSeek, 0);
        mEngine.expectCall("player seek -1500000000 2");
    }
    mClient.seek(LONG_MAX, -1);
    mClient.expectReply(callback::kSeek, 0);
    mEngine.expectCall("player seek 9223372036854775807 -1");
    mClient.seek(LONG_MIN, INT_MAX);
    mClient.expectReply(callback::kSeek, 0);
    mEngine.expectCall("player seek -9223372036854775808 2147483647", "return -1");
    EXPECT_THAT(trace(), Contains("MediaPlayerService::seek").Times(4));
    EXPECT_THAT(trace(), Contains("MediaPlayerController::seek").Times(4));
}

TEST_F(Request, SetRepeatHandsAllThreeToTheEngine) {
    mClient.setRepeat(true, 1'000'000'000, 2'000'000'000);
    mClient.expectReply(callback::kSetRepeat, 0);
    mEngine.expectCall("player repeat true 1000000000 2000000000");
    mClient.setRepeat(false, 0, -1);
    mClient.expectReply(callback::kSetRepeat, 0);
    mEngine.expectCall("player repeat false 0 -1");
    EXPECT_THAT(trace(),
                ElementsAre("MediaPlayerService::setRepeat", "MediaPlayerController::setRepeat",
                            "MediaPlayerService::setRepeat", "MediaPlayerController::setRepeat"));
}

TEST_F(Request, StatusBeforeAnyOpenIsTwoWithZeros) {
    mClient.request(request::kGetPlayerStatus);
    const auto reply = mClient.receive();
    ASSERT_TRUE(reply);
    EXPECT_EQ(reply->method, 8);
    EXPECT_EQ(reply->payload, wire::hex("D2 00 00 00 02  D2 00 00 00 00"
                                        "D3 00 00 00 00 00 00 00 00  D3 00 00 00 00 00 00 00 00"));
    EXPECT_THAT(trace(), IsEmpty());
}

TEST_F(Request, StatusOfAReadyPlayerIsTheEngines) {
    makeReady();
    mClient.request(request::kGetPlayerStatus);
    mEngine.expectCall("player status", "return 3 72623859790382856 -2");
    const auto reply = mClient.receive();
    ASSERT_TRUE(reply);
    EXPECT_EQ(reply->payload, wire::hex("D2 00 00 00 03  D2 00 00 00 00"
                                        "D3 01 02 03 04 05 06 07 08  D3 FF FF FF FF FF FF FF FE"));
    mClient.request(request::kGetPlayerStatus);
    mEngine.expectCall("player status", "return -1 0 0");
    expectStatus({-1, 0, 0});
}

TEST_F(Request, InitializeOpenAndCloseMakeThePlayerUnready) {
    makeReady();
    openAccepted("/a", "player open \"/a\" 2");
    expectNotReady();
    makeReady();
    mClient.callAccepted(request::kClosePlayer, callback::kClosePlayer);
    mEngine.expectCall("player close");
    expectNotReady();
    makeReady();
    mClient.callAccepted(request::kInitializePlayer, callback::kInitializePlayer);
    expectNotReady();
    EXPECT_THAT(mEngine.nextCall(), testing::StartsWith("player open "));
    mEngine.answer("return 0");
    mEngine.expectCall("player close");
}

TEST_F(Request, PlayPauseSeekAndRepeatLeaveThePlayerReady) {
    makeReady();
    mClient.callAccepted(request::kPlay, callback::kPlay);
    mEngine.expectCall("player play");
    mClient.callAccepted(request::kPause, callback::kPause);
    mEngine.expectCall("player pause");
    mClient.seek(0, 0);
    mClient.expectReply(callback::kSeek, 0);
    mEngine.expectCall("player seek 0 0");
    mClient.setRepeat(true, 0, -1);
    mClient.expectReply(callback::kSetRepeat, 0);
    mEngine.expectCall("player repeat true 0 -1");
    mClient.request(request::kGetPlayerStatus);
    mEngine.expectCall("player status", "return 1 7 8");
    expectStatus({1, 7, 8});
}

TEST_F(Request, AStatusWhoseClientHasLeftIsAnsweredToNobody) {
    PlayerClient other(1001);
    other.registerCallBack();
    makeReady();
    mClient.request(request::kGetPlayerStatus);
    EXPECT_EQ(mEngine.nextCall(), "player status");
    mClient.request(request::kUnregisterCallBack);
    mClient.expectNothingElse();
    mEngine.answer("return 3 1 2");
    other.callAccepted(request::kPlay, callback::kPlay);
    mEngine.expectCall("player play");
    mClient.expectNothingElse();
}

TEST_F(Request, TheFormatAppliesFromTheNextOpen) {
    const auto setFormat = [&](std::int64_t format) {
        mClient.request(request::kSetSystemFormat, wire::integer(format));
    };
    setFormat(0);
    openAccepted("/a", "player open \"/a\" 3");
    setFormat(1);
    openAccepted("/a", "player open \"/a\" 2");
    setFormat(0);
    openAccepted("/a", "player open \"/a\" 3");
    setFormat(7);
    openAccepted("/a", "player open \"/a\" 2");
    setFormat(-1);
    openAccepted("/a", "player open \"/a\" 2");
    EXPECT_TRUE(mSyslog.waitForLine(
        "MediaPlayerService 100: MediaPlayerService::setSystemFormat() Enter.", 5));
    EXPECT_TRUE(mSyslog.waitForLine(
        "MediaPlayerService 101: MediaPlayerService::setSystemFormat() : systemFormat = 3", 2));
    EXPECT_TRUE(mSyslog.waitForLine(
        "MediaPlayerService 101: MediaPlayerService::setSystemFormat() : systemFormat = 2", 3));
}

TEST_F(Request, TheFormatNeedsNoClientAndHasNoAnswer) {
    WireClient stranger(1001);
    stranger.connect();
    stranger.send({8, 62, request::kSetSystemFormat, false, true, wire::integer(0)});
    EXPECT_TRUE(mSyslog.waitForLine("systemFormat = 3"));
    openAccepted("/a", "player open \"/a\" 3");
}

TEST_F(Request, AnUnknownClientIsNotAnsweredAndReachesNoEngine) {
    for (const std::int64_t id : {0L, 2L, -1L, 77L, 2147483647L}) {
        for (long method = request::kInitializePlayer; method <= request::kGetPlayerStatus;
             ++method)
            if (method != request::kOpenPlayer && method != request::kSeek)
                mClient.request(method, wire::integer(id));
        mClient.request(request::kOpenPlayer, wire::integer(id) + wire::text("/a"));
        mClient.request(request::kSeek, wire::integer(id) + wire::integer(0) + wire::integer(0) +
                                            wire::boolean(false));
        mClient.request(request::kSetRepeat, wire::integer(id) + wire::boolean(true) +
                                                 wire::integer(0) + wire::integer(0));
    }
    mClient.expectNothingElse();
    mClient.callAccepted(request::kPlay, callback::kPlay);
    mEngine.expectCall("player play");
    for (const char* name :
         {"initializePlayer", "openPlayer", "closePlayer", "pause", "seek", "setRepeat"})
        EXPECT_THAT(trace(), Contains(std::string("MediaPlayerService::") + name).Times(5));
}

TEST_F(Request, PowerOffByAnUnknownClientIsOnlyLogged) {
    mClient.request(request::kPowerOffMediaPlayer, wire::integer(77));
    mClient.callAccepted(request::kPlay, callback::kPlay);
    mEngine.expectCall("player play");
    EXPECT_TRUE(mSyslog.waitForLine("<131>"));
    EXPECT_TRUE(mSyslog.waitForLine(
        "MediaPlayerService 400: MediaPlayerService::powerOffMediaPlayer() is called, but "
        "clientID 77 is not enabled."));
    EXPECT_THAT(mSyslog.lines("MediaPlayerService 901"), IsEmpty());
}

TEST_F(Request, AClientIdMayComeInEveryIntegerForm) {
    for (const auto* id :
         {"01", "CC 01", "CD 00 01", "CE 00 00 00 01", "CF 00 00 00 00 00 00 00 01", "D0 01",
          "D1 00 01", "D2 00 00 00 01", "D3 00 00 00 00 00 00 00 01"}) {
        SCOPED_TRACE(id);
        mClient.request(request::kPlay, wire::hex(id));
        mClient.expectReply(callback::kPlay, 0);
        mEngine.expectCall("player play");
    }
}

TEST_F(Request, AClientIdIsCutToItsLowHalf) {
    mClient.request(request::kPlay, wire::integer(4294967296 + mClient.id()));
    mClient.expectReply(callback::kPlay, 0);
    mEngine.expectCall("player play");
}

TEST_F(Request, AnyClientMayActForAnother) {
    PlayerClient other(1001);
    other.registerCallBack();
    mClient.request(request::kPlay, wire::integer(other.id()));
    other.expectReply(callback::kPlay, 0);
    mEngine.expectCall("player play");
    mClient.expectNothingElse();
}

TEST_F(Request, RequestsOfOneConnectionAreWorkedOffInOrder) {
    constexpr int kCount = 200;
    for (int i = 0; i < kCount; ++i)
        mClient.seek(i, 0);
    for (int i = 0; i < kCount; ++i)
        mClient.expectReply(callback::kSeek, 0);
    // Parameters are overwritten by later requests that arrive before the engine has them.
    long previous = -1;
    for (int i = 0; i < kCount; ++i) {
        const auto words = script::words(mEngine.nextCall());
        ASSERT_EQ(words.size(), 4U);
        EXPECT_GE(script::number(words[2]), previous);
        previous = script::number(words[2]);
        mEngine.answer("return 0");
    }
    EXPECT_EQ(previous, kCount - 1);
}

TEST_F(Request, WhileTheEngineIsBusyTheLastParametersWin) {
    PlayerClient other(1001);
    other.registerCallBack();
    mClient.callAccepted(request::kPlay, callback::kPlay);
    EXPECT_EQ(mEngine.nextCall(), "player play");
    mClient.open("/first");
    mClient.seek(1, 0);
    mClient.setRepeat(true, 1, 2);
    for (const long reply : {callback::kOpenPlayer, callback::kSeek, callback::kSetRepeat})
        mClient.expectReply(reply, 0);
    other.open("/second");
    other.seek(2, 1);
    other.setRepeat(false, 3, 4);
    for (const long reply : {callback::kOpenPlayer, callback::kSeek, callback::kSetRepeat})
        other.expectReply(reply, 0);
    mEngine.answer("return 0");
    for (int i = 0; i < 2; ++i) {
        mEngine.expectCall("player open \"/second\" 2");
        mEngine.expectCall("player seek 2 1");
        mEngine.expectCall("player repeat false 3 4");
    }
}

TEST_F(Request, TheLastAskerGetsTheAnswersToAllStatusRequestsOfABusyEngine) {
    PlayerClient other(1001);
    other.registerCallBack();
    makeReady();
    mClient.callAccepted(request::kPlay, callback::kPlay);
    EXPECT_EQ(mEngine.nextCall(), "player play");
    mClient.request(request::kGetPlayerStatus);
    mClient.expectNothingElse();
    other.request(request::kGetPlayerStatus);
    other.expectNothingElse();
    mEngine.answer("return 0");
    for (const std::int64_t position : {10, 20}) {
        mEngine.expectCall("player status", "return 3 " + std::to_string(position) + " 100");
        EXPECT_EQ(other.receive(),
                  other.callbackPacket(callback::kGetPlayerStatus, encode({3, position, 100})));
    }
    mClient.expectNothingElse();
}

class Initialize : public Request {
protected:
    void SetUp() override {
        auto options = withEngineDouble();
        options.environment["QNS_HV_PREFIX"] = "/pre fix";
        startScripted(options);
        if (!HasFatalFailure())
            mClient.registerCallBack();
    }

    static constexpr const char* kOpenPicture =
        "player open \"/pre fix/share/mediaplayer/images/black.jpg\" 2";
};

TEST_F(Initialize, ShowsTheBlackPictureAndTakesTwoSeconds) {
    const auto start = patience::Clock::now();
    mClient.callAccepted(request::kInitializePlayer, callback::kInitializePlayer);
    mEngine.expectCall(kOpenPicture);
    EXPECT_GE(patience::Clock::now() - start, 1s);
    mEngine.expectCall("player close");
    EXPECT_GE(patience::Clock::now() - start, 2s);
    EXPECT_THAT(trace(), ElementsAre("MediaPlayerService::initializePlayer",
                                     "MediaPlayerController::initialize"));
    EXPECT_TRUE(mSyslog.waitForLine("MediaPlayerController::initializePlayer close"));
    EXPECT_THAT(
        mSyslog.messages("MediaPlayerController::initializePlayer"),
        ElementsAre("MediaPlayerService 101: MediaPlayerController::initializePlayer",
                    "MediaPlayerService 101: MediaPlayerController::initializePlayer open "
                    "/pre fix/share/mediaplayer/images/black.jpg",
                    "MediaPlayerService 101: MediaPlayerController::initializePlayer close"));
}

TEST_F(Initialize, GoesOnWhateverTheEngineAnswers) {
    mClient.callAccepted(request::kInitializePlayer, callback::kInitializePlayer);
    mEngine.expectCall(kOpenPicture, "return 9");
    mEngine.expectCall("player close", "return -1");
    mClient.callAccepted(request::kPlay, callback::kPlay);
    mEngine.expectCall("player play");
}

TEST_F(Initialize, OthersAreAnsweredMeanwhileAndTheirLastParametersAreUsedAfterwards) {
    mClient.callAccepted(request::kInitializePlayer, callback::kInitializePlayer);
    EXPECT_EQ(mEngine.nextCall(), kOpenPicture);
    for (const auto* name : {"/first", "/second"}) {
        mClient.open(name);
        mClient.expectReply(callback::kOpenPlayer, 0);
    }
    mEngine.answer("return 0");
    mEngine.expectCall("player close");
    mEngine.expectCall("player open \"/second\" 2");
    mEngine.expectCall("player open \"/second\" 2");
}

TEST_F(Initialize, LeavesItsPictureAsTheNameForAnOpenThatWasQueuedBehindIt) {
    mClient.callAccepted(request::kPlay, callback::kPlay);
    EXPECT_EQ(mEngine.nextCall(), "player play");
    mClient.callAccepted(request::kInitializePlayer, callback::kInitializePlayer);
    mClient.open("/overwritten");
    mClient.expectReply(callback::kOpenPlayer, 0);
    mEngine.answer("return 0");
    mEngine.expectCall(kOpenPicture);
    mEngine.expectCall("player close");
    mEngine.expectCall(kOpenPicture);
}

class WithoutPlayer : public DaemonTest {
protected:
    void SetUp() override {
        auto options = withEngineDouble();
        options.environment["QNS_ENGINE_DOUBLE"] = mEngine.address();
        start(options);
        mEngine.expectCall("player create null 15", "null");
        ASSERT_TRUE(mpDaemon->waitUntilServing());
    }

    EngineScript mEngine;
};

TEST_F(WithoutPlayer, RequestsAreAcceptedAllTheSame) {
    PlayerClient client(1000);
    client.registerCallBack();
    client.callAccepted(request::kPlay, callback::kPlay);
    client.callAccepted(request::kPause, callback::kPause);
    client.callAccepted(request::kClosePlayer, callback::kClosePlayer);
    client.open("/a");
    client.expectReply(callback::kOpenPlayer, 0);
    client.seek(1, 0);
    client.expectReply(callback::kSeek, 0);
    client.setRepeat(true, 0, 1);
    client.expectReply(callback::kSetRepeat, 0);
    EXPECT_TRUE(mpDaemon->waitForLine("MediaPlayerController::setRepeat"));
}

} // namespace
