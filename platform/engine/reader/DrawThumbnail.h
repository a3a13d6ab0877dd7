// SPDX-License-Identifier: MIT
#pragma once

#include "discoverer/Thumbnail.h"
#include "probe/RegularFile.h"

namespace reader {

/**
 * Draws the file's cover or, without one, an early picture of the film that is not dark. Ends in
 * five seconds, whatever the file.
 */
discoverer::Thumbnail drawThumbnail(probe::RegularFile file);

} // namespace reader
