// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <string>

/** How far an import of many files is. */
struct ImportProgress {
    std::size_t files = 0; ///< of which it is known what became of them
    std::size_t filesInAll = 0;
    std::int64_t bytes = 0;
    std::int64_t bytesInAll = 0;
    std::chrono::milliseconds elapsed{0};
};

/** One line of at most 79 columns: a bar, files, bytes, bytes a second and the time left. */
std::string progressText(const ImportProgress& progress);
