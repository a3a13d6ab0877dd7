// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>
#include <variant>

#include "probe/LookOutcome.h"
#include "probe/RegularFile.h"

namespace probe {

/** What a short look at a file told. */
struct MediaLook {
    struct Video {
        std::string codec; ///< libavcodec's name
        int width = 0;
        int height = 0;
        double frameRate = 0; ///< 0 when unknown
    };
    struct Audio {
        std::string codec;
    };

    std::string container; ///< libavformat's name, such as "mov,mp4,m4a,3gp,3g2,mj2"
    bool still = false;    ///< one picture, without time
    bool tagged = false;   ///< the stream begins with an ID3v2 tag
    Duration duration;
    int videoCount = 0; ///< without cover pictures
    int audioCount = 0;
    int textCount = 0;
    std::optional<Video> video; ///< the first stream of its kind
    std::optional<Audio> audio;
};

using LookResult = std::variant<MediaLook, LookFailure, LookUndecided>;

/**
 * Looks at a file without decoding: in well under a millisecond as a rule, and in a bounded time
 * whatever the file. Any thread.
 */
LookResult lookAt(RegularFile file);

} // namespace probe
