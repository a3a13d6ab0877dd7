// SPDX-License-Identifier: MIT
#pragma once

#include "LibMediaPlayer/IMediaDiscoverer.h"

namespace discoverer {

/** All that reading a file tells of it. */
struct Details {
    LibMediaPlayer::MediaMetaInfo info;
    bool hasPicture = false; ///< a cover or a film
};

} // namespace discoverer
