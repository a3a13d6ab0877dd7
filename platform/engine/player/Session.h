// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <memory>
#include <optional>

#include "player/Failure.h"
#include "player/Front.h"
#include "player/Items.h"
#include "player/Medium.h"
#include "player/Options.h"
#include "player/Pipeline.h"
#include "player/Playback.h"
#include "player/Reporter.h"
#include "probe/MediaLook.h"

namespace engine {

/**
 * One opened medium, from open() to the next open() or close(): how it is opened and how it
 * fails. In between Playback has the word. Only the engine's thread uses it.
 */
class Session {
public:
    Session(Front& front, const PlayerOptions& options, std::shared_ptr<EngineMailbox> mailbox,
            std::shared_ptr<OpenTicket> ticket);
    ~Session();
    Session(const Session&) = delete;
    Session& operator=(const Session&) = delete;

    /** Begins to open; the answer follows when the pipeline has told. */
    void open();

    void take(PlayOrder&) { mPlayback.play(); }
    void take(PauseOrder&) { mPlayback.pause(); }
    void take(SeekOrder& order) { mPlayback.seek(order); }
    void take(RepeatOrder& order) { mPlayback.repeat(order.param); }
    void take(RefreshOrder&) { mPlayback.refreshClock(); }
    void take(DumpOrder& order);

    [[nodiscard]] bool owns(std::uint64_t pipeline) const;
    void onMessage(GstMessage* message);
    void onSinkEvent(const SinkEvent& event) { mPlayback.onSinkEvent(event); }

    /** When onDeadline() wants to be called if nothing else happens. */
    [[nodiscard]] TimePoint deadline() const;
    void onDeadline();

private:
    [[nodiscard]] bool isOpening() const { return mOpenDeadline != kNever; }
    bool look();
    bool openFixedChain();
    void openPlaybin();
    void tryAgain();
    void start(Pipeline::Parts parts);
    void becomeReady();
    [[nodiscard]] Nanoseconds findDuration() const;
    void tellOpened(Nanoseconds duration);
    void fail(const Failure& failure);

    void onError(GstMessage* message);
    void onPrerolled();
    void onStateChanged(GstMessage* message);
    void onSegmentDone(GstMessage* message);
    void onBuffering(GstMessage* message);
    void onStreams(GstMessage* message);

    const PlayerOptions mOptions;
    const std::shared_ptr<EngineMailbox> mpMailbox;
    const std::shared_ptr<OpenTicket> mpTicket;
    Reporter mReporter;
    Playback mPlayback;

    TimePoint mOpenDeadline = kNever;
    Medium mMedium;
    probe::MediaLook mLook;
    bool mFixed = false; ///< the pipeline was planned, it did not find out by itself
    bool mLive = false;
    bool mTriedAgain = false; ///< a pipeline that does not come up is given up next time

    std::unique_ptr<Pipeline> mpPipeline; ///< last, so that it goes first
};

} // namespace engine
