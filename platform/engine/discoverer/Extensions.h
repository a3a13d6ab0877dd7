// SPDX-License-Identifier: MIT
#pragma once

#include "LibMediaPlayer/IMediaDiscoverer.h"

namespace discoverer {

/** Those of files that the installed libraries can both describe and play. */
LibMediaPlayer::SupportedExtensions supportedExtensions();

} // namespace discoverer
