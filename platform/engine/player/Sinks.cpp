// SPDX-License-Identifier: MIT
#include "player/Sinks.h"

namespace engine {

namespace {

gst::Element makeClockedSink(const char* name) {
    gst::Element sink = gst::makeElement("fakesink", name);
    g_object_set(sink.get(), "sync", TRUE, "enable-last-sample", FALSE, nullptr);
    return sink;
}

} // namespace

gst::Element makeVideoSink(void*) {
    return makeClockedSink("video-sink");
}

gst::Element makeAudioSink() {
    return makeClockedSink("audio-sink");
}

} // namespace engine
