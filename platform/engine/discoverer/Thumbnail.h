// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace discoverer {

/** A small picture of a file. */
struct Thumbnail {
    int result = 0; ///< 0 or a LibMediaPlayer::Result; kNotAvailable: the file has no picture
    std::string jpeg;
};

/** Neither side of a thumbnail is longer. Smaller pictures keep their size. */
inline constexpr int kThumbnailSide = 256;

} // namespace discoverer
