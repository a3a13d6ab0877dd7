// SPDX-License-Identifier: MIT
#include "player/Session.h"

#include <algorithm>
#include <atomic>
#include <string_view>
#include <unistd.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "player/ChainTable.h"
#include "player/FixedChain.h"
#include "player/FrameGate.h"
#include "player/PlaybinChain.h"
#include "worker/Media.h"

namespace engine {

using namespace LibMediaPlayer;

namespace {

constexpr std::chrono::milliseconds kOpenTime{4500};

/**
 * Of it for the first try of a file. Rarely GStreamer's threads wait for each other while a
 * pipeline is being built, and the same file opens at once in the next one.
 */
constexpr std::chrono::milliseconds kFirstTryTime{2700};

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

void countStreams(GstStreamCollection* streams, probe::MediaLook& look) {
    struct Counter {
        GstStreamType type;
        int probe::MediaLook::*count;
    };
    static constexpr Counter kCounters[] = {
        {GST_STREAM_TYPE_VIDEO, &probe::MediaLook::videoCount},
        {GST_STREAM_TYPE_AUDIO, &probe::MediaLook::audioCount},
        {GST_STREAM_TYPE_TEXT, &probe::MediaLook::textCount},
    };
    const guint size = gst_stream_collection_get_size(streams);
    for (const Counter& counter : kCounters) {
        look.*counter.count = 0;
        for (guint index = 0; index < size; ++index) {
            GstStream* const stream = gst_stream_collection_get_stream(streams, index);
            look.*counter.count += (gst_stream_get_stream_type(stream) & counter.type) != 0;
        }
    }
}

/**
 * Decoders call it an error when a seek near the end leaves them nothing to decode. What really
 * keeps a stream from going on is told by the demuxer too.
 */
bool isDecoderComplaint(GstMessage* message) {
    gst::Error details;
    gst_message_parse_error(message, details.out(), nullptr);
    return g_error_matches(details.get(), GST_STREAM_ERROR, GST_STREAM_ERROR_DECODE) != FALSE;
}

} // namespace

Session::Session(Front& front, const PlayerOptions& options, std::shared_ptr<EngineMailbox> mailbox,
                 std::shared_ptr<OpenTicket> ticket)
    : mOptions(options),
      mpMailbox(std::move(mailbox)),
      mpTicket(std::move(ticket)),
      mReporter(front, mpTicket->session()),
      mPlayback(mReporter) {}

Session::~Session() = default;

void Session::open() {
    mMedium = toMedium(mpTicket->path());
    mTriedAgain = mMedium.path.empty();
    mOpenDeadline = SteadyClock::now() + (mTriedAgain ? kOpenTime : kFirstTryTime);
    if (look() && !openFixedChain())
        openPlaybin();
}

/** False when that has settled the matter. */
bool Session::look() {
    if (mMedium.path.empty() && !mMedium.uri.empty())
        return true;
    probe::LookResult result = worker::lookAt(mMedium.path);
    if (const auto* const refused = std::get_if<probe::LookFailure>(&result)) {
        fail(failure(refused->result));
        return false;
    }
    if (auto* const told = std::get_if<probe::MediaLook>(&result))
        mLook = std::move(*told);
    return true;
}

bool Session::openFixedChain() {
    const auto plan = planChain(mLook, mOptions);
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

void Session::tryAgain() {
    mTriedAgain = true;
    mOpenDeadline = SteadyClock::now() + (kOpenTime - kFirstTryTime);
    openPlaybin();
}

void Session::start(Pipeline::Parts parts) {
    mPlayback.attach(nullptr);
    mpPipeline.reset();
    mpPipeline = std::make_unique<Pipeline>(std::move(parts), nextPipelineNumber(), mpMailbox);
    mPlayback.attach(mpPipeline.get());
    // Only a film that is known to be slow enough needs no watching.
    const int display = displayRate(mpTicket->format());
    const double film = mLook.video ? mLook.video->frameRate : 0;
    if (film <= 0 || film > display)
        mpPipeline->limitFrames(display);
    mLive = mpPipeline->setState(GST_STATE_PAUSED) == GST_STATE_CHANGE_NO_PREROLL;
    if (mLive)
        becomeReady();
}

void Session::becomeReady() {
    mOpenDeadline = kNever;
    if (!mpTicket->claimAnswer())
        return;
    const Nanoseconds duration = findDuration();
    mReporter.setDuration(duration);
    tellOpened(duration);
    mPlayback.begin({mLook.still, mLive, knowsKeyFrames(mLook), loopsSeamlessly(mLook),
                     mLook.duration.isMeasured, duration});
}

Nanoseconds Session::findDuration() const {
    if (mLook.still)
        return Nanoseconds::zero();
    if (mLook.duration.isMeasured)
        return mLook.duration.time;
    const Nanoseconds told = mpPipeline->duration();
    return told > Nanoseconds::zero() ? told : mLook.duration.time;
}

void Session::tellOpened(Nanoseconds duration) {
    MediaPlayerNotify opened;
    opened.type = kNotifyOpened;
    opened.text = mpTicket->path();
    opened.param1 = mLook.videoCount;
    opened.param2 = mLook.audioCount;
    opened.param3 = mLook.textCount;
    opened.uvalue1 = (mpPipeline->isSeekable() ? 1U : 0U) | (mLive ? 2U : 0U);
    opened.value = duration.count();
    mReporter.tell(std::move(opened));
}

void Session::fail(const Failure& failure) {
    const bool opening = isOpening();
    mOpenDeadline = kNever;
    mPlayback.end();
    mpPipeline.reset();
    if (!opening)
        mReporter.tellFailure(kNotifyFailure, failure);
    else if (mpTicket->claimAnswer())
        mReporter.tellFailure(kNotifyOpened, failure);
    mReporter.setState(kFailed);
}

void Session::take(DumpOrder& order) {
    if (mpPipeline)
        writeWhole(order.file.get(), mpPipeline->graph());
}

bool Session::owns(std::uint64_t pipeline) const {
    return mpPipeline && mpPipeline->number() == pipeline;
}

void Session::onMessage(GstMessage* message) {
    switch (GST_MESSAGE_TYPE(message)) {
    case GST_MESSAGE_ERROR:
        return onError(message);
    case GST_MESSAGE_EOS:
        return mPlayback.onEnd();
    case GST_MESSAGE_ASYNC_DONE:
        return onPrerolled();
    case GST_MESSAGE_STATE_CHANGED:
        return onStateChanged(message);
    case GST_MESSAGE_SEGMENT_DONE:
        return onSegmentDone(message);
    case GST_MESSAGE_BUFFERING:
        return onBuffering(message);
    case GST_MESSAGE_DURATION_CHANGED:
        return mPlayback.onDurationChanged();
    case GST_MESSAGE_STREAM_COLLECTION:
        return onStreams(message);
    case GST_MESSAGE_CLOCK_LOST:
        return mPlayback.renewClock();
    case GST_MESSAGE_LATENCY:
        return mpPipeline->updateLatency();
    default:
        return;
    }
}

void Session::onError(GstMessage* message) {
    // What does not fit the plan may still be played.
    if (isOpening() && mFixed)
        openPlaybin();
    else if (isOpening() || !isDecoderComplaint(message))
        fail(failureOf(message));
    else
        mPlayback.onDecoderComplaint();
}

void Session::onPrerolled() {
    if (isOpening())
        becomeReady();
    else
        mPlayback.onPrerolled();
}

void Session::onStateChanged(GstMessage* message) {
    GstState state = GST_STATE_NULL;
    gst_message_parse_state_changed(message, nullptr, &state, nullptr);
    if (state == GST_STATE_PLAYING)
        mPlayback.onPlaying();
}

void Session::onSegmentDone(GstMessage* message) {
    GstFormat format = GST_FORMAT_UNDEFINED;
    gint64 position = 0;
    gst_message_parse_segment_done(message, &format, &position);
    mPlayback.onSegmentDone(Nanoseconds(format == GST_FORMAT_TIME ? position : 0));
}

void Session::onBuffering(GstMessage* message) {
    gint percent = 0;
    gst_message_parse_buffering(message, &percent);
    mPlayback.onBuffering(percent);
}

/** Of a medium that could not be looked at beforehand. */
void Session::onStreams(GstMessage* message) {
    if (!mMedium.path.empty())
        return;
    GstStreamCollection* streams = nullptr;
    gst_message_parse_stream_collection(message, &streams);
    countStreams(gst::StreamCollection(gst::kAdopt, streams).get(), mLook);
}

TimePoint Session::deadline() const {
    return std::min(mOpenDeadline, mPlayback.deadline());
}

void Session::onDeadline() {
    if (!isOpening())
        mPlayback.onDeadline();
    else if (mTriedAgain)
        fail(failure(kTimedOut));
    else
        tryAgain();
}

} // namespace engine
