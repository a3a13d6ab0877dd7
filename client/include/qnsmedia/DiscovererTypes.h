// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "qnsmedia/Types.h"

namespace qnsmedia {

struct Ratio {
    int numerator = 0;
    int denominator = 1;
};

struct VideoStream {
    std::string mediaType;   ///< such as "video/x-h264"
    std::string description; ///< the codec in words
    int width = 0;
    int height = 0;
    int depth = 0; ///< bits a pixel
    Ratio frameRate;
    Ratio pixelAspect{1, 1};
    bool interlaced = false;
    int bitRate = 0;    ///< bits a second, 0 when unknown
    int maxBitRate = 0; ///< bits a second, 0 when unknown
    bool stillPicture = false;
};

struct AudioStream {
    std::string mediaType;
    std::string description;
    int channels = 0;
    int sampleRate = 0; ///< Hz
    int depth = 0;      ///< bits a sample, 0 where the codec has no such thing
    int bitRate = 0;    ///< bits a second, 0 when unknown
    int maxBitRate = 0; ///< bits a second, 0 when unknown
};

/** What a file is. Texts are bytes in the daemon's locale: UTF-8, unless started otherwise. */
struct Metadata {
    std::string mediaType; ///< the container's, such as "video/mp4"
    bool seekable = false;
    bool live = false;
    Nanoseconds duration{0}; ///< 0 when unknown
    /** Names in capitals, such as TITLE, the well-known ones first. */
    std::vector<std::pair<std::string, std::string>> tags;
    std::vector<VideoStream> video; ///< one at most
    std::vector<AudioStream> audio; ///< eight at most
};

} // namespace qnsmedia
