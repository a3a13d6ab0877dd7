// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <vector>

#include "discoverer/Layout.h"
#include "probe/AvTypes.h"

namespace discoverer {

/** Scales and converts to pixels 0xAARRGGBB, by the frame's own colour matrix and range. */
bool scaleToPixels(const AVFrame& frame, Size size, std::vector<std::uint32_t>& pixels);

/** Makes a frame of full range of such pixels, without scaling, for an encoder. */
bool convertFromPixels(const std::vector<std::uint32_t>& pixels, Size size, AVPixelFormat format,
                       AVFrame& frame);

} // namespace discoverer
