// SPDX-License-Identifier: MIT
#pragma once

#include "probe/MediaFile.h"

namespace probe {

/**
 * Fills in what a file's header has left out of its video and audio streams: sizes after cropping,
 * pixel format, interlacing, what the sound really has in channels and rate. Reads each stream's
 * first packet, and further only where that is not enough.
 */
void complete(MediaFile& file);

} // namespace probe
