// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "discoverer/Canvas.h"

namespace discoverer {

/**
 * Writes PNG or JPEG by the name's ending, otherwise the bare pixels; whole or not at all, in the
 * place of what was there. Returns 0 or a LibMediaPlayer::Result.
 */
int writeImage(const Canvas& canvas, const std::string& path);

} // namespace discoverer
