// SPDX-License-Identifier: MIT
#pragma once

#include "LibMediaPlayer/IMediaDiscoverer.h"

namespace discoverer {

/**
 * Those of files that the installed libraries can both describe and play. Returns 0 or a
 * LibMediaPlayer::Result. Any thread.
 */
int findExtensions(LibMediaPlayer::SupportedExtensions& extensions);

} // namespace discoverer
