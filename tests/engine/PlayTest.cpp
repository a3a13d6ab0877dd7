// SPDX-License-Identifier: MIT
#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>

#include "tests/engine/CpuWait.h"
#include "tests/engine/FrameWatch.h"
#include "tests/engine/Samples.h"
#include "tests/engine/TestPlayer.h"

using namespace LibMediaPlayer;

namespace {

constexpr Seconds kFrame = 0.04_s;

bool isNear(Seconds one, Seconds other, Seconds tolerance) {
    return std::abs((one - other).count()) <= tolerance.count();
}

#define EXPECT_NEAR_SECONDS(one, other, tolerance)                                                 \
    EXPECT_NEAR(Seconds(one).count(), Seconds(other).count(), Seconds(tolerance).count())

class EveryFile : public testing::TestWithParam<Sample> {
protected:
    const Sample& sample() const { return GetParam(); }
    bool hasVideo() const { return sample().videoCount > 0; }
    TestPlayer::Notification open() {
        auto opened = mPlayer.open(samplePath(sample().name));
        EXPECT_EQ(opened.result, kOk);
        return opened;
    }

    /** What a paused player shows, or would let be heard next. */
    FrameWatch::Frame shownFrame() const {
        const auto frames = mWatch.prerolled(hasVideo());
        return frames.empty() ? FrameWatch::Frame{} : frames.back();
    }

    FrameWatch mWatch;
    TestPlayer mPlayer;
};

} // namespace

TEST_P(EveryFile, OpensPausedAtItsBeginAndTellsWhatItHas) {
    const auto opened = open();
    EXPECT_EQ(opened.result, kOk);
    EXPECT_EQ(opened.text, samplePath(sample().name).wstring());
    EXPECT_EQ(opened.param1, sample().videoCount);
    EXPECT_EQ(opened.param2, sample().audioCount);
    EXPECT_EQ(opened.param3, sample().textCount);
    EXPECT_NEAR_SECONDS(valueOf(opened), 4.0_s, 0.1_s);
    EXPECT_EQ(opened.uvalue1, 1U) << "seekable, not live";

    const auto changed = mPlayer.awaitState(kPaused);
    EXPECT_EQ(changed.param2, kNotReady);
    const auto status = mPlayer.status();
    EXPECT_EQ(status.state, kPaused);
    EXPECT_EQ(status.position, 0.0_s);
    // An estimate may have improved meanwhile.
    EXPECT_NEAR_SECONDS(status.duration, valueOf(opened),
                        std::max(0.001_s, Seconds(sample().tolerance)));
}

TEST_P(EveryFile, PlaysInRealTimeToItsEnd) {
    open();
    mPlayer.play();
    mPlayer.seek(3.2_s);
    const CpuWait wait;
    const auto begin = std::chrono::steady_clock::now();
    const Seconds left = mPlayer.status().duration - mPlayer.status().position;
    const auto end = mPlayer.await(kNotifyEnd);
    EXPECT_NEAR_SECONDS(std::chrono::steady_clock::now() - begin, left,
                        kSlowness * 0.3_s + wait.elapsed());
    EXPECT_NEAR_SECONDS(valueOf(end), 4.0_s, 0.1_s);
    const auto changed = mPlayer.awaitState(kEnded);
    EXPECT_EQ(changed.param2, kPlaying);
    EXPECT_EQ(mPlayer.status().state, kEnded);
    EXPECT_EQ(mPlayer.status().position, mPlayer.status().duration);
}

TEST_P(EveryFile, MovesForwardOnlyWhileItPlaysAndStandsWhilePaused) {
    open();
    mPlayer.play();
    Seconds last = 0.0_s;
    while (last < 0.4_s) {
        ASSERT_EQ(mPlayer.status().state, kPlaying);
        const Seconds now = mPlayer.status().position;
        ASSERT_GE(now, last);
        last = now;
    }
    const CpuWait wait;
    mPlayer.pause();
    const Seconds paused = mPlayer.status().position;
    EXPECT_NEAR_SECONDS(paused, last, kSlowness * 0.2_s + wait.elapsed());
    mWatch.clear();
    EXPECT_EQ(mPlayer.status().position, paused);
    mPlayer.play();
    EXPECT_NEAR_SECONDS(mPlayer.status().position, paused, kSlowness * 0.2_s + wait.elapsed());
    EXPECT_GE(mPlayer.status().position, paused);
}

TEST_P(EveryFile, SeeksAccuratelyToWithinAFrame) {
    open();
    for (const Seconds target : {2.52_s, 0.98_s, 3.3_s, 0.0_s}) {
        mWatch.clear();
        const auto done = mPlayer.seek(target);
        EXPECT_EQ(done.result, kOk);
        EXPECT_NEAR_SECONDS(valueOf(done), target, sample().tolerance);
        EXPECT_NEAR_SECONDS(mPlayer.status().position, valueOf(done), 0.001_s);
    }
}

TEST_P(EveryFile, ShowsThePictureItWasSentTo) {
    open();
    const Seconds begin = shownFrame().position;
    for (const Seconds target : {2.52_s, 0.98_s}) {
        mWatch.clear();
        mPlayer.seek(target);
        EXPECT_NEAR_SECONDS(shownFrame().position - begin, target,
                            std::max(kFrame + 0.01_s, Seconds(sample().tolerance)));
    }
}

TEST_P(EveryFile, SeeksToAKeyFrame) {
    open();
    const Seconds begin = shownFrame().position;
    for (const Seconds target : {2.3_s, 0.7_s}) {
        mWatch.clear();
        const auto done = mPlayer.seek(target, kSeekKeyFrame);
        EXPECT_EQ(done.result, kOk);
        const double distance = Seconds(sample().keyDistance).count();
        if (distance == 0) {
            EXPECT_NEAR_SECONDS(valueOf(done), target, 0.25_s);
            continue;
        }
        const double keys = (shownFrame().position - begin).count() / distance;
        EXPECT_NEAR(keys, std::round(keys), 0.05) << "not a key frame";
        EXPECT_NEAR_SECONDS(valueOf(done), target, sample().keyDistance);
    }
}

TEST_P(EveryFile, SeeksByADistanceFromWhereItIs) {
    open();
    mPlayer.seek(1.0_s);
    EXPECT_NEAR_SECONDS(valueOf(mPlayer.seek(1.5_s, kSeekRelative)), 2.5_s, 2 * sample().tolerance);
    EXPECT_NEAR_SECONDS(valueOf(mPlayer.seek(-0.5_s, kSeekRelative)), 2.0_s,
                        3 * sample().tolerance);
    EXPECT_EQ(valueOf(mPlayer.seek(-10.0_s, kSeekRelative)), 0.0_s);
}

TEST_P(EveryFile, PlaysOnAfterASeekAndStartsAgainAfterItsEnd) {
    open();
    mPlayer.play();
    mPlayer.seek(3.8_s);
    mPlayer.await(kNotifyEnd);
    mPlayer.awaitState(kEnded);
    mPlayer.play();
    EXPECT_LT(mPlayer.status().position, 1.0_s);
    mPlayer.seek(3.8_s);
    mPlayer.await(kNotifyEnd);
    const auto done = mPlayer.seek(1.0_s);
    EXPECT_EQ(done.result, kOk);
    mPlayer.awaitState(kPlaying);
    mPlayer.awaitPosition(1.2_s);
}

INSTANTIATE_TEST_SUITE_P(Player, EveryFile, testing::ValuesIn(timedSamples()),
                         [](const auto& instance) { return testName(instance.param.name); });

namespace {

class EveryPicture : public testing::TestWithParam<std::string> {
protected:
    TestPlayer mPlayer;
};

} // namespace

TEST_P(EveryPicture, OpensLikeAFilmWithoutAnEnd) {
    const auto opened = mPlayer.open(samplePath(GetParam()));
    EXPECT_EQ(opened.result, kOk);
    EXPECT_EQ(opened.param1, 1);
    EXPECT_EQ(opened.value, 0);
    mPlayer.play();
    mPlayer.awaitPosition(0.3_s);
    EXPECT_EQ(mPlayer.status().state, kPlaying);
    EXPECT_EQ(mPlayer.pendingCount(kNotifyEnd), 0U);
    EXPECT_EQ(valueOf(mPlayer.seek(100.0_s)), 100.0_s);
    mPlayer.awaitPosition(100.1_s);
    mPlayer.pause();
    EXPECT_EQ(valueOf(mPlayer.seek(-50.0_s, kSeekRelative)).count() > 49, true);
    EXPECT_EQ(mPlayer.status().state, kPaused);
}

INSTANTIATE_TEST_SUITE_P(Player, EveryPicture, testing::ValuesIn(pictureNames()),
                         [](const auto& instance) { return testName(instance.param); });

namespace {

struct RateCase {
    const char* name;
    int format;
    int least; ///< pictures a second
    int most;
};

class EveryDisplayRate : public testing::TestWithParam<RateCase> {
protected:
    FrameWatch mWatch;
    TestPlayer mPlayer;
};

} // namespace

TEST_P(EveryDisplayRate, ShowsNoMorePicturesThanTheDisplayAndNoneTooFew) {
    mPlayer.open(samplePath(GetParam().name), GetParam().format);
    mPlayer.play();
    mPlayer.awaitPosition(1.3_s);
    // A whole second by the pictures' own times, away from start and preroll.
    const auto frames = mWatch.rendered(true);
    ASSERT_FALSE(frames.empty());
    const Seconds begin = frames.front().runningTime + 0.1_s;
    const auto count = std::count_if(frames.begin(), frames.end(), [&](const auto& frame) {
        return frame.runningTime >= begin && frame.runningTime < begin + 1.0_s;
    });
    EXPECT_GE(count, GetParam().least);
    EXPECT_LE(count, GetParam().most);
}

INSTANTIATE_TEST_SUITE_P(Player, EveryDisplayRate,
                         testing::Values(RateCase{"fast.mp4", kDisplay60Hz, 58, 61},
                                         RateCase{"fast.mp4", kDisplay50Hz, 48, 51},
                                         RateCase{"fast.ts", kDisplay60Hz, 58, 61},
                                         RateCase{"sixty.mkv", kDisplay60Hz, 59, 61},
                                         RateCase{"sixty.mkv", kDisplay50Hz, 48, 51},
                                         RateCase{"silent.mp4", kDisplay50Hz, 24, 26}));

TEST(Player, CallsReturnAtOnce) {
    TestPlayer player;
    for (int round = 0; round < 5; ++round) {
        player.open(samplePath("film.mp4"));
        player.play();
        for (const Seconds target : {2.5_s, 0.5_s, 3.0_s, 1.0_s})
            player.seek(target);
        player.pause();
    }
    EXPECT_LT(player.medianCallTime(), kSlowness * 5.0);
}

TEST(Player, RemembersWhatIsOrderedWhileItOpens) {
    TestPlayer player;
    EXPECT_EQ(player->open(samplePath("film.mp4").wstring(), kDisplay60Hz), kOk);
    EXPECT_EQ(player->play(), kOk);
    EXPECT_EQ(player->seek(toNanoseconds(2.0_s), kSeekAccurate), kOk);
    EXPECT_EQ(player.await(kNotifyOpened).result, kOk);
    EXPECT_NEAR_SECONDS(valueOf(player.await(kNotifySeekDone)), 2.0_s, kFrame);
    if (player.status().state != kPlaying)
        player.awaitState(kPlaying);
    EXPECT_GE(player.status().position, 2.0_s);
}

TEST(Player, AnswersEverySeekAndEndsAtTheLast) {
    TestPlayer player;
    player.open(samplePath("longkey.mp4"));
    constexpr int kSeeks = 20;
    for (int seek = 1; seek <= kSeeks; ++seek)
        EXPECT_EQ(player->seek(toNanoseconds(1.0_s * seek), kSeekAccurate), kOk);
    TestPlayer::Notification last;
    for (int seek = 1; seek <= kSeeks; ++seek) {
        last = player.await(kNotifySeekDone);
        EXPECT_TRUE(last.result == kOk || last.result == kCancelled) << last.result;
    }
    EXPECT_EQ(last.result, kOk);
    EXPECT_NEAR_SECONDS(valueOf(last), 20.0_s, kFrame);
    EXPECT_TRUE(isNear(player.status().position, 20.0_s, kFrame));
}

TEST(Player, ASeekBeyondTheEndEndsThere) {
    TestPlayer player;
    player.open(samplePath("film.mp4"));
    player.play();
    EXPECT_EQ(player.seek(1000.0_s).result, kOk);
    player.await(kNotifyEnd);
    player.awaitState(kEnded);
    player->pause();
    EXPECT_EQ(player.seek(1.0_s).result, kOk);
    EXPECT_EQ(player.status().state, kPaused);
}

TEST(Player, OrdersWithoutAMediumAreRefused) {
    TestPlayer player;
    EXPECT_EQ(player->play(), kWrongState);
    EXPECT_EQ(player->pause(), kWrongState);
    EXPECT_EQ(player->seek(0, kSeekAccurate), kWrongState);
    EXPECT_EQ(player->dumpGraph(L"graph.dot"), kWrongState);
    EXPECT_EQ(player->close(), kOk);
    EXPECT_EQ(player.status().state, kClosed);
}

TEST(Player, IsNotReadyWhileItOpens) {
    TestPlayer player;
    player->open(samplePath("film.mp4").wstring(), kDisplay60Hz);
    EXPECT_EQ(player.status().state, kNotReady);
    EXPECT_EQ(player.status().position, 0.0_s);
    EXPECT_EQ(player.status().duration, 0.0_s);
    player.await(kNotifyOpened);
}

TEST(Player, RefusesASeekOfAnUnknownKind) {
    TestPlayer player;
    player.open(samplePath("film.mp4"));
    EXPECT_EQ(player->seek(0, 3), kWrongState);
    EXPECT_EQ(player->seek(0, -1), kWrongState);
}
