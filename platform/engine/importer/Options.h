// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <functional>
#include <string>

#include "importer/Probe.h"
#include "importer/ThumbnailThread.h"

namespace importer {

/** What an importer works with. */
struct Options {
    std::string dataFolder; ///< absolute; empty when it is not known
    Probe probe;
    DrawThumbnail drawThumbnail;       ///< empty: nobody wants any
    std::function<void()> stopDrawing; ///< makes those return soon that are being drawn
    std::chrono::milliseconds progressInterval{200}; ///< at least so long between two
    std::chrono::microseconds notifyGap{300};        ///< at least so long between any two
};

/** The device's data directory; empty when it is not known. */
std::string dataFolder();

} // namespace importer
