// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "player/Failure.h"
#include "player/Front.h"
#include "player/Items.h"
#include "player/Medium.h"
#include "player/Options.h"
#include "player/Pipeline.h"
#include "player/Timeline.h"
#include "probe/MediaLook.h"

namespace engine {

/**
 * One opened medium, from open() to the next open() or close(). Only the engine's thread uses it.
 * Orders that come while it opens are kept until it is ready.
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

    void take(PlayOrder&);
    void take(PauseOrder&);
    void take(SeekOrder& order);
    void take(RepeatOrder& order);
    void take(DumpOrder& order);
    void take(RefreshOrder&);

    [[nodiscard]] bool owns(std::uint64_t pipeline) const;
    void onMessage(GstMessage* message);
    void onSinkEvent(const SinkEvent& event);

    /** When onDeadline() wants to be called if nothing else happens. */
    [[nodiscard]] TimePoint deadline() const;
    void onDeadline();

private:
    /** A seek on its way: it is over when, after a flush, the sinks have data again. */
    struct Flight {
        Nanoseconds target{};
        bool announced = false;
        bool flushed = false;
        TimePoint deadline{};
    };

    void onError(GstMessage* message);
    void onEnd(GstMessage* message);
    void onPrerolled(GstMessage* message);
    void onStateChanged(GstMessage* message);
    void onBuffering(GstMessage* message);
    void onClockLost(GstMessage* message);
    void onLatency(GstMessage* message);

    bool openFixedChain();
    void openPlaybin();
    void start(Pipeline::Parts parts);
    void becomeReady();
    void fail(const Failure& failure);
    void tellOpened(const Failure& failure);

    void startSeek(Nanoseconds target, int mode, bool announced);
    void finishSeek(int result);
    void startNextSeek();
    [[nodiscard]] Nanoseconds seekTarget(const SeekOrder& order) const;

    void applyPlaying();
    void startClock();
    void stopClock();
    void setState(LibMediaPlayer::PlayerState state);
    void notify(int type, int result, Nanoseconds value);
    void notify(LibMediaPlayer::MediaPlayerNotify notification);

    [[nodiscard]] const Timeline& timeline() const;
    [[nodiscard]] Nanoseconds position() const;
    [[nodiscard]] std::uint64_t session() const { return mpTicket->session(); }

    Front& mFront;
    const PlayerOptions mOptions;
    const std::shared_ptr<EngineMailbox> mpMailbox;
    const std::shared_ptr<OpenTicket> mpTicket;

    Medium mMedium;
    std::optional<probe::MediaLook> mLook;
    bool mFixed = false; ///< the pipeline was planned, not found out by itself

    LibMediaPlayer::PlayerState mState = LibMediaPlayer::kNotReady;
    TimePoint mOpenDeadline = kNever;
    bool mWantPlaying = false;
    bool mBuffering = false;
    bool mLive = false;
    Nanoseconds mDuration{};
    std::array<Timeline, 2> mTimelines; ///< by StreamKind
    std::optional<Flight> mFlight;
    std::optional<SeekOrder> mNextSeek;

    std::unique_ptr<Pipeline> mpPipeline; ///< last, so that it goes first
};

} // namespace engine
