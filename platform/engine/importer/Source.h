// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>
#include <sys/stat.h>

#include "base/UniqueFd.h"

namespace importer {

/** The path that a client's text means, a path or a file: URI; empty when it means no file. */
std::string pathOf(const std::wstring& text);

/** Nanoseconds since 1970. */
std::int64_t modifiedTime(const struct stat& status);

/** A file that is to be imported, open for reading. */
class Source {
public:
    /** Throws Failure when it is no readable regular file. */
    explicit Source(const std::wstring& text);

    [[nodiscard]] int file() const { return mFile.get(); }
    [[nodiscard]] const std::string& name() const { return mName; } ///< as the client calls it
    [[nodiscard]] const std::string& path() const { return mPath; } ///< without links
    [[nodiscard]] std::int64_t size() const { return mStatus.st_size; }
    [[nodiscard]] std::int64_t modified() const { return modifiedTime(mStatus); }
    [[nodiscard]] const struct stat& status() const { return mStatus; }

    /** True when the file was changed so lately that it may not be on its disk yet. */
    [[nodiscard]] bool mayBeUnwritten() const;

    /** Throws Failure when the file has changed since it was opened. */
    void checkUnchanged() const;

private:
    std::string mName;
    std::string mPath;
    qns::UniqueFd mFile;
    struct stat mStatus {};
};

} // namespace importer
