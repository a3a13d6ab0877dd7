// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

#include "qnsmedia/Types.h"

/** A moment of a medium, as people write it. */
struct MediaTime {
    qnsmedia::Nanoseconds time{0};
    std::optional<double> percentage; ///< then this much of the duration, not `time`

    [[nodiscard]] qnsmedia::Nanoseconds in(qnsmedia::Nanoseconds duration) const;
};

/** Reads "90", "1:23.5", "1:02:03" or "50%"; nothing when it is none of these. */
std::optional<MediaTime> parseMediaTime(const std::string& text);
