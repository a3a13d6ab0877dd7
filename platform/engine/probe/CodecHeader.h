// SPDX-License-Identifier: MIT
#pragma once

#include "probe/AvTypes.h"

namespace probe {

/**
 * Fills in what the header of a lossless codec, as the container keeps it, says: bits a sample,
 * and FLAC's rate and channels.
 */
void readLossless(AVCodecParameters& stream);

/** Whether an AAC header is all there is to know: no extension can double channels or rate. */
bool tellsAacFormat(const AVCodecParameters& stream);

/** Which layer a packet of MPEG sound belongs to, for demuxers that call all of them the third. */
AVCodecID layerOfMpeg(const AVPacket& packet);

/** The pixel format of a VP9 key frame, AV_PIX_FMT_NONE when it has to be decoded. */
AVPixelFormat pixelFormatOfVp9(const AVPacket& packet);

} // namespace probe
