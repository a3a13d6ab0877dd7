// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>

#include "probe/MediaFile.h"

namespace reader {

/** A decoded picture and how it is to be looked at. */
struct Picture {
    probe::Frame frame;
    AVRational pixelAspect{1, 1};
    int rotation = 0; ///< degrees clockwise: 0, 90, 180 or 270
};

/**
 * No more frames than this are decoded on the way to a position, so that the answer does not
 * depend on how fast the machine is.
 */
inline constexpr int kFrameBudget = 500;

/**
 * The picture that is shown at `position` from the file's beginning: the frame that begins there
 * or last before. Where key frames lie further apart than kFrameBudget, the nearest one reached.
 * Of a file without video, its cover. With a smaller budget, a picture at or soon after the last
 * key frame before `position`. Returns 0 or a LibMediaPlayer::Result.
 */
int findPicture(probe::MediaFile& file, std::chrono::nanoseconds position, Picture& picture,
                int frameBudget = kFrameBudget);

/** The picture that stands for the whole file. kNotAvailable when there is none. */
int findCover(probe::MediaFile& file, Picture& picture);

} // namespace reader
