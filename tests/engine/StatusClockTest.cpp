// SPDX-License-Identifier: MIT
#include "player/StatusClock.h"

#include <gtest/gtest.h>

using namespace std::chrono_literals;
using engine::ClockAnchor;
using engine::StatusClock;
using engine::SteadyClock;
using engine::Timeline;

namespace {

constexpr std::uint64_t kSession = 7;

class StatusClockTest : public testing::Test {
protected:
    StatusClockTest() { mClock.begin(kSession, LibMediaPlayer::kNotReady); }

    /** An anchor by which the running time is `ago` beyond `runningTime`. */
    static ClockAnchor anchor(engine::Nanoseconds runningTime, engine::Nanoseconds ago = 0ns) {
        return {SteadyClock::now() - ago, runningTime};
    }

    StatusClock mClock;
    Timeline mTimeline;
};

} // namespace

TEST_F(StatusClockTest, BeginsWithNothingButTheState) {
    const auto reading = mClock.read();
    EXPECT_EQ(reading.state, LibMediaPlayer::kNotReady);
    EXPECT_EQ(reading.position, 0ns);
    EXPECT_EQ(reading.duration, 0ns);
    EXPECT_EQ(reading.anchored, engine::kNever);
}

TEST_F(StatusClockTest, StandsWhereItIsHeld) {
    mClock.hold(kSession, 5s);
    EXPECT_EQ(mClock.read().position, 5s);
    EXPECT_EQ(mClock.read().position, 5s);
}

TEST_F(StatusClockTest, GoesWithTheClockAlongTheTimeline) {
    mTimeline.add({0s, 10s});
    mClock.run(kSession, mTimeline, anchor(1s, 500ms), std::nullopt);
    const auto position = mClock.read().position;
    EXPECT_GE(position, 11500ms);
    EXPECT_LT(position, 20s);
    EXPECT_GE(mClock.read().position, position);
}

TEST_F(StatusClockTest, DoesNotStepBackWhenTheClocksAreCompared) {
    mClock.run(kSession, mTimeline, anchor(10s), std::nullopt);
    const auto position = mClock.read().position;
    mClock.run(kSession, mTimeline, anchor(9s), std::nullopt);
    EXPECT_GE(mClock.read().position, position);
}

TEST_F(StatusClockTest, StopsAtTheEndOfTheMediumAndAtALimit) {
    mClock.setDuration(kSession, 20s);
    mClock.run(kSession, mTimeline, anchor(30s), std::nullopt);
    EXPECT_EQ(mClock.read().position, 20s);
    mClock.run(kSession, mTimeline, anchor(30s), 15s);
    EXPECT_EQ(mClock.read().position, 15s);
}

TEST_F(StatusClockTest, DropsWhatIsSaidOfAnotherSession) {
    mClock.hold(kSession - 1, 5s);
    mClock.setDuration(kSession - 1, 5s);
    mClock.setState(kSession - 1, LibMediaPlayer::kPlaying);
    mClock.run(kSession - 1, mTimeline, anchor(5s), std::nullopt);
    const auto reading = mClock.read();
    EXPECT_EQ(reading.state, LibMediaPlayer::kNotReady);
    EXPECT_EQ(reading.position, 0ns);
    EXPECT_EQ(reading.duration, 0ns);
}
