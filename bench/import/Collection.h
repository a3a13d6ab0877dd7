// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace bench {

/** What a collection is made of. */
struct CollectionPlan {
    int count = 0;
    std::vector<std::string> endings; ///< of files, in turn: mp3, flac, ogg
    bool hasCovers = false;
};

/**
 * Fills a folder with two seconds of sound a file, a hundred files a folder. Each has tags of its
 * own. The sound is encoded once and the rest copied, so that thousands take seconds. Returns the
 * files; throws std::runtime_error.
 */
std::vector<std::string> makeCollection(const std::filesystem::path& folder,
                                        const CollectionPlan& plan);

} // namespace bench
