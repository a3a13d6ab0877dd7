// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

namespace probe {

/** What a frame of sound says of itself where no container does. */
struct FrameHeader {
    std::size_t size = 0;  ///< bytes, with the header
    int samples = 0;       ///< of each channel; 0 for a frame that goes with the one before
    int rate = 0;          ///< Hz
    unsigned int kind = 0; ///< equal in all frames of a stream
};

/** Nothing when the bytes are no header or too few. */
using ReadHeader = std::optional<FrameHeader>(std::string_view bytes);

/** No header that is read here is longer. */
inline constexpr std::size_t kLongestHeader = 7;

ReadHeader readMpegHeader; ///< layers I to III of MPEG-1 and -2
ReadHeader readAdtsHeader;
ReadHeader readAc3Header; ///< AC-3 and E-AC-3

/** Which of the two it is. */
bool isEnhancedAc3(std::string_view header);

} // namespace probe
