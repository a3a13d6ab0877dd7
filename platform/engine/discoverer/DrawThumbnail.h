// SPDX-License-Identifier: MIT
#pragma once

#include "discoverer/Thumbnail.h"
#include "probe/RegularFile.h"

namespace discoverer {

/**
 * Draws the file's cover or, without one, an early picture of the film that is not dark. Ends in
 * five seconds, whatever the file.
 */
Thumbnail drawThumbnail(probe::RegularFile file);

} // namespace discoverer
