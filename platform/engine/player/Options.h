// SPDX-License-Identifier: MIT
#pragma once

#include "LibMediaPlayer/IMediaPlayer.h"

namespace engine {

/** What a player was created with. */
struct PlayerOptions {
    void* window = nullptr;
    unsigned int flags = 0;

    [[nodiscard]] bool video() const { return (flags & LibMediaPlayer::kPlayVideo) != 0; }
    [[nodiscard]] bool audio() const { return (flags & LibMediaPlayer::kPlayAudio) != 0; }
};

} // namespace engine
