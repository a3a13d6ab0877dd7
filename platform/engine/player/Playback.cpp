// SPDX-License-Identifier: MIT
#include "player/Playback.h"

#include <algorithm>
#include <utility>

#include "LibMediaPlayer/Result.h"

namespace engine {

using namespace LibMediaPlayer;

namespace {

constexpr std::chrono::seconds kSeekTime{5};

/** Rounds of a very short loop that are on their way at a time; the timeline holds more. */
constexpr std::size_t kMostJoins = 4;

/** While one of these plays, the next can be read. */
constexpr std::chrono::milliseconds kLongRound{200};

} // namespace

void Playback::attach(Pipeline* pipeline) {
    mpPipeline = pipeline;
    mTimelines = {};
    mOrigin.reset();
}

void Playback::begin(const Medium& medium) {
    mMedium = medium;
    mReady = true;
    hold(timeline().positionAt(mpPipeline->stoppedTime()));
    mReporter.setState(kPaused);
    mLoopChanged = mLoop.has_value();
    if (mNextSeek)
        startNextSeek();
    else
        applyLoop();
    applyPlaying();
}

void Playback::end() {
    hold(position());
    mReady = false;
    mFlight.reset();
    mpPipeline = nullptr;
}

void Playback::play() {
    mWantPlaying = true;
    if (!mReady)
        return;
    if (mReporter.state() == kEnded && !mFlight)
        seekQuietly(mLoop ? mLoop->start : Nanoseconds::zero());
    applyPlaying();
}

void Playback::pause() {
    mWantPlaying = false;
    if (!mReady)
        return;
    applyPlaying();
    stopClock();
    if (mReporter.state() == kPlaying)
        mReporter.setState(kPaused);
}

void Playback::seek(const SeekOrder& order) {
    Nanoseconds target = order.position;
    if (order.mode == kSeekRelative)
        target += mNextSeek ? mNextSeek->position : position();
    if (mNextSeek)
        mReporter.tell(kNotifySeekDone, kCancelled, position());
    mNextSeek = SeekOrder{target, order.mode};
    startNextSeek();
}

void Playback::repeat(const RepeatParam& param) {
    const bool looped = mLoop.has_value();
    mLoop.reset();
    if (param.repeat) {
        mLoop = Loop{Nanoseconds(param.start), std::nullopt};
        if (param.end >= 0)
            mLoop->end = Nanoseconds(param.end);
    }
    mLoopChanged = looped || mLoop;
    applyLoop();
}

void Playback::refreshClock() {
    if (mRunning)
        startClock();
}

void Playback::renewClock() {
    if (!mReady)
        return;
    mpPipeline->setState(GST_STATE_PAUSED);
    applyPlaying();
}

void Playback::onSinkEvent(const SinkEvent& event) {
    Timeline& timeline = mTimelines[static_cast<std::size_t>(event.kind)];
    if (event.what == SinkEvent::What::kFlushed) {
        timeline.clear();
        if (mFlight)
            mFlight->flushed = true;
        return;
    }
    // Some containers do not count from zero; what they begin with is the begin.
    if (!mOrigin)
        mOrigin = event.position;
    const bool joins = mJoins > 0 && &timeline == &mTimelines[reference()] && !timeline.isEmpty() &&
                       event.base > timeline.last().base;
    timeline.add({event.base, event.position - *mOrigin});
    if (joins) {
        --mJoins;
        mJoints.push_back(event.base);
    }
    refreshClock();
    finishSettledSeek();
}

void Playback::onEnd() {
    // With a seek on its way this is an end that has been left already.
    if (!mReady || mFlight || mMedium.still)
        return;
    if (mLoop) {
        goBack();
        return;
    }
    const Nanoseconds end = mMedium.duration > Nanoseconds::zero() ? mMedium.duration : position();
    hold(end);
    mReporter.tell(kNotifyEnd, kOk, end);
    mReporter.setState(kEnded);
}

void Playback::onPrerolled() {
    settleSeek();
}

void Playback::onPlaying() {
    if (!mReady || !mWantPlaying || mFlight || mpPipeline->state() != GST_STATE_PLAYING)
        return;
    startClock();
    mReporter.setState(kPlaying);
}

void Playback::onSegmentDone(Nanoseconds position) {
    if (!mReady || !mSegmented || (mFlight && !mFlight->flushed))
        return;
    if (mLoop)
        joinLoop();
    else
        leaveLoop(position);
}

void Playback::onBuffering(int percent) {
    MediaPlayerNotify buffering;
    buffering.type = kNotifyBuffering;
    buffering.param1 = percent;
    mReporter.tell(std::move(buffering));
    mBuffering = percent < 100 && !mMedium.live;
    if (!mReady)
        return;
    applyPlaying();
    if (mBuffering)
        stopClock();
}

void Playback::onDurationChanged() {
    const bool isNews = mReady && !mMedium.measured;
    const Nanoseconds duration = isNews ? mpPipeline->duration() : Nanoseconds::zero();
    if (duration == Nanoseconds::zero())
        return;
    mMedium.duration = duration;
    mReporter.setDuration(duration);
}

/** The message has undone the pipeline's change of state, so that it never tells of its end. */
void Playback::onDecoderComplaint() {
    if (!mReady)
        return;
    if (applyPlaying() == GST_STATE_CHANGE_SUCCESS)
        settleSeek();
}

TimePoint Playback::deadline() const {
    if (mFlight)
        return mFlight->deadline;
    if (!mRunning)
        return kNever;
    const auto momentOf = [this](Nanoseconds runningTime) {
        return mAnchor.moment + (runningTime - mAnchor.runningTime);
    };
    if (!mJoints.empty())
        return momentOf(mJoints.front());
    if (const auto end = watchedEnd())
        return momentOf(timeline().last().base + (*end - timeline().last().position));
    return kNever;
}

void Playback::onDeadline() {
    if (mFlight)
        finishSeek(kTimedOut);
    else if (!mJoints.empty())
        passJoint();
    else if (mLastEnd)
        onEnd();
    else
        goBack();
}

Nanoseconds Playback::position() const {
    if (mFlight)
        return mFlight->target;
    if (!mRunning)
        return mHeld;
    return clampToMedium(timeline().positionAt(mpPipeline->anchor().runningTime));
}

void Playback::startNextSeek() {
    if (!mReady || mFlight || !mNextSeek)
        return;
    const SeekOrder order = *std::exchange(mNextSeek, std::nullopt);
    const Nanoseconds target = clampToMedium(order.position);
    startSeek({isPastLoop(target) ? mLoop->start : target, true}, order.mode);
}

/** With a loop that can be joined, the segment is made to tell when it has been read. */
void Playback::startSeek(Flight flight, int mode) {
    flight.deadline = SteadyClock::now() + kSeekTime;
    mFlight = flight;
    mRunning = false;
    mReporter.hold(flight.target);
    if (mMedium.still) {
        seekInStill(flight);
        return;
    }
    forgetJoints();
    mSegmented = mLoop && mMedium.seamless;
    const auto stop = mSegmented ? mLoop->end : std::nullopt;
    mRoundEnd = stop;
    mLastEnd.reset();
    const int landing = mode == kSeekKeyFrame && mMedium.keyFrames
                            ? GST_SEEK_FLAG_KEY_UNIT | GST_SEEK_FLAG_SNAP_NEAREST
                            : static_cast<int>(GST_SEEK_FLAG_ACCURATE);
    const int flags =
        GST_SEEK_FLAG_FLUSH | landing | (mSegmented ? static_cast<int>(GST_SEEK_FLAG_SEGMENT) : 0);
    if (!seekPipeline(flags, flight.target, stop))
        finishSeek(kNotAvailable);
}

bool Playback::seekPipeline(int flags, Nanoseconds start, std::optional<Nanoseconds> stop) {
    const Nanoseconds origin = mOrigin.value_or(Nanoseconds::zero());
    if (stop)
        *stop += origin;
    return mpPipeline->seek(static_cast<GstSeekFlags>(flags), start + origin, stop);
}

void Playback::seekQuietly(Nanoseconds target) {
    startSeek({target});
}

/** Nothing moves but the clock. */
void Playback::seekInStill(const Flight& flight) {
    Timeline& timeline = mTimelines[reference()];
    timeline.clear();
    timeline.add({mpPipeline->anchor().runningTime, flight.target});
    finishSeek(kOk);
}

void Playback::settleSeek() {
    if (mFlight && mFlight->flushed)
        mFlight->settled = true;
    finishSettledSeek();
}

void Playback::finishSettledSeek() {
    if (mFlight && mFlight->settled && !timeline().isEmpty())
        finishSeek(kOk);
}

void Playback::finishSeek(int result) {
    const Flight flight = *std::exchange(mFlight, std::nullopt);
    if (result != kOk && flight.wraps) {
        mLoop.reset();
        onEnd();
        return;
    }
    hold(timeline().positionAt(mpPipeline->stoppedTime()));
    if (mReporter.state() == kEnded && !mWantPlaying && result == kOk)
        mReporter.setState(kPaused);
    if (flight.wraps)
        mReporter.tell(kNotifyLoop, kOk, mHeld);
    if (flight.announced)
        mReporter.tell(kNotifySeekDone, result, mHeld);
    onPlaying();
    startNextSeek();
    applyLoop();
}

/** Brings a change of the loop into effect. */
void Playback::applyLoop() {
    if (!mReady || mFlight || !std::exchange(mLoopChanged, false))
        return;
    fitLoop();
    if (mReporter.state() == kEnded)
        return;
    const Nanoseconds now = position();
    if (isPastLoop(now))
        seekQuietly(mLoop->start);
    else if (mLoop ? mMedium.seamless : mJoins > 0 || !mJoints.empty())
        seekQuietly(now);
    else
        refreshClock();
}

void Playback::fitLoop() {
    if (!mLoop || mMedium.duration == Nanoseconds::zero())
        return;
    if (mLoop->start >= mMedium.duration)
        mLoop.reset();
    else if (mLoop->end && *mLoop->end >= mMedium.duration)
        mLoop->end.reset();
}

void Playback::joinLoop() {
    // Asking for a round can wait for the one that is being read, and a return would be told late.
    const Nanoseconds round = mLoop->end.value_or(mMedium.duration) - mLoop->start;
    mJoinHeld = mJoins + mJoints.size() >= (round < kLongRound ? kMostJoins : 1);
    if (mJoinHeld)
        return;
    ++mJoins;
    seekPipeline(GST_SEEK_FLAG_SEGMENT | GST_SEEK_FLAG_ACCURATE, mLoop->start, mLoop->end);
}

/** The loop was ended while its last round was already being read: the rest follows. */
void Playback::leaveLoop(Nanoseconds position) {
    mSegmented = false;
    if (mRoundEnd) {
        seekPipeline(GST_SEEK_FLAG_ACCURATE, *mRoundEnd, std::nullopt);
        return;
    }
    // That was all, and since it was a segment nobody tells when it has been played.
    mLastEnd = position > timeline().last().position ? position : mMedium.duration;
    refreshClock();
}

void Playback::passJoint() {
    mJoints.pop_front();
    mReporter.tell(kNotifyLoop, kOk, mLoop->start);
    if (mJoinHeld)
        joinLoop();
}

void Playback::goBack() {
    startSeek({mLoop->start, false, true});
}

void Playback::forgetJoints() {
    mJoins = 0;
    mJoints.clear();
    mJoinHeld = false;
}

bool Playback::isPastLoop(Nanoseconds position) const {
    return mLoop && mLoop->end && position >= *mLoop->end;
}

/** An end that nobody tells of. */
std::optional<Nanoseconds> Playback::watchedEnd() const {
    if (timeline().isEmpty())
        return std::nullopt;
    if (mLastEnd)
        return mLastEnd;
    return mLoop && !mSegmented ? mLoop->end : std::nullopt;
}

GstStateChangeReturn Playback::applyPlaying() {
    return mpPipeline->setState(mWantPlaying && !mBuffering ? GST_STATE_PLAYING : GST_STATE_PAUSED);
}

void Playback::startClock() {
    mRunning = true;
    mAnchor = mpPipeline->anchor();
    mReporter.run(timeline(), mAnchor, mLoop ? mLoop->end : mLastEnd);
}

void Playback::stopClock() {
    if (mRunning)
        hold(timeline().positionAt(mpPipeline->stoppedTime()));
}

void Playback::hold(Nanoseconds position) {
    mRunning = false;
    mHeld = clampToMedium(position);
    mReporter.hold(mHeld);
}

/** Sound tells the time more finely. */
std::size_t Playback::reference() const {
    constexpr auto kAudio = static_cast<std::size_t>(StreamKind::kAudio);
    return mTimelines[kAudio].isEmpty() ? static_cast<std::size_t>(StreamKind::kVideo) : kAudio;
}

Nanoseconds Playback::clampToMedium(Nanoseconds position) const {
    const Nanoseconds end =
        mMedium.duration > Nanoseconds::zero() ? mMedium.duration : Nanoseconds::max();
    return std::clamp(position, Nanoseconds::zero(), end);
}

} // namespace engine
