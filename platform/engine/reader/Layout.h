// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <optional>

extern "C" {
#include <libavutil/rational.h>
}

namespace reader {

struct Size {
    int width = 0;
    int height = 0;
};

/** Pictures larger than this are refused. */
inline constexpr int kLongestSide = 16384;
inline constexpr std::int64_t kMostPixels = 32LL * 1024 * 1024;

/** Where a picture lies on its canvas; the rest stays black. */
struct Layout {
    Size canvas;
    Size picture; ///< as it is seen, so after its rotation
    int left = 0;
    int top = 0;
};

/** How large a frame is seen: with square pixels, and turned. */
Size naturalSize(Size frame, AVRational pixelAspect, int rotation);

/**
 * Fits a picture of that natural size into exactly width x height. One of them 0 follows from the
 * picture's aspect, both 0 is the natural size. Nothing when negative or too large.
 */
std::optional<Layout> layOut(Size natural, int width, int height);

} // namespace reader
