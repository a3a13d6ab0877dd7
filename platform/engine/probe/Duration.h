// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>

#include "probe/AvTypes.h"

namespace probe {

/**
 * Reads all that is left and reckons how long it plays: from the first time stamp to the last, or,
 * in a stream without, the sum of its packets. Zero when no packet tells.
 */
std::chrono::nanoseconds countDuration(AVFormatContext& context);

} // namespace probe
