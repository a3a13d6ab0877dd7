// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "discoverer/ImageForm.h"

namespace discoverer {

/** By the name's ending; bare pixels when it says nothing. */
ImageForm formOf(const std::string& path);

/**
 * Writes what the descriptor `content` holds; whole or not at all, in the place of what was there.
 * Returns 0 or a LibMediaPlayer::Result.
 */
int writeWhole(const std::string& path, int content);

} // namespace discoverer
