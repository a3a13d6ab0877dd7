// SPDX-License-Identifier: MIT
#include "player/Sinks.h"

#include <cstdlib>
#include <initializer_list>
#include <string>
#include <unistd.h>

#include <gst/video/videooverlay.h>

namespace engine {

namespace {

/**
 * A sink of a device, and what there must be before it is worth trying. They are tried in this
 * order, each by really opening the device. GStreamer's own way of choosing is not used: it
 * creates whatever is installed, and some of that ends the process where there is no display.
 */
struct Candidate {
    const char* factory;
    bool (*isLikely)();
};

bool isSet(const char* variable) {
    const char* const value = std::getenv(variable);
    return value && *value != '\0';
}

bool exists(const std::string& path) {
    return ::access(path.c_str(), F_OK) == 0;
}

bool hasSoundServer() {
    const char* const folder = std::getenv("XDG_RUNTIME_DIR");
    return isSet("PULSE_SERVER") || (folder && exists(std::string(folder) + "/pulse/native"));
}

constexpr Candidate kVideoCandidates[] = {
    {"waylandsink", [] { return isSet("WAYLAND_DISPLAY") && isSet("XDG_RUNTIME_DIR"); }},
    {"xvimagesink", [] { return isSet("DISPLAY"); }},
    {"ximagesink", [] { return isSet("DISPLAY"); }},
    {"kmssink",
     [] { return !isSet("DISPLAY") && !isSet("WAYLAND_DISPLAY") && exists("/dev/dri/card0"); }},
};

constexpr Candidate kAudioCandidates[] = {
    {"pulsesink", hasSoundServer},
    {"alsasink", [] { return exists("/dev/snd/controlC0"); }},
};

bool works(const char* factory) {
    const gst::Element sink = gst::makeElement(factory);
    if (!sink)
        return false;
    const bool opens =
        gst_element_set_state(sink.get(), GST_STATE_READY) != GST_STATE_CHANGE_FAILURE;
    gst_element_set_state(sink.get(), GST_STATE_NULL);
    return opens;
}

/** Null when there is no device. */
template<std::size_t size>
const char* choose(const Candidate (&candidates)[size]) {
    for (const Candidate& candidate : candidates) {
        if (candidate.isLikely() && works(candidate.factory))
            return candidate.factory;
    }
    return nullptr;
}

gst::Element makeClockedSink(const char* name) {
    gst::Element sink = gst::makeElement("fakesink", name);
    g_object_set(sink.get(), "sync", TRUE, "enable-last-sample", FALSE, nullptr);
    return sink;
}

/** Elements one behind the other as one; empty when one is not installed. */
gst::Element chainUp(const char* name, std::initializer_list<gst::Element> elements) {
    gst::Element bin(gst::kSink, gst_bin_new(name));
    const gst::Element* last = nullptr;
    for (const gst::Element& element : elements) {
        if (!element)
            return {};
        gst_bin_add(GST_BIN(bin.get()), element.get());
        if (last)
            gst_element_link(last->get(), element.get());
        last = &element;
    }
    const gst::Pad entry = gst::staticPad(*elements.begin(), "sink");
    gst_element_add_pad(bin.get(), gst_ghost_pad_new("sink", entry.get()));
    return bin;
}

} // namespace

gst::Element makeVideoSink(void* window) {
    static const char* const kDevice = choose(kVideoCandidates);
    if (!kDevice)
        return makeClockedSink("video-sink");
    const gst::Element device = gst::makeElement(kDevice);
    if (window && GST_IS_VIDEO_OVERLAY(device.get()))
        gst_video_overlay_set_window_handle(GST_VIDEO_OVERLAY(device.get()),
                                            reinterpret_cast<guintptr>(window));
    return chainUp("video-sink",
                   {gst::makeElement("videoconvert"), gst::makeElement("videoscale"), device});
}

gst::Element makeAudioSink() {
    static const char* const kDevice = choose(kAudioCandidates);
    if (!kDevice)
        return makeClockedSink("audio-sink");
    return chainUp("audio-sink", {gst::makeElement("audioconvert"),
                                  gst::makeElement("audioresample"), gst::makeElement(kDevice)});
}

} // namespace engine
