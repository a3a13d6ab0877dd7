// SPDX-License-Identifier: MIT
#include "player/Reporter.h"

#include <utility>

namespace engine {

using namespace LibMediaPlayer;

void Reporter::setState(PlayerState state) {
    if (state == mState)
        return;
    MediaPlayerNotify changed;
    changed.type = kNotifyState;
    changed.param1 = state;
    changed.param2 = std::exchange(mState, state);
    mFront.status.setState(mSession, state);
    changed.value = mFront.status.read().position.count();
    tell(std::move(changed));
}

void Reporter::setDuration(Nanoseconds duration) {
    mFront.status.setDuration(mSession, duration);
}

void Reporter::hold(Nanoseconds position) {
    mFront.status.hold(mSession, position);
}

void Reporter::run(const Timeline& timeline, const ClockAnchor& anchor,
                   std::optional<Nanoseconds> limit) {
    mFront.status.run(mSession, timeline, anchor, limit);
}

void Reporter::tell(MediaPlayerNotify notification) {
    mFront.outlet.deliver(mSession, std::move(notification));
}

void Reporter::tell(PlayerNotifyType type, int result, Nanoseconds value) {
    MediaPlayerNotify notification;
    notification.type = type;
    notification.result = result;
    notification.value = value.count();
    tell(std::move(notification));
}

void Reporter::tellFailure(PlayerNotifyType type, const Failure& failure) {
    MediaPlayerNotify notification;
    notification.type = type;
    notification.result = failure.result;
    notification.text = failure.text;
    tell(std::move(notification));
}

} // namespace engine
