// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <memory>
#include <variant>

#include "LibMediaPlayer/IMediaPlayer.h"
#include "base/UniqueFd.h"
#include "gst/Types.h"
#include "player/Mailbox.h"
#include "player/OpenTicket.h"
#include "player/Time.h"

/** What arrives in the mailbox of an engine's thread: the player's orders and pipelines' events. */
namespace engine {

struct OpenOrder {
    std::shared_ptr<OpenTicket> ticket;
};
struct CloseOrder {};
struct QuitOrder {};
struct PlayOrder {};
struct PauseOrder {};
struct SeekOrder {
    Nanoseconds position{};
    int mode = LibMediaPlayer::kSeekAccurate;
};
struct RepeatOrder {
    LibMediaPlayer::RepeatParam param;
};
/** Write the graph to an open file. */
struct DumpOrder {
    qns::UniqueFd file;
};
/** Compare the status clock with the pipeline's. */
struct RefreshOrder {};

enum class StreamKind { kVideo, kAudio };

/** A message from the bus of the pipeline with that number. */
struct BusEvent {
    std::uint64_t pipeline = 0;
    gst::Message message;
};

/** What has reached a sink, in the order of the data: a flush, or the begin of a segment. */
struct SinkEvent {
    enum class What { kFlushed, kSegment };

    std::uint64_t pipeline = 0;
    StreamKind kind = StreamKind::kVideo;
    What what = What::kFlushed;
    Nanoseconds base{};     ///< running time at which the segment begins
    Nanoseconds position{}; ///< position in the medium there
};

using Item = std::variant<OpenOrder, CloseOrder, QuitOrder, PlayOrder, PauseOrder, SeekOrder,
                          RepeatOrder, DumpOrder, RefreshOrder, BusEvent, SinkEvent>;
using EngineMailbox = Mailbox<Item>;

} // namespace engine
