// SPDX-License-Identifier: MIT
#pragma once

namespace discoverer {

/** What an image file holds. */
enum class ImageForm : unsigned char {
    kPixels, ///< rows of 32-bit pixels 0xAARRGGBB, and nothing else
    kPng,
    kJpeg
};

} // namespace discoverer
