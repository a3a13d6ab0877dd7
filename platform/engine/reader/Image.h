// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>

#include "discoverer/ImageForm.h"
#include "probe/RegularFile.h"
#include "reader/Layout.h"

namespace reader {

/**
 * Writes the picture at `position` of a media file, fitted into `size`, to `output`. Sizes that
 * cannot be are refused before anything is read. Returns 0 or a LibMediaPlayer::Result.
 */
int drawImage(probe::RegularFile file, std::chrono::nanoseconds position, Size size,
              discoverer::ImageForm form, int output);

} // namespace reader
