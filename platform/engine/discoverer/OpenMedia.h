// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>

#include "probe/MediaFile.h"

namespace discoverer {

/** Opens a file that has something to play. Returns 0 or a LibMediaPlayer::Result. */
int openMedia(const std::string& path, probe::MediaFile::Bounds bounds,
              std::unique_ptr<probe::MediaFile>& pFile);

} // namespace discoverer
