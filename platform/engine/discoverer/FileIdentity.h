// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>
#include <sys/stat.h>

namespace discoverer {

/** Tells a file with its present content from any other. Times in nanoseconds since 1970. */
struct FileIdentity {
    dev_t device = 0;
    ino_t inode = 0;
    std::int64_t size = 0;
    std::int64_t modified = 0;
    std::int64_t changed = 0; ///< unlike the other one it cannot be set back

    FileIdentity() = default;
    explicit FileIdentity(const struct stat& status);

    /** Of the file at `path`; one that no file has when there is none. */
    explicit FileIdentity(const std::string& path);

    /**
     * False for a file that changed just now: it could change again without another time, for
     * file systems count in steps of a few milliseconds.
     */
    [[nodiscard]] bool isSettled() const;

    friend bool operator==(const FileIdentity& one, const FileIdentity& other);
};

} // namespace discoverer
