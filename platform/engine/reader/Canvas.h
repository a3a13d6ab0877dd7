// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <vector>

#include "reader/FrameFinder.h"
#include "reader/Layout.h"

namespace reader {

/** Rows of opaque pixels 0xAARRGGBB. They have reserved room for kReadAhead more. */
struct Canvas {
    Size size;
    std::vector<std::uint32_t> pixels;
};

/** Draws the picture where the layout says. Returns 0 or a LibMediaPlayer::Result. */
int draw(const Picture& picture, const Layout& layout, Canvas& canvas);

} // namespace reader
