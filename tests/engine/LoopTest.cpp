// SPDX-License-Identifier: MIT
#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>
#include <thread>

#include "tests/engine/CpuWait.h"
#include "tests/engine/FrameWatch.h"
#include "tests/engine/Samples.h"
#include "tests/engine/TestPlayer.h"

using namespace LibMediaPlayer;

namespace {

constexpr Seconds kStart = 1.0_s;
constexpr Seconds kEnd = 1.4_s;
constexpr int kRounds = 3;

RepeatParam loop(Seconds start, Seconds end) {
    RepeatParam param;
    param.repeat = true;
    param.start = toNanoseconds(start);
    param.end = end < 0.0_s ? -1 : toNanoseconds(end);
    return param;
}

class EveryLoop : public testing::TestWithParam<Sample> {
protected:
    bool hasAudio() const { return GetParam().audioCount > 0; }

    /** Opens, and plays rounds of the loop. */
    void playRounds() {
        ASSERT_EQ(mPlayer.open(samplePath(GetParam().name)).result, kOk);
        RepeatParam param = loop(kStart, kEnd);
        ASSERT_EQ(mPlayer->repeat(param), kOk);
        mPlayer.seek(kStart);
        mWatch.clear();
        mPlayer.play();
        const CpuWait wait;
        const auto begin = std::chrono::steady_clock::now();
        for (int round = 0; round < kRounds; ++round) {
            const auto looped = mPlayer.await(kNotifyLoop);
            mWraps.push_back(std::chrono::steady_clock::now() - begin);
            EXPECT_NEAR(valueOf(looped).count(), kStart.count(), 0.1);
        }
        mWaited = wait.elapsed();
    }

    /** By how much the sink has run dry between two pieces of sound. */
    Seconds worstSilence() const {
        const auto frames = mWatch.rendered(false);
        EXPECT_GT(frames.size(), 2U);
        Seconds worst = 0.0_s;
        for (std::size_t index = 1; index < frames.size(); ++index) {
            const Seconds between = frames[index].moment - frames[index - 1].moment;
            worst = std::max(worst, between - frames[index - 1].duration);
        }
        return worst;
    }

    FrameWatch mWatch;
    TestPlayer mPlayer;
    std::vector<Seconds> mWraps; ///< since the playing began
    Seconds mWaited{};           ///< for a processor, in all rounds together
};

} // namespace

TEST_P(EveryLoop, GoesBackOnceARoundOnTimeAndWithoutAGap) {
    playRounds();
    const Seconds tolerance = kSlowness * std::max(0.1_s, Seconds(GetParam().tolerance)) + mWaited;
    for (std::size_t round = 0; round < mWraps.size(); ++round) {
        const double expected = static_cast<double>(round + 1) * (kEnd - kStart).count();
        EXPECT_NEAR(mWraps[round].count(), expected, tolerance.count());
    }
    if (hasAudio()) {
        EXPECT_LT(worstSilence(), kSlowness * 0.08_s + mWaited);
    }

    // And on, by what status() says.
    while (mPlayer.pendingCount(kNotifyLoop) == 0) {
        const Seconds position = mPlayer.status().position;
        ASSERT_GE(position, kStart - 0.1_s);
        ASSERT_LE(position, kEnd + 0.1_s);
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }

    RepeatParam param;
    ASSERT_EQ(mPlayer->repeat(param), kOk);
    mPlayer.awaitPosition(kEnd + 0.2_s);
    EXPECT_EQ(mPlayer.status().state, kPlaying);
    mPlayer.seek(3.7_s);
    mPlayer.await(kNotifyEnd);
}

TEST_P(EveryLoop, ToTheEndOfTheFileGoesBackFromThere) {
    ASSERT_EQ(mPlayer.open(samplePath(GetParam().name)).result, kOk);
    RepeatParam param = loop(3.4_s, -1.0_s);
    ASSERT_EQ(mPlayer->repeat(param), kOk);
    mPlayer.seek(3.4_s);
    mPlayer.play();
    for (int round = 0; round < 2; ++round)
        mPlayer.await(kNotifyLoop);
    EXPECT_EQ(mPlayer.pendingCount(kNotifyEnd), 0U);
    param.repeat = false;
    ASSERT_EQ(mPlayer->repeat(param), kOk);
    mPlayer.await(kNotifyEnd);
    mPlayer.awaitState(kEnded);
}

INSTANTIATE_TEST_SUITE_P(Player, EveryLoop, testing::ValuesIn(timedSamples()),
                         [](const auto& instance) { return testName(instance.param.name); });

TEST(Loop, BeforeThereIsAMediumIsForTheNextOne) {
    TestPlayer player;
    RepeatParam param = loop(0.0_s, 0.3_s);
    EXPECT_EQ(player->repeat(param), kOk);
    player.open(samplePath("film.mp4"));
    player.play();
    player.await(kNotifyLoop);
    player.open(samplePath("film.mp4"));
    player.play();
    player.awaitPosition(0.6_s);
    EXPECT_EQ(player.pendingCount(kNotifyLoop), 0U) << "it has ended with its medium";
}

TEST(Loop, WithoutAnythingInsideIsRefused) {
    TestPlayer player;
    RepeatParam param = loop(2.0_s, 1.0_s);
    EXPECT_EQ(player->repeat(param), kWrongState);
    param = loop(2.0_s, 2.0_s);
    EXPECT_EQ(player->repeat(param), kWrongState);
    player.open(samplePath("film.mp4"));
    param = loop(100.0_s, -1.0_s);
    EXPECT_EQ(player->repeat(param), kWrongState);
}

TEST(Loop, IsBroughtInsideTheMedium) {
    TestPlayer player;
    player.open(samplePath("film.mp4"));
    RepeatParam param = loop(-5.0_s, 100.0_s);
    EXPECT_EQ(player->repeat(param), kOk);
    EXPECT_EQ(param.start, 0);
    EXPECT_EQ(param.end, toNanoseconds(player.status().duration));
}

TEST(Loop, BehindThePositionIsEnteredAtItsStart) {
    TestPlayer player;
    player.open(samplePath("film.mp4"));
    player.seek(3.0_s);
    player.play();
    RepeatParam param = loop(kStart, kEnd);
    EXPECT_EQ(player->repeat(param), kOk);
    player.await(kNotifyLoop);
    EXPECT_LT(player.status().position, kEnd + 0.1_s);
    EXPECT_NEAR(valueOf(player.seek(3.0_s)).count(), kStart.count(), 0.05)
        << "a seek behind it goes to its start";
}

TEST(Loop, AheadOfThePositionIsEnteredByPlaying) {
    TestPlayer player;
    player.open(samplePath("film.mp4"));
    player.seek(0.8_s);
    RepeatParam param = loop(kStart, kEnd);
    EXPECT_EQ(player->repeat(param), kOk);
    EXPECT_NEAR(player.status().position.count(), 0.8, 0.05);
    player.play();
    player.await(kNotifyLoop);
}

TEST(Loop, OfAPictureGoesRoundToo) {
    TestPlayer player;
    player.open(samplePath("picture.jpg"));
    RepeatParam param = loop(0.0_s, 0.1_s);
    EXPECT_EQ(player->repeat(param), kOk);
    player.play();
    for (int round = 0; round < 3; ++round)
        player.await(kNotifyLoop);
}

TEST(Loop, TooShortToHearStillAnswersOrders) {
    TestPlayer player;
    player.open(samplePath("sound.mp3"));
    RepeatParam param = loop(1.0_s, 1.001_s);
    EXPECT_EQ(player->repeat(param), kOk);
    player.play();
    for (int round = 0; round < 5; ++round)
        player.await(kNotifyLoop);
    param.repeat = false;
    EXPECT_EQ(player->repeat(param), kOk);
    player.awaitPosition(1.2_s);
}

TEST(Loop, AfterALongWayFromTheKeyFrameKeepsTime) {
    TestPlayer player;
    player.open(samplePath("longkey.mp4"));
    RepeatParam param = loop(19.0_s, 19.5_s);
    player->repeat(param);
    player.seek(19.0_s);
    player.play();
    const CpuWait wait;
    const auto begin = std::chrono::steady_clock::now();
    for (int round = 0; round < kRounds; ++round)
        player.await(kNotifyLoop);
    const Seconds time = std::chrono::steady_clock::now() - begin;
    EXPECT_NEAR(time.count(), kRounds * 0.5, kSlowness * 0.1 + wait.elapsed().count());
}
