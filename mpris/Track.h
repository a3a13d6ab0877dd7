// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "qnsmedia/Types.h"

namespace mpris {

/** A medium as desktops see it. */
struct Track {
    int number = 0;                   ///< counts them from 1; 0: there is none
    std::string path;                 ///< path or URI; empty when it was open before we came
    qnsmedia::Nanoseconds duration{}; ///< 0 when unknown
    bool seekable = false;
    std::vector<std::pair<std::string, std::string>> tags; ///< as of qnsmedia::Metadata
    std::string picture;                                   ///< path of a file; empty without one

    bool operator==(const Track& other) const {
        return std::tie(number, path, duration, seekable, tags, picture) ==
               std::tie(other.number, other.path, other.duration, other.seekable, other.tags,
                        other.picture);
    }
};

} // namespace mpris
