// SPDX-License-Identifier: MIT
#include "mpris/PlayerModel.h"

#include <algorithm>

using namespace std::chrono_literals;
using qnsmedia::NotificationKind;
using qnsmedia::PlayerState;

namespace mpris {
namespace {

/** What an answer is late by, and what the clocks drift, is less. */
constexpr auto kJump = 500ms;

bool hasMedium(PlayerState state) {
    return state == PlayerState::paused || state == PlayerState::playing ||
           state == PlayerState::ended;
}

Track trackOf(const qnsmedia::PlayerNotification& opened) {
    const qnsmedia::MediaInfo media = qnsmedia::mediaInfoOf(opened);
    Track track;
    track.path = opened.text;
    track.duration = media.duration;
    track.seekable = media.seekable;
    return track;
}

/** Of a medium that was open before we came. What has an end can be sought in, as a rule. */
Track trackOf(const qnsmedia::PlayerStatus& status) {
    Track track;
    track.duration = status.duration;
    track.seekable = status.duration > 0s;
    return track;
}

} // namespace

std::optional<PlayerModel::Position> PlayerModel::take(const qnsmedia::PlayerNotification& told,
                                                       Clock::time_point now) {
    if (told.kind == NotificationKind::opened)
        takeOpened(told, now);
    if (!mOpen)
        return std::nullopt;
    switch (told.kind) {
    case NotificationKind::state:
        hold(Position(told.value), now);
        enter(static_cast<PlayerState>(told.param1));
        return std::nullopt;
    case NotificationKind::end: // so there is no loop any more
        mLoops = false;
        return std::nullopt;
    case NotificationKind::loop:
    case NotificationKind::seekFinished:
        hold(Position(told.value), now);
        return told.result == 0 ? std::optional(mPosition) : std::nullopt;
    default:
        return std::nullopt;
    }
}

std::optional<PlayerModel::Position> PlayerModel::take(const qnsmedia::PlayerStatus& answer,
                                                       int epoch, Clock::time_point now) {
    if (epoch != mEpoch)
        return std::nullopt;
    if (mOpen && hasMedium(answer.state))
        return correct(answer, now);
    if (mOpen)
        lose();
    else if (hasMedium(answer.state)) {
        hold(answer.position, now);
        begin(trackOf(answer), answer.state);
    }
    return std::nullopt;
}

void PlayerModel::stopped() {
    enter(PlayerState::closed);
    if (mTrack.path.empty())
        lose();
}

void PlayerModel::setTags(int track, std::vector<std::pair<std::string, std::string>> tags) {
    if (track == mTrack.number)
        mTrack.tags = std::move(tags);
}

void PlayerModel::setPicture(int track, std::string path) {
    if (track == mTrack.number)
        mTrack.picture = std::move(path);
}

PlayerModel::Position PlayerModel::position(Clock::time_point now) const {
    if (mState != PlayerState::playing)
        return mPosition;
    const Position reckoned = mPosition + (now - mSince);
    return mTrack.duration > 0s ? std::min(reckoned, mTrack.duration) : reckoned;
}

View PlayerModel::view() const {
    View view;
    view.playback = mState == PlayerState::playing  ? PlaybackStatus::playing
                    : mState == PlayerState::paused ? PlaybackStatus::paused
                                                    : PlaybackStatus::stopped;
    view.loops = mLoops;
    view.canPlay = mTrack.number != 0;
    view.canPause = mOpen;
    view.canSeek = mOpen && mTrack.seekable;
    view.track = mTrack;
    return view;
}

void PlayerModel::takeOpened(const qnsmedia::PlayerNotification& told, Clock::time_point now) {
    const bool again = !mOpen && mTrack.path == told.text;
    Track before = std::exchange(mTrack, {});
    enter(PlayerState::closed);
    if (told.result != 0)
        return;
    hold({}, now);
    begin(trackOf(told), PlayerState::paused);
    if (!again)
        return;
    mTrack.number = before.number;
    mTrack.tags = std::move(before.tags);
    mTrack.picture = std::move(before.picture);
}

void PlayerModel::begin(Track track, PlayerState state) {
    mTrack = std::move(track);
    mTrack.number = ++mTrackCount;
    mOpen = true;
    enter(state);
}

void PlayerModel::lose() {
    enter(PlayerState::closed);
    mTrack = {};
}

void PlayerModel::enter(PlayerState state) {
    mState = state;
    if (hasMedium(state))
        return;
    mOpen = false;
    mLoops = false;
    mPosition = {};
    ++mEpoch;
}

void PlayerModel::hold(Position position, Clock::time_point now) {
    mPosition = position;
    mSince = now;
}

/** What differs in its state was asked before a change that is known already. */
std::optional<PlayerModel::Position> PlayerModel::correct(const qnsmedia::PlayerStatus& answer,
                                                          Clock::time_point now) {
    mTrack.duration = answer.duration;
    if (answer.state != mState)
        return std::nullopt;
    const Position distance = answer.position - position(now);
    hold(answer.position, now);
    return distance > kJump || distance < -kJump ? std::optional(mPosition) : std::nullopt;
}

} // namespace mpris
