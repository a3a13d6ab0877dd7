// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <string_view>

#include "probe/FileInput.h"

namespace probe {

/** Frames of sound and nothing else, so that only they tell how long it plays. */
bool isBareSound(std::string_view format);

struct CountedDuration {
    std::chrono::nanoseconds time{}; ///< 0 when nothing tells
    bool isExact = false;
};

/**
 * Reckons how long a file plays whose header does not say: from its frames' headers, its fragments'
 * or the time stamps at its end where that is possible, else from all packets that are left to be
 * read. Leaves the reader anywhere.
 */
CountedDuration countDuration(AVFormatContext& context, FileInput& input);

} // namespace probe
