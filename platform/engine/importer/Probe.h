// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>

#include "LibMediaPlayer/IMediaDiscoverer.h"

namespace importer {

/** What reading a file's details came to. */
struct Probed {
    int result = 0; ///< a LibMediaPlayer::Result; the details count only when it is 0
    LibMediaPlayer::MediaMetaInfo info;
    bool hasPicture = true; ///< a cover or a film: a thumbnail can be drawn
};

/** Reads a file's details, in a bounded time whatever the file. Called by the worker's thread. */
using Probe = std::function<Probed(const std::string& path)>;

} // namespace importer
