// SPDX-License-Identifier: MIT
#pragma once

#include "discoverer/Details.h"
#include "probe/MediaFile.h"

namespace reader {

/** What a file is. Reads on in the file, and must be the last to do so. */
discoverer::Details readDetails(probe::MediaFile& file);

} // namespace reader
