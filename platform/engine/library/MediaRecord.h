// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>

#include "LibMediaPlayer/IMediaDiscoverer.h"

namespace library {

/** One medium of the library. Paths are absolute, as the file system spells them. */
struct MediaRecord {
    std::string path;
    std::string source;        ///< where it was imported from; `path` when it was not copied
    std::int64_t size = 0;     ///< bytes
    std::int64_t modified = 0; ///< nanoseconds since 1970
    std::int64_t imported = 0; ///< seconds since 1970
    LibMediaPlayer::MediaMetaInfo info;
    bool hasPicture = true; ///< it has something that a thumbnail could show
};

} // namespace library
