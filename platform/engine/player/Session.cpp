// SPDX-License-Identifier: MIT
#include "player/Session.h"

#include <algorithm>
#include <atomic>
#include <unistd.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "player/ChainTable.h"
#include "player/FixedChain.h"
#include "player/PlaybinChain.h"

namespace engine {

using namespace LibMediaPlayer;

namespace {

constexpr std::chrono::milliseconds kOpenTime{4500};
constexpr std::chrono::seconds kSeekTime{5};

/** Numbers are never used again, so that late events find no wrong pipeline. */
std::uint64_t nextPipelineNumber() {
    static std::atomic<std::uint64_t> number{0};
    return ++number;
}

void writeWhole(int file, std::string_view text) {
    while (!text.empty()) {
        const ssize_t written = ::write(file, text.data(), text.size());
        if (written <= 0)
            return;
        text.remove_prefix(static_cast<std::size_t>(written));
    }
}

} // namespace

Session::Session(Front& front, const PlayerOptions& options, std::shared_ptr<EngineMailbox> mailbox,
                 std::shared_ptr<OpenTicket> ticket)
    : mFront(front),
      mOptions(options),
      mpMailbox(std::move(mailbox)),
      mpTicket(std::move(ticket)) {}

Session::~Session() = default;

void Session::open() {
    mOpenDeadline = SteadyClock::now() + kOpenTime;
    mMedium = toMedium(mpTicket->path());
    if (!mMedium.path.empty()) {
        const probe::LookResult result = probe::lookAt(mMedium.path);
        if (const auto* const refused = std::get_if<probe::LookFailure>(&result))
            return fail(failure(refused->result));
        if (const auto* const look = std::get_if<probe::MediaLook>(&result))
            mLook = *look;
    }
    if (!openFixedChain())
        openPlaybin();
}

bool Session::openFixedChain() {
    const auto plan = mLook ? planChain(*mLook, mOptions) : std::nullopt;
    auto parts = plan ? buildFixedChain(mMedium.path, *plan, mOptions) : std::nullopt;
    if (!parts)
        return false;
    mFixed = true;
    start(*std::move(parts));
    return true;
}

void Session::openPlaybin() {
    mFixed = false;
    start(buildPlaybinChain(mMedium.uri, mOptions));
}

void Session::start(Pipeline::Parts parts) {
    mTimelines = {};
    mpPipeline.reset();
    mpPipeline = std::make_unique<Pipeline>(std::move(parts), nextPipelineNumber(), mpMailbox);
    mLive = mpPipeline->setState(GST_STATE_PAUSED) == GST_STATE_CHANGE_NO_PREROLL;
    if (mLive)
        becomeReady();
}

void Session::take(PlayOrder&) {
    mWantPlaying = true;
    if (mState == kEnded && !mFlight)
        startSeek(Nanoseconds::zero(), kSeekAccurate, false);
    applyPlaying();
}

void Session::take(PauseOrder&) {
    mWantPlaying = false;
    if (mState == kNotReady || mState == kFailed)
        return;
    stopClock();
    applyPlaying();
    if (mState == kPlaying)
        setState(kPaused);
}

void Session::take(SeekOrder& order) {
    if (mNextSeek)
        notify(kNotifySeekDone, kCancelled, position());
    mNextSeek = SeekOrder{seekTarget(order), order.mode};
    startNextSeek();
}

void Session::take(RepeatOrder&) {}

void Session::take(DumpOrder& order) {
    if (mpPipeline)
        writeWhole(order.file.get(), mpPipeline->graph());
}

void Session::take(RefreshOrder&) {
    if (mState == kPlaying && !mFlight)
        startClock();
}

bool Session::owns(std::uint64_t pipeline) const {
    return mpPipeline && mpPipeline->number() == pipeline;
}

void Session::onMessage(GstMessage* message) {
    struct Handler {
        GstMessageType type;
        void (Session::*function)(GstMessage*);
    };
    static constexpr Handler kHandlers[] = {
        {GST_MESSAGE_ERROR, &Session::onError},
        {GST_MESSAGE_EOS, &Session::onEnd},
        {GST_MESSAGE_ASYNC_DONE, &Session::onPrerolled},
        {GST_MESSAGE_STATE_CHANGED, &Session::onStateChanged},
        {GST_MESSAGE_BUFFERING, &Session::onBuffering},
        {GST_MESSAGE_CLOCK_LOST, &Session::onClockLost},
        {GST_MESSAGE_LATENCY, &Session::onLatency},
    };
    for (const Handler& handler : kHandlers) {
        if (handler.type == GST_MESSAGE_TYPE(message))
            return (this->*handler.function)(message);
    }
}

void Session::onSinkEvent(const SinkEvent& event) {
    Timeline& timeline = mTimelines[static_cast<std::size_t>(event.kind)];
    if (event.what == SinkEvent::What::kSegment) {
        timeline.add({event.base, event.position});
        return;
    }
    timeline.clear();
    if (mFlight)
        mFlight->flushed = true;
}

TimePoint Session::deadline() const {
    if (mFlight)
        return std::min(mOpenDeadline, mFlight->deadline);
    return mOpenDeadline;
}

void Session::onDeadline() {
    const TimePoint now = SteadyClock::now();
    if (mOpenDeadline <= now)
        fail(failure(kTimedOut));
    else if (mFlight && mFlight->deadline <= now)
        finishSeek(kTimedOut);
}

void Session::onError(GstMessage* message) {
    // What does not fit the table may still be played.
    if (mState == kNotReady && mFixed)
        return openPlaybin();
    fail(failureOf(message));
}

void Session::onEnd(GstMessage*) {
    // With a seek on its way this is an end that has been left already.
    if (mFlight || mState == kNotReady)
        return;
    const Nanoseconds end = mDuration > Nanoseconds::zero() ? mDuration : position();
    mFront.status.hold(session(), end);
    notify(kNotifyEnd, kOk, end);
    setState(kEnded);
}

void Session::onPrerolled(GstMessage*) {
    if (mState == kNotReady)
        becomeReady();
    else if (mFlight && mFlight->flushed)
        finishSeek(kOk);
}

void Session::onStateChanged(GstMessage* message) {
    GstState state = GST_STATE_NULL;
    gst_message_parse_state_changed(message, nullptr, &state, nullptr);
    if (state != GST_STATE_PLAYING || !mWantPlaying || mFlight || mpPipeline->state() != state)
        return;
    startClock();
    setState(kPlaying);
}

void Session::onBuffering(GstMessage* message) {
    gint percent = 0;
    gst_message_parse_buffering(message, &percent);
    MediaPlayerNotify buffering;
    buffering.type = kNotifyBuffering;
    buffering.param1 = percent;
    notify(std::move(buffering));
    // A live source has no data to wait for.
    const bool buffers = percent < 100 && !mLive;
    if (buffers && !mBuffering)
        stopClock();
    mBuffering = buffers;
    applyPlaying();
}

void Session::onClockLost(GstMessage*) {
    mpPipeline->setState(GST_STATE_PAUSED);
    applyPlaying();
}

void Session::onLatency(GstMessage*) {
    mpPipeline->updateLatency();
}

void Session::becomeReady() {
    mOpenDeadline = kNever;
    if (!mpTicket->claimAnswer())
        return;
    mDuration = mpPipeline->duration();
    mFront.status.setDuration(session(), mDuration);
    mFront.status.hold(session(), position());
    tellOpened({});
    setState(kPaused);
    startNextSeek();
    applyPlaying();
}

void Session::fail(const Failure& failure) {
    mOpenDeadline = kNever;
    mFlight.reset();
    const bool opening = mState == kNotReady;
    mFront.status.hold(session(), opening ? Nanoseconds::zero() : position());
    mpPipeline.reset();
    if (!opening) {
        MediaPlayerNotify failed;
        failed.type = kNotifyFailure;
        failed.result = failure.result;
        failed.text = failure.text;
        notify(std::move(failed));
    } else if (mpTicket->claimAnswer()) {
        tellOpened(failure);
    }
    setState(kFailed);
}

void Session::tellOpened(const Failure& failure) {
    MediaPlayerNotify opened;
    opened.type = kNotifyOpened;
    opened.result = failure.result;
    opened.text = failure.result == kOk ? mpTicket->path() : failure.text;
    if (failure.result == kOk) {
        opened.value = mDuration.count();
        if (mLook) {
            opened.param1 = mLook->videoCount;
            opened.param2 = mLook->audioCount;
            opened.param3 = mLook->textCount;
        }
        opened.uvalue1 = (mpPipeline->isSeekable() ? 1U : 0U) | (mLive ? 2U : 0U);
    }
    notify(std::move(opened));
}

void Session::startSeek(Nanoseconds target, int mode, bool announced) {
    mFlight = Flight{target, announced, false, SteadyClock::now() + kSeekTime};
    mFront.status.hold(session(), target);
    const int landing = mode == kSeekKeyFrame ? GST_SEEK_FLAG_KEY_UNIT | GST_SEEK_FLAG_SNAP_NEAREST
                                              : static_cast<int>(GST_SEEK_FLAG_ACCURATE);
    const auto flags = static_cast<GstSeekFlags>(GST_SEEK_FLAG_FLUSH | landing);
    if (!mpPipeline->seek(flags, target, std::nullopt))
        finishSeek(kNotAvailable);
}

void Session::finishSeek(int result) {
    const Flight flight = *mFlight;
    mFlight.reset();
    const Nanoseconds landed = position();
    mFront.status.hold(session(), landed);
    if (mState == kEnded && !mWantPlaying && result == kOk)
        setState(kPaused);
    if (flight.announced)
        notify(kNotifySeekDone, result, landed);
    if (mWantPlaying && mpPipeline->state() == GST_STATE_PLAYING)
        startClock();
    startNextSeek();
}

void Session::startNextSeek() {
    if (mFlight || !mNextSeek || mState == kNotReady || mState == kFailed)
        return;
    const SeekOrder order = *std::exchange(mNextSeek, std::nullopt);
    const Nanoseconds end = mDuration > Nanoseconds::zero() ? mDuration : Nanoseconds::max();
    startSeek(std::clamp(order.position, Nanoseconds::zero(), end), order.mode, true);
}

Nanoseconds Session::seekTarget(const SeekOrder& order) const {
    if (order.mode != kSeekRelative)
        return order.position;
    if (mNextSeek)
        return mNextSeek->position + order.position;
    return position() + order.position;
}

void Session::applyPlaying() {
    if (mState == kNotReady || mState == kFailed)
        return;
    mpPipeline->setState(mWantPlaying && !mBuffering ? GST_STATE_PLAYING : GST_STATE_PAUSED);
}

void Session::startClock() {
    mFront.status.run(session(), timeline(), mpPipeline->anchor());
}

void Session::stopClock() {
    if (mState == kPlaying && !mFlight)
        mFront.status.hold(session(), position());
}

void Session::setState(PlayerState state) {
    if (state == mState)
        return;
    MediaPlayerNotify changed;
    changed.type = kNotifyState;
    changed.param1 = state;
    changed.param2 = std::exchange(mState, state);
    mFront.status.setState(session(), state);
    changed.value = mFront.status.read().position.count();
    notify(std::move(changed));
}

void Session::notify(int type, int result, Nanoseconds value) {
    MediaPlayerNotify notification;
    notification.type = type;
    notification.result = result;
    notification.value = value.count();
    notify(std::move(notification));
}

void Session::notify(MediaPlayerNotify notification) {
    mFront.outlet.deliver(session(), std::move(notification));
}

const Timeline& Session::timeline() const {
    const Timeline& audio = mTimelines[static_cast<std::size_t>(StreamKind::kAudio)];
    return audio.isEmpty() ? mTimelines[static_cast<std::size_t>(StreamKind::kVideo)] : audio;
}

Nanoseconds Session::position() const {
    if (mFlight)
        return mFlight->target;
    if (!mpPipeline)
        return Nanoseconds::zero();
    const Nanoseconds position = timeline().positionAt(mpPipeline->anchor().runningTime);
    return mDuration > Nanoseconds::zero() ? std::min(position, mDuration) : position;
}

} // namespace engine
