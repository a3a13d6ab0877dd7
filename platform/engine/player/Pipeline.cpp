// SPDX-License-Identifier: MIT
#include "player/Pipeline.h"

#include <algorithm>
#include <utility>

#include "player/FrameGate.h"
#include "player/SinkTap.h"

namespace engine {

Pipeline::Pipeline(Parts parts, std::uint64_t number, const std::shared_ptr<EngineMailbox>& mailbox)
    : mParts(std::move(parts)),
      mNumber(number),
      mpBusTap(std::make_unique<BusTap>(mParts.pipeline, number, mailbox)) {
    if (mParts.videoSink)
        mProbes.push_back(tapSink(mParts.videoSink, StreamKind::kVideo, number, mailbox));
    if (mParts.audioSink)
        mProbes.push_back(tapSink(mParts.audioSink, StreamKind::kAudio, number, mailbox));
}

Pipeline::~Pipeline() {
    // First nobody is told any more, then all streaming threads end, then the parts may go.
    mProbes.clear();
    mpBusTap.reset();
    mParts.signals.clear();
    gst_element_set_state(mParts.pipeline.get(), GST_STATE_NULL);
}

GstStateChangeReturn Pipeline::setState(GstState state) {
    return gst_element_set_state(mParts.pipeline.get(), state);
}

GstState Pipeline::state() const {
    GstState state = GST_STATE_NULL;
    gst_element_get_state(mParts.pipeline.get(), &state, nullptr, 0);
    return state;
}

bool Pipeline::seek(GstSeekFlags flags, Nanoseconds start, std::optional<Nanoseconds> stop) {
    GstEvent* const event =
        gst_event_new_seek(1.0, GST_FORMAT_TIME, flags, GST_SEEK_TYPE_SET, start.count(),
                           GST_SEEK_TYPE_SET, stop ? stop->count() : -1);
    return gst_element_send_event(mParts.seekTarget.get(), event) != FALSE;
}

ClockAnchor Pipeline::anchor() const {
    GstElement* const pipeline = mParts.pipeline.get();
    const gst::Clock clock(gst::kAdopt, gst_element_get_clock(pipeline));
    if (!clock || state() != GST_STATE_PLAYING)
        return {SteadyClock::now(), stoppedTime()};
    const auto base = static_cast<gint64>(gst_element_get_base_time(pipeline));
    const auto now = static_cast<gint64>(gst_clock_get_time(clock.get()));
    return {SteadyClock::now(), Nanoseconds(now - base)};
}

Nanoseconds Pipeline::stoppedTime() const {
    const GstClockTime time = gst_element_get_start_time(mParts.pipeline.get());
    return Nanoseconds(GST_CLOCK_TIME_IS_VALID(time) ? time : 0);
}

Nanoseconds Pipeline::duration() const {
    gint64 duration = 0;
    gst_element_query_duration(mParts.pipeline.get(), GST_FORMAT_TIME, &duration);
    return Nanoseconds(std::max<gint64>(duration, 0));
}

bool Pipeline::isSeekable() const {
    const gst::Query query(gst::kAdopt, gst_query_new_seeking(GST_FORMAT_TIME));
    gboolean seekable = FALSE;
    if (gst_element_query(mParts.pipeline.get(), query.get()))
        gst_query_parse_seeking(query.get(), nullptr, &seekable, nullptr, nullptr);
    return seekable != FALSE;
}

void Pipeline::updateLatency() {
    gst_bin_recalculate_latency(GST_BIN(mParts.pipeline.get()));
}

void Pipeline::limitFrames(int displayRate) {
    if (mParts.videoSink)
        mProbes.push_back(engine::limitFrames(mParts.videoSink, displayRate));
}

std::string Pipeline::graph() const {
    const gst::Chars dot(gst::kAdopt, gst_debug_bin_to_dot_data(GST_BIN(mParts.pipeline.get()),
                                                                GST_DEBUG_GRAPH_SHOW_ALL));
    return dot ? dot.get() : "";
}

} // namespace engine
