// SPDX-License-Identifier: MIT
#pragma once

#include "probe/AvTypes.h"
#include "reader/Canvas.h"

namespace reader {

struct Encoding {
    AVCodecID codec;
    AVPixelFormat format;
    int quality; ///< of those that lose something: from 2, the best, to 31
};

inline constexpr Encoding kPng{AV_CODEC_ID_PNG, AV_PIX_FMT_RGB24, 0};
inline constexpr Encoding kJpeg{AV_CODEC_ID_MJPEG, AV_PIX_FMT_YUVJ444P, 3};
inline constexpr Encoding kSmallJpeg{AV_CODEC_ID_MJPEG, AV_PIX_FMT_YUVJ420P, 5};

/** A whole image file in memory; an empty handle when it cannot be made. */
probe::Packet encode(const Canvas& canvas, const Encoding& encoding);

} // namespace reader
