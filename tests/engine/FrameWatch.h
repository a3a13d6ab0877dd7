// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <vector>

#include <gst/gst.h>

#include "tests/engine/TestPlayer.h"

/**
 * Sees what the sinks of all pipelines of this process show and play, from the outside: it has
 * GStreamer tell of each new element, and listens to the sinks among them. One at a time, and
 * made before the player opens anything.
 */
class FrameWatch {
public:
    struct Frame {
        bool isVideo = false;
        bool isPreroll = false; ///< shown while paused
        Seconds position{};     ///< in the stream
        Seconds runningTime{};
        Seconds duration{};
        std::chrono::steady_clock::time_point moment;
    };

    FrameWatch();
    ~FrameWatch();
    FrameWatch(const FrameWatch&) = delete;
    FrameWatch& operator=(const FrameWatch&) = delete;

    /** All frames so far; clear() begins anew. */
    [[nodiscard]] std::vector<Frame> frames() const;
    [[nodiscard]] std::vector<Frame> rendered(bool video) const;
    [[nodiscard]] std::vector<Frame> prerolled(bool video) const;
    void clear();

    /** Called by sinks. */
    static void add(GstElement* sink, GstBuffer* buffer, GstPad* pad, bool preroll);

private:
    mutable std::mutex mMutex; ///< guards mFrames
    std::vector<Frame> mFrames;
};
