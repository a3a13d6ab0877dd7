// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace bench {

/** What it took to get a collection into an empty database. */
struct ImportFigures {
    double seconds = 0;
    double secondsWithThumbnails = 0; ///< until there was one for each; 0 where there are none
    double peakMegabytes = 0;         ///< of resident memory, all processes together
    int known = 0;                    ///< files that the database has in the end
};

struct Collection {
    std::filesystem::path folder;
    std::vector<std::string> files; ///< all of the folder
};

/**
 * Each starts a process with an empty database in `scratch`, has it take in the files, and ends
 * it. The time counts from the request, or from the start where that begins to scan.
 */
ImportFigures importByDaemon(const Collection& collection, const std::filesystem::path& scratch);
ImportFigures importByMpd(const Collection& collection, const std::filesystem::path& scratch);
ImportFigures importByMinidlna(const Collection& collection, const std::filesystem::path& scratch);

} // namespace bench
