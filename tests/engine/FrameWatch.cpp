// SPDX-License-Identifier: MIT
#define GST_USE_UNSTABLE_API
#include "tests/engine/FrameWatch.h"

#include <algorithm>
#include <atomic>
#include <iterator>
#include <string_view>

#include <gst/gsttracer.h>

namespace {

/** Sinks can outlive a watch, but not know it: they reach it through here. */
std::mutex gMutex;
FrameWatch* gpWatch = nullptr;

void onHandoff(GstElement* sink, GstBuffer* buffer, GstPad* pad, gpointer) {
    FrameWatch::add(sink, buffer, pad, false);
}

void onPrerollHandoff(GstElement* sink, GstBuffer* buffer, GstPad* pad, gpointer) {
    FrameWatch::add(sink, buffer, pad, true);
}

void onNewElement(GObject*, GstClockTime, GstElement* element) {
    if (std::string_view(G_OBJECT_TYPE_NAME(element)) != "GstFakeSink")
        return;
    g_object_set(element, "signal-handoffs", TRUE, nullptr);
    g_signal_connect(element, "handoff", G_CALLBACK(onHandoff), nullptr);
    g_signal_connect(element, "preroll-handoff", G_CALLBACK(onPrerollHandoff), nullptr);
}

Seconds seconds(guint64 nanoseconds) {
    return GST_CLOCK_TIME_IS_VALID(nanoseconds) ? std::chrono::nanoseconds(nanoseconds)
                                                : std::chrono::nanoseconds(0);
}

} // namespace

FrameWatch::FrameWatch() {
    static std::once_flag once;
    std::call_once(once, [] {
        gst_init(nullptr, nullptr);
        gst_tracing_register_hook(nullptr, "element-new", G_CALLBACK(onNewElement));
    });
    const std::lock_guard lock(gMutex);
    gpWatch = this;
}

FrameWatch::~FrameWatch() {
    const std::lock_guard lock(gMutex);
    gpWatch = nullptr;
}

void FrameWatch::add(GstElement* sink, GstBuffer* buffer, GstPad* pad, bool preroll) {
    Frame frame;
    frame.moment = std::chrono::steady_clock::now();
    frame.isPreroll = preroll;
    frame.isVideo = std::string_view(GST_OBJECT_NAME(sink)).substr(0, 5) == "video";
    frame.duration = seconds(GST_BUFFER_DURATION(buffer));
    GstEvent* const event = gst_pad_get_sticky_event(pad, GST_EVENT_SEGMENT, 0);
    const GstSegment* segment = nullptr;
    gst_event_parse_segment(event, &segment);
    frame.position =
        seconds(gst_segment_to_stream_time(segment, GST_FORMAT_TIME, GST_BUFFER_PTS(buffer)));
    frame.runningTime =
        seconds(gst_segment_to_running_time(segment, GST_FORMAT_TIME, GST_BUFFER_PTS(buffer)));
    gst_event_unref(event);
    const std::lock_guard lock(gMutex);
    if (!gpWatch)
        return;
    const std::lock_guard frameLock(gpWatch->mMutex);
    gpWatch->mFrames.push_back(frame);
}

std::vector<FrameWatch::Frame> FrameWatch::frames() const {
    const std::lock_guard lock(mMutex);
    return mFrames;
}

std::vector<FrameWatch::Frame> FrameWatch::rendered(bool video) const {
    std::vector<Frame> chosen;
    const std::vector<Frame> all = frames();
    std::copy_if(all.begin(), all.end(), std::back_inserter(chosen),
                 [&](const Frame& frame) { return frame.isVideo == video && !frame.isPreroll; });
    return chosen;
}

std::vector<FrameWatch::Frame> FrameWatch::prerolled(bool video) const {
    std::vector<Frame> chosen;
    const std::vector<Frame> all = frames();
    std::copy_if(all.begin(), all.end(), std::back_inserter(chosen),
                 [&](const Frame& frame) { return frame.isVideo == video && frame.isPreroll; });
    return chosen;
}

void FrameWatch::clear() {
    const std::lock_guard lock(mMutex);
    mFrames.clear();
}
