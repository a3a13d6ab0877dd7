// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>

namespace probe {

/** Why a file cannot be played: a LibMediaPlayer::Result. */
struct LookFailure {
    int result = 0;
};

/** The look had to end before it knew; the file may be good all the same. */
struct LookUndecided {};

struct Duration {
    std::chrono::nanoseconds time{};
    bool isMeasured = false; ///< from the packets' own times; exact
};

} // namespace probe
