// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <mutex>
#include <optional>

#include "LibMediaPlayer/IMediaPlayer.h"
#include "player/Time.h"
#include "player/Timeline.h"

namespace engine {

/** Running time and the moment at which it was read. */
struct ClockAnchor {
    TimePoint moment{};
    Nanoseconds runningTime{};
};

/**
 * What status() answers without asking the pipeline: the position is reckoned from the clock
 * while something plays, and stands still otherwise. Any thread may call it. What is written for
 * a session that is not the present one is dropped.
 */
class StatusClock {
public:
    struct Reading {
        LibMediaPlayer::PlayerState state = LibMediaPlayer::kClosed;
        Nanoseconds position{};
        Nanoseconds duration{};
        TimePoint anchored{}; ///< when the clock was last compared; kNever while it stands
    };

    /** Begins a session in which nothing is known but the state. */
    void begin(std::uint64_t session, LibMediaPlayer::PlayerState state);

    [[nodiscard]] Reading read() const;

    void setState(std::uint64_t session, LibMediaPlayer::PlayerState state);
    void setDuration(std::uint64_t session, Nanoseconds duration);

    /** Stops at a position. */
    void hold(std::uint64_t session, Nanoseconds position);

    /**
     * Runs along the timeline, and not beyond `limit`. Called again while it runs, with a newer
     * anchor, it does not step back.
     */
    void run(std::uint64_t session, const Timeline& timeline, const ClockAnchor& anchor,
             std::optional<Nanoseconds> limit);

private:
    [[nodiscard]] Nanoseconds runningTime() const;
    [[nodiscard]] Nanoseconds position() const;

    mutable std::mutex mMutex; ///< guards all below
    std::uint64_t mSession = 0;
    LibMediaPlayer::PlayerState mState = LibMediaPlayer::kClosed;
    Nanoseconds mDuration{};
    bool mRunning = false;
    Nanoseconds mHeld{};
    Timeline mTimeline;
    ClockAnchor mAnchor;
    std::optional<Nanoseconds> mLimit;
    mutable Nanoseconds mLatest{}; ///< the greatest running time told
};

} // namespace engine
