// SPDX-License-Identifier: MIT
#pragma once

#include "LibMediaPlayer/IMediaDiscoverer.h"
#include "probe/MediaFile.h"

namespace discoverer {

/** What a file is. Reads on in the file, and must be the last to do so. */
LibMediaPlayer::MediaMetaInfo describe(probe::MediaFile& file);

} // namespace discoverer
