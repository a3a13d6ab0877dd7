// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>

#include "probe/FileInput.h"
#include "probe/FrameHeader.h"

namespace probe {

struct WalkedSound {
    std::chrono::nanoseconds time{};
    bool isWhole = false; ///< else reckoned from the part that could be read
};

/**
 * How long bare frames of sound play: goes from header to header without decoding, over whatever
 * lies between. Nothing when there is no frame.
 */
WalkedSound walkSound(FileInput& input, ReadHeader& read);

} // namespace probe
