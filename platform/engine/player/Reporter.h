// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "LibMediaPlayer/IMediaPlayer.h"
#include "player/Failure.h"
#include "player/Front.h"
#include "player/Time.h"

namespace engine {

/** Tells the outside what a session does. Only the engine's thread uses it. */
class Reporter {
public:
    Reporter(Front& front, std::uint64_t session) : mFront(front), mSession(session) {}

    [[nodiscard]] LibMediaPlayer::PlayerState state() const { return mState; }

    /** Notifies of the new state when it is one. */
    void setState(LibMediaPlayer::PlayerState state);

    void setDuration(Nanoseconds duration);
    void hold(Nanoseconds position);
    void run(const Timeline& timeline, const ClockAnchor& anchor, std::optional<Nanoseconds> limit);

    void tell(LibMediaPlayer::MediaPlayerNotify notification);
    void tell(LibMediaPlayer::PlayerNotifyType type, int result, Nanoseconds value);
    void tellFailure(LibMediaPlayer::PlayerNotifyType type, const Failure& failure);

private:
    Front& mFront;
    const std::uint64_t mSession;
    LibMediaPlayer::PlayerState mState = LibMediaPlayer::kNotReady;
};

} // namespace engine
