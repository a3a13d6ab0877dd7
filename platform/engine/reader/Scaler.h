// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "probe/AvTypes.h"
#include "reader/Layout.h"

namespace reader {

/** Scales and converts to pixels 0xAARRGGBB, by the frame's own colour matrix and range. */
bool scaleToPixels(const AVFrame& frame, Size size, std::vector<std::uint32_t>& pixels);

/** The library reads up to so many pixels more than there are. */
inline constexpr std::size_t kReadAhead = 64;

/**
 * Makes a frame of full range of such pixels, without scaling, for an encoder. The vector has
 * reserved room for kReadAhead more.
 */
bool convertFromPixels(const std::vector<std::uint32_t>& pixels, Size size, AVPixelFormat format,
                       AVFrame& frame);

} // namespace reader
