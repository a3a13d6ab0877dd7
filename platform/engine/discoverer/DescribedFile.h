// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>

#include "discoverer/DetailsCache.h"

namespace discoverer {

/**
 * Tells what a file is; it is not opened when that is known. Returns 0 or a
 * LibMediaPlayer::Result. Any thread.
 */
int describeFile(const std::string& path, std::shared_ptr<const Details>& pDetails,
                 DetailsCache& cache = DetailsCache::shared());

} // namespace discoverer
