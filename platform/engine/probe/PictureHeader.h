// SPDX-License-Identifier: MIT
#pragma once

#include "probe/AvTypes.h"

namespace probe {

/**
 * Fills in size, pixel format and profile of a JPEG or PNG picture that lies at the beginning of
 * the input, without decoding it; only the format's depth is that of the picture. False, and the
 * stream as it was, for other pictures and when the header is odd. Leaves the input where it was.
 */
bool readPictureHeader(AVIOContext& input, AVCodecParameters& stream);

} // namespace probe
