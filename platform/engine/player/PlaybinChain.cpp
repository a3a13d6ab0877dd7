// SPDX-License-Identifier: MIT
#include "player/PlaybinChain.h"

#include "player/Sinks.h"

namespace engine {

namespace {

/** Bits of the element's own "flags" property, whose type is not in a public header. */
enum PlaybinFlag : unsigned int {
    kVideo = 0x01,
    kAudio = 0x02,
    kNativeAudio = 0x20,
    kNativeVideo = 0x40
};

unsigned int playbinFlags(const PlayerOptions& options) {
    return (options.video() ? kVideo | kNativeVideo : 0U) |
           (options.audio() ? kAudio | kNativeAudio : 0U);
}

} // namespace

Pipeline::Parts buildPlaybinChain(const std::string& uri, const PlayerOptions& options) {
    Pipeline::Parts parts;
    parts.pipeline = gst::makeElement("playbin3", "player");
    parts.seekTarget = parts.pipeline;
    parts.videoSink = makeVideoSink(options.window);
    parts.audioSink = makeAudioSink();
    g_object_set(parts.pipeline.get(), "uri", uri.c_str(), "flags", playbinFlags(options),
                 "video-sink", parts.videoSink.get(), "audio-sink", parts.audioSink.get(), nullptr);
    return parts;
}

} // namespace engine
