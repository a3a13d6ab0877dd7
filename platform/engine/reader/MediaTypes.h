// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "probe/MediaFile.h"

namespace reader {

/** The container's media type, such as "video/mp4"; "audio/mp4" when it holds sound alone. */
std::string containerType(probe::MediaFile& file);

/** The codec's media type, such as "video/x-h264". */
std::string codecType(const AVCodecParameters& stream);

} // namespace reader
