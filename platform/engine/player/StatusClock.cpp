// SPDX-License-Identifier: MIT
#include "player/StatusClock.h"

#include <algorithm>

namespace engine {

void StatusClock::begin(std::uint64_t session, LibMediaPlayer::PlayerState state) {
    const std::lock_guard lock(mMutex);
    mSession = session;
    mState = state;
    mDuration = {};
    mRunning = false;
    mHeld = {};
}

StatusClock::Reading StatusClock::read() const {
    const std::lock_guard lock(mMutex);
    return {mState, position(), mDuration, mRunning ? mAnchor.moment : kNever};
}

void StatusClock::setState(std::uint64_t session, LibMediaPlayer::PlayerState state) {
    const std::lock_guard lock(mMutex);
    if (session == mSession)
        mState = state;
}

void StatusClock::setDuration(std::uint64_t session, Nanoseconds duration) {
    const std::lock_guard lock(mMutex);
    if (session == mSession)
        mDuration = duration;
}

void StatusClock::hold(std::uint64_t session, Nanoseconds position) {
    const std::lock_guard lock(mMutex);
    if (session != mSession)
        return;
    mRunning = false;
    mHeld = position;
}

void StatusClock::run(std::uint64_t session, const Timeline& timeline, const ClockAnchor& anchor,
                      std::optional<Nanoseconds> limit) {
    const std::lock_guard lock(mMutex);
    if (session != mSession)
        return;
    if (!mRunning)
        mLatest = {};
    mRunning = true;
    mTimeline = timeline;
    mAnchor = anchor;
    mLimit = limit;
}

Nanoseconds StatusClock::runningTime() const {
    const Nanoseconds now = mAnchor.runningTime + (SteadyClock::now() - mAnchor.moment);
    return mLatest = std::max(mLatest, now);
}

Nanoseconds StatusClock::position() const {
    if (!mRunning)
        return mHeld;
    const Nanoseconds end = mDuration > Nanoseconds::zero() ? mDuration : Nanoseconds::max();
    return std::min(mTimeline.positionAt(runningTime()), mLimit.value_or(end));
}

} // namespace engine
