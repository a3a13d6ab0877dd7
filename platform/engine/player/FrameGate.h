// SPDX-License-Identifier: MIT
#pragma once

#include <optional>

#include "gst/PadProbe.h"
#include "gst/Types.h"
#include "player/Time.h"

namespace engine {

/**
 * Decides which pictures a display can show: no more in a second than it has, and every one of a
 * film that has no more. Frames are let through early or late by up to half a display period, so
 * that unevenly stamped ones of a fitting rate are not lost.
 */
class FrameGate {
public:
    explicit FrameGate(int displayRate)
        : mPeriod(Nanoseconds(std::chrono::seconds(1)) / displayRate) {}

    /** True when the frame of that time is to be shown. Times that step back begin anew. */
    bool passes(Nanoseconds time);

private:
    const Nanoseconds mPeriod;
    std::optional<Nanoseconds> mLatest;
    Nanoseconds mDue{};
};

/** Pictures a second of a display; the format value of open(). */
int displayRate(int format);

/** Keeps more pictures than the display shows from a sink. */
gst::PadProbe limitFrames(const gst::Element& sink, int displayRate);

} // namespace engine
