// SPDX-License-Identifier: MIT
#pragma once

#include <optional>

#include "player/Options.h"
#include "probe/MediaLook.h"

namespace engine {

/** Element names of one stream's way from the container to its sink; null where none is needed. */
struct BranchPlan {
    const char* parser = nullptr;
    const char* decoder = nullptr;
};

/** A pipeline whose elements are known before it is built. */
struct ChainPlan {
    const char* tagReader = nullptr; ///< null when there are no tags before the container
    const char* container = nullptr; ///< demuxer or parser; null when the file is one picture
    std::optional<BranchPlan> video;
    std::optional<BranchPlan> audio;
};

/** How to play what the look found; nothing when that is not among the common kinds. */
std::optional<ChainPlan> planChain(const probe::MediaLook& look, const PlayerOptions& options);

/** True when the container knows its key frames; elsewhere every seek is an accurate one. */
bool knowsKeyFrames(const probe::MediaLook& look);

/** True when a loop over such a container can be joined without a flush. */
bool loopsSeamlessly(const probe::MediaLook& look);

} // namespace engine
