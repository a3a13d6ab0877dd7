// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <set>
#include <string>
#include <vector>

/** A file to import. */
struct ImportFile {
    std::string path;      ///< from the root
    std::string real;      ///< without symbolic links; the path where that cannot be told
    std::int64_t size = 0; ///< bytes, 0 when it cannot be told
};

/** What the arguments of an import come to. */
struct ImportFiles {
    std::vector<ImportFile> files;
    std::vector<std::string> unreadable; ///< folders that could not be read, each with the reason
};

/**
 * Files stay as they are, whatever they are; of folders all that is below, in the order of the
 * names, as far as the extension is one of `extensions` (lower case) and nothing hidden. No file
 * comes twice.
 */
ImportFiles findImportFiles(const std::vector<std::string>& paths,
                            const std::set<std::string>& extensions);
