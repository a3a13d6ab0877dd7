// SPDX-License-Identifier: MIT
#include "mpris/PlayerModel.h"

#include <gtest/gtest.h>

using namespace std::chrono_literals;
using mpris::PlaybackStatus;
using mpris::PlayerModel;
using qnsmedia::NotificationKind;
using qnsmedia::PlayerNotification;
using qnsmedia::PlayerState;

namespace {

using Clock = PlayerModel::Clock;
using Jump = std::optional<PlayerModel::Position>;

constexpr Clock::time_point kBegin{1000s};

PlayerNotification note(NotificationKind kind, std::chrono::nanoseconds value = {}) {
    PlayerNotification told;
    told.kind = kind;
    told.value = value.count();
    return told;
}

PlayerNotification opened(const std::string& path, std::chrono::nanoseconds duration = 10s) {
    PlayerNotification told = note(NotificationKind::opened, duration);
    told.text = path;
    told.value1 = 1; // one can seek in it
    return told;
}

PlayerNotification state(PlayerState entered, std::chrono::nanoseconds position = {}) {
    PlayerNotification told = note(NotificationKind::state, position);
    told.param1 = static_cast<int>(entered);
    return told;
}

/** A model, and a clock that the test moves. */
class PlayerModelTest : public testing::Test {
protected:
    Jump take(const PlayerNotification& told) { return mModel.take(told, mNow); }

    Jump answer(PlayerState state, std::chrono::nanoseconds position = {},
                std::chrono::nanoseconds duration = 10s) {
        return mModel.take({state, position, duration}, mModel.epoch(), mNow);
    }

    void openAndPlay(const std::string& path = "/film") {
        take(opened(path));
        take(state(PlayerState::paused));
        take(state(PlayerState::playing));
    }

    [[nodiscard]] PlaybackStatus playback() const { return mModel.view().playback; }
    [[nodiscard]] PlayerModel::Position position() const { return mModel.position(mNow); }

    void expectNothing() const {
        EXPECT_FALSE(mModel.isOpen());
        EXPECT_EQ(playback(), PlaybackStatus::stopped);
        EXPECT_EQ(mModel.track().number, 0);
        EXPECT_FALSE(mModel.view().canPlay);
        EXPECT_EQ(position(), 0s);
    }

    PlayerModel mModel;
    Clock::time_point mNow = kBegin;
};

TEST_F(PlayerModelTest, HasNothingAtFirst) {
    expectNothing();
    EXPECT_FALSE(mModel.view().canPause);
    EXPECT_FALSE(mModel.view().canSeek);
}

TEST_F(PlayerModelTest, IsPausedWhenAMediumHasBeenOpened) {
    take(opened("/film"));
    EXPECT_EQ(playback(), PlaybackStatus::paused);
    EXPECT_EQ(mModel.track().path, "/film");
    EXPECT_EQ(mModel.track().duration, 10s);
    EXPECT_EQ(mModel.track().number, 1);
    EXPECT_TRUE(mModel.view().canPlay);
    EXPECT_TRUE(mModel.view().canPause);
    EXPECT_TRUE(mModel.view().canSeek);
}

TEST_F(PlayerModelTest, CannotSeekWhereTheMediumCannot) {
    PlayerNotification told = opened("http://radio", 0s);
    told.value1 = 2; // live
    take(told);
    EXPECT_FALSE(mModel.view().canSeek);
    EXPECT_TRUE(mModel.view().canPause);
}

TEST_F(PlayerModelTest, ReckonsThePositionWhileItPlays) {
    openAndPlay();
    mNow += 3s;
    EXPECT_EQ(position(), 3s);
    take(state(PlayerState::paused, 3100ms));
    mNow += 3s;
    EXPECT_EQ(position(), 3100ms);
}

TEST_F(PlayerModelTest, ReckonsNoPositionBeyondTheEnd) {
    openAndPlay();
    mNow += 11s;
    EXPECT_EQ(position(), 10s);
}

TEST_F(PlayerModelTest, ReckonsOnWhereNoEndIsKnown) {
    take(opened("http://radio", 0s));
    take(state(PlayerState::playing));
    mNow += 1h;
    EXPECT_EQ(position(), 1h);
}

TEST_F(PlayerModelTest, TellsWhereASeekOrALoopLed) {
    openAndPlay();
    mNow += 1s;
    EXPECT_EQ(take(note(NotificationKind::seekFinished, 5s)), Jump(5s));
    mNow += 1s;
    EXPECT_EQ(position(), 6s);
    EXPECT_EQ(take(note(NotificationKind::loop, 2s)), Jump(2s));
    EXPECT_EQ(position(), 2s);
}

TEST_F(PlayerModelTest, TellsNoJumpOfASeekThatFailed) {
    openAndPlay();
    PlayerNotification told = note(NotificationKind::seekFinished, 4s);
    told.result = 6;
    EXPECT_EQ(take(told), Jump());
    EXPECT_EQ(position(), 4s) << "where playback is";
}

TEST_F(PlayerModelTest, IsStoppedAtTheEndAndCanPlayAgain) {
    openAndPlay();
    mModel.setLoop(true);
    take(note(NotificationKind::end, 10s));
    take(state(PlayerState::ended, 10s));
    EXPECT_EQ(playback(), PlaybackStatus::stopped);
    EXPECT_EQ(position(), 10s);
    EXPECT_TRUE(mModel.isOpen());
    EXPECT_TRUE(mModel.view().canPlay);
    EXPECT_FALSE(mModel.view().loops) << "or it would not have ended";
    take(state(PlayerState::playing, 0s));
    EXPECT_EQ(playback(), PlaybackStatus::playing);
}

TEST_F(PlayerModelTest, KeepsTheTrackOfAFailure) {
    openAndPlay();
    take(note(NotificationKind::failure));
    take(state(PlayerState::failed));
    EXPECT_EQ(playback(), PlaybackStatus::stopped);
    EXPECT_FALSE(mModel.isOpen());
    EXPECT_EQ(mModel.track().path, "/film");
}

TEST_F(PlayerModelTest, HasNothingWhenAnOpenHasFailed) {
    openAndPlay();
    PlayerNotification told = opened("not found");
    told.result = 1;
    take(told);
    expectNothing();
}

TEST_F(PlayerModelTest, CountsTracksAndForgetsWhatBelongedToTheLast) {
    openAndPlay("/one");
    mModel.setLoop(true);
    mModel.setTags(1, {{"TITLE", "One"}});
    mModel.setPicture(1, "/1.jpg");
    mNow += 4s;
    take(opened("/one"));
    EXPECT_EQ(mModel.track().number, 2);
    EXPECT_TRUE(mModel.track().tags.empty());
    EXPECT_TRUE(mModel.track().picture.empty());
    EXPECT_FALSE(mModel.view().loops);
    EXPECT_EQ(position(), 0s);
}

TEST_F(PlayerModelTest, IgnoresWhatComesTooLateForATrack) {
    openAndPlay("/one");
    openAndPlay("/two");
    mModel.setTags(1, {{"TITLE", "One"}});
    mModel.setPicture(1, "/1.jpg");
    EXPECT_TRUE(mModel.track().tags.empty());
    EXPECT_TRUE(mModel.track().picture.empty());
}

TEST_F(PlayerModelTest, IsTheSameTrackWhenItIsOpenedAgainAfterAStop) {
    openAndPlay();
    mModel.setTags(1, {{"TITLE", "Film"}});
    mModel.setPicture(1, "/1.jpg");
    mNow += 4s;
    mModel.stopped();
    EXPECT_EQ(playback(), PlaybackStatus::stopped);
    EXPECT_EQ(position(), 0s);
    EXPECT_TRUE(mModel.view().canPlay);
    EXPECT_FALSE(mModel.view().canPause);
    EXPECT_FALSE(mModel.view().canSeek);
    take(opened("/film"));
    EXPECT_EQ(mModel.track().number, 1);
    EXPECT_EQ(mModel.track().tags.size(), 1U);
    EXPECT_EQ(mModel.track().picture, "/1.jpg");
}

TEST_F(PlayerModelTest, IgnoresWhatWasOnItsWayWhenItWasStopped) {
    openAndPlay();
    const int epoch = mModel.epoch();
    mModel.stopped();
    EXPECT_EQ(take(note(NotificationKind::seekFinished, 5s)), Jump());
    take(state(PlayerState::playing, 5s));
    mModel.take({PlayerState::playing, 5s, 10s}, epoch, mNow);
    EXPECT_EQ(playback(), PlaybackStatus::stopped);
    EXPECT_EQ(position(), 0s);
    EXPECT_EQ(mModel.track().number, 1);
}

TEST_F(PlayerModelTest, FindsAMediumThatWasOpenBefore) {
    EXPECT_EQ(answer(PlayerState::playing, 3s), Jump());
    EXPECT_EQ(playback(), PlaybackStatus::playing);
    EXPECT_EQ(position(), 3s);
    EXPECT_EQ(mModel.track().duration, 10s);
    EXPECT_TRUE(mModel.track().path.empty());
    EXPECT_TRUE(mModel.view().canSeek);
    mModel.stopped();
    expectNothing(); // since nobody knows what to open again
}

TEST_F(PlayerModelTest, FindsNoMediumWhereThereIsNone) {
    for (const PlayerState none :
         {PlayerState::unknown, PlayerState::closed, PlayerState::notReady, PlayerState::failed}) {
        answer(none);
        expectNothing();
    }
}

TEST_F(PlayerModelTest, LosesTheMediumThatAnotherClientCloses) {
    openAndPlay();
    answer(PlayerState::notReady);
    expectNothing();
}

TEST_F(PlayerModelTest, DoesNotLoseTheMediumToAnAnswerAboutTheLast) {
    openAndPlay("/one");
    const int before = mModel.epoch();
    openAndPlay("/two");
    mModel.take({PlayerState::notReady, 0s, 0s}, before, mNow);
    EXPECT_EQ(mModel.track().path, "/two");
    EXPECT_TRUE(mModel.isOpen());
}

TEST_F(PlayerModelTest, CorrectsThePositionQuietlyWhenLittleIsWrong) {
    openAndPlay();
    mNow += 2s;
    EXPECT_EQ(answer(PlayerState::playing, 2400ms), Jump());
    EXPECT_EQ(position(), 2400ms);
}

TEST_F(PlayerModelTest, TellsAJumpWhenPlaybackIsElsewhere) {
    openAndPlay();
    mNow += 3s;
    EXPECT_EQ(answer(PlayerState::playing, 1s), Jump(1s)) << "it had to wait for data";
    EXPECT_EQ(answer(PlayerState::playing, 2s), Jump(2s));
}

TEST_F(PlayerModelTest, TakesNoPositionFromBeforeAChange) {
    openAndPlay();
    mNow += 3s;
    EXPECT_EQ(answer(PlayerState::paused, 0s), Jump());
    EXPECT_EQ(position(), 3s);
    EXPECT_EQ(playback(), PlaybackStatus::playing);
}

TEST_F(PlayerModelTest, LearnsADurationThatIsFoundLater) {
    take(opened("/film", 0s));
    answer(PlayerState::paused, 0s, 12s);
    EXPECT_EQ(mModel.track().duration, 12s);
}

} // namespace
