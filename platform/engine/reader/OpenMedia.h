// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "probe/MediaFile.h"

namespace reader {

/** Opens a file that has something to play. Returns 0 or a LibMediaPlayer::Result. */
int openMedia(probe::RegularFile file, probe::MediaFile::Bounds bounds,
              std::unique_ptr<probe::MediaFile>& pFile);

} // namespace reader
