// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "gst/PadProbe.h"
#include "gst/Signal.h"
#include "gst/Types.h"
#include "player/BusTap.h"
#include "player/Items.h"
#include "player/StatusClock.h"

namespace engine {

/**
 * A pipeline that plays one medium, and the taps by which it tells of itself. For the engine's
 * thread; its operations may take long, and in a broken library for ever.
 */
class Pipeline {
public:
    /** The sinks are those of `pipeline`; either may be empty. */
    struct Parts {
        gst::Element pipeline;
        gst::Element videoSink;
        gst::Element audioSink;
        gst::Element seekTarget; ///< where seeks enter; by one sink they are made only once
        std::vector<gst::Signal> signals; ///< by which it builds itself
    };

    Pipeline(Parts parts, std::uint64_t number, const std::shared_ptr<EngineMailbox>& mailbox);
    ~Pipeline();
    Pipeline(const Pipeline&) = delete;
    Pipeline& operator=(const Pipeline&) = delete;

    [[nodiscard]] std::uint64_t number() const { return mNumber; }

    GstStateChangeReturn setState(GstState state);
    [[nodiscard]] GstState state() const;

    /** `stop` nothing: to the end. False when the medium cannot. */
    bool seek(GstSeekFlags flags, Nanoseconds start, std::optional<Nanoseconds> stop);

    [[nodiscard]] ClockAnchor anchor() const;

    /** The running time at which the pipeline was last paused, or flushed. */
    [[nodiscard]] Nanoseconds stoppedTime() const;

    [[nodiscard]] Nanoseconds duration() const; ///< 0 when unknown
    [[nodiscard]] bool isSeekable() const;
    void updateLatency();

    /** Keeps more pictures a second from the sink. */
    void limitFrames(int displayRate);

    /** The graph in Graphviz's dot format. */
    [[nodiscard]] std::string graph() const;

private:
    Parts mParts;
    const std::uint64_t mNumber;
    std::unique_ptr<BusTap> mpBusTap;
    std::vector<gst::PadProbe> mProbes;
};

} // namespace engine
