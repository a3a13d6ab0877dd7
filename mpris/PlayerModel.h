// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "mpris/Track.h"
#include "qnsmedia/Types.h"

namespace mpris {

enum class PlaybackStatus { stopped, paused, playing };

/** All that desktops see of the player, but for the position. */
struct View {
    PlaybackStatus playback = PlaybackStatus::stopped;
    bool loops = false;
    bool canPlay = false;
    bool canPause = false;
    bool canSeek = false;
    Track track;
};

/**
 * The daemon's player, as its notifications and answers tell. Where it is between them is
 * reckoned: other clients could lose their answers to many questions of ours.
 *
 * A close is not notified, so an answer that tells of it is believed, if it belongs to a question
 * about this very medium: each question goes with the epoch() in which it was asked.
 *
 * For one thread.
 */
class PlayerModel {
public:
    using Clock = std::chrono::steady_clock;
    using Position = qnsmedia::Nanoseconds;

    /** Returns the position if playback has jumped there. */
    std::optional<Position> take(const qnsmedia::PlayerNotification& told, Clock::time_point now);
    std::optional<Position> take(const qnsmedia::PlayerStatus& answer, int epoch,
                                 Clock::time_point now);

    /** We have closed the medium. Opened again, it will be the same track. */
    void stopped();
    void setLoop(bool loops) { mLoops = loops; }

    /** Ignored unless the track is still the one that is there. */
    void setTags(int track, std::vector<std::pair<std::string, std::string>> tags);
    void setPicture(int track, std::string path);

    [[nodiscard]] bool isOpen() const { return mOpen; }
    [[nodiscard]] int epoch() const { return mEpoch; }
    [[nodiscard]] const Track& track() const { return mTrack; }
    [[nodiscard]] Position position(Clock::time_point now) const;
    [[nodiscard]] View view() const;

private:
    void takeOpened(const qnsmedia::PlayerNotification& told, Clock::time_point now);
    void begin(Track track, qnsmedia::PlayerState state);
    void lose();
    void enter(qnsmedia::PlayerState state);
    void hold(Position position, Clock::time_point now);
    std::optional<Position> correct(const qnsmedia::PlayerStatus& answer, Clock::time_point now);

    int mEpoch = 0;
    int mTrackCount = 0;
    bool mOpen = false;
    qnsmedia::PlayerState mState = qnsmedia::PlayerState::closed;
    bool mLoops = false;
    Track mTrack;
    Position mPosition{}; ///< at mSince
    Clock::time_point mSince;
};

} // namespace mpris
