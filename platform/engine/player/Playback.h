// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstddef>
#include <deque>
#include <optional>

#include "player/Items.h"
#include "player/Pipeline.h"
#include "player/Reporter.h"
#include "player/Timeline.h"

namespace engine {

/** The A-B loop in effect; without an end it goes to the end of the medium. */
struct Loop {
    Nanoseconds start{};
    std::optional<Nanoseconds> end;
};

/**
 * Playing, pausing, seeking and looping of one medium. Orders that come before begin() are
 * remembered. Only the engine's thread uses it.
 *
 * A loop is joined ahead of time where the container allows it: the next round is asked for as
 * soon as the demuxer has read the present one, a second before that has been heard, and follows
 * it without a flush. Elsewhere the position is watched, and a flushing seek made at the end.
 */
class Playback {
public:
    struct Medium {
        bool still = false;     ///< a picture: time passes, but there is nothing to seek in
        bool live = false;      ///< does not wait for data, and cannot be stopped
        bool keyFrames = true;  ///< they can be found
        bool seamless = false;  ///< loops can be joined without a flush
        bool measured = false;  ///< the duration is exact, whatever the pipeline reckons
        Nanoseconds duration{}; ///< zero when unknown
    };

    explicit Playback(Reporter& reporter) : mReporter(reporter) {}

    /** Takes up a pipeline that is being opened, in the place of any other. */
    void attach(Pipeline* pipeline);

    /** The pipeline is ready, and stands at its first picture. */
    void begin(const Medium& medium);

    /** Ends for good, the pipeline goes. */
    void end();

    void play();
    void pause();
    void seek(const SeekOrder& order);
    void repeat(const LibMediaPlayer::RepeatParam& param);

    /** Compares the clock that status() reckons by with the pipeline's. */
    void refreshClock();

    /** Has the pipeline choose a clock again. */
    void renewClock();

    void onSinkEvent(const SinkEvent& event);
    void onEnd();
    void onPrerolled();
    void onPlaying();
    void onSegmentDone(Nanoseconds position);
    void onBuffering(int percent);
    void onDurationChanged();

    /** A decoder has called an error what is none. */
    void onDecoderComplaint();

    /** When onDeadline() wants to be called if nothing else happens. */
    [[nodiscard]] TimePoint deadline() const;
    void onDeadline();

    [[nodiscard]] Nanoseconds position() const;

private:
    /**
     * A seek on its way: it is over when, after a flush, the sinks have data again. Those of two
     * streams do not get it at once, and a pipeline may claim it early: no place, no data.
     */
    struct Flight {
        Nanoseconds target{};
        bool announced = false;
        bool wraps = false; ///< goes back to the start of the loop
        bool flushed = false;
        bool settled = false; ///< the pipeline says that the sinks have data
        TimePoint deadline{};
    };

    void startNextSeek();
    void startSeek(Flight flight, int mode = LibMediaPlayer::kSeekAccurate);
    void seekQuietly(Nanoseconds target);
    bool seekPipeline(int flags, Nanoseconds start, std::optional<Nanoseconds> stop);
    void seekInStill(const Flight& flight);
    void settleSeek();
    void finishSettledSeek();
    void finishSeek(int result);

    void applyLoop();
    void fitLoop();
    void joinLoop();
    void leaveLoop(Nanoseconds position);
    void passJoint();
    void goBack();
    void forgetJoints();
    [[nodiscard]] bool isPastLoop(Nanoseconds position) const;
    [[nodiscard]] std::optional<Nanoseconds> watchedEnd() const;

    GstStateChangeReturn applyPlaying();
    void startClock();
    void stopClock();
    void hold(Nanoseconds position);
    [[nodiscard]] std::size_t reference() const;
    [[nodiscard]] const Timeline& timeline() const { return mTimelines[reference()]; }
    [[nodiscard]] Nanoseconds clampToMedium(Nanoseconds position) const;

    Reporter& mReporter;
    Pipeline* mpPipeline = nullptr; ///< the session's; null when there is none
    bool mReady = false;
    Medium mMedium;

    bool mWantPlaying = false;
    bool mBuffering = false;
    bool mRunning = false; ///< the clock goes, by mAnchor; else it stands at mHeld
    ClockAnchor mAnchor;
    Nanoseconds mHeld{};
    std::optional<Nanoseconds> mOrigin; ///< the pipeline's name for the begin of the medium
    std::array<Timeline, 2> mTimelines; ///< by StreamKind

    std::optional<Flight> mFlight;
    std::optional<SeekOrder> mNextSeek; ///< only the latest counts

    std::optional<Loop> mLoop;
    bool mLoopChanged = false;
    bool mSegmented = false; ///< the present segment ends with a word, not the medium's end
    std::optional<Nanoseconds> mRoundEnd; ///< where such a segment ends, if before the medium
    std::optional<Nanoseconds> mLastEnd;  ///< where the medium ends that will not tell it
    bool mJoinHeld = false;               ///< a join is due but enough are on their way
    std::size_t mJoins = 0;               ///< asked for, not yet at the sinks
    std::deque<Nanoseconds> mJoints;      ///< running times at which the next rounds begin
};

} // namespace engine
