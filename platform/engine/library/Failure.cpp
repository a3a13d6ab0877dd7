// SPDX-License-Identifier: MIT
#include "library/Failure.h"

#include <sqlite3.h>
#include <sys/statvfs.h>

#include "LibMediaPlayer/Result.h"

namespace library {

using namespace LibMediaPlayer;

namespace {

struct Meaning {
    int code; ///< SQLite's primary code
    int result;
    const char* text;
};

constexpr Meaning kMeanings[] = {
    {SQLITE_FULL, kNoSpace, "There is no space left for the media database"},
    {SQLITE_READONLY, kAccessDenied, "The media database may not be written"},
    {SQLITE_CANTOPEN, kAccessDenied, "The media database cannot be opened"},
    {SQLITE_PERM, kAccessDenied, "The media database may not be opened"},
    {SQLITE_BUSY, kNotAvailable, "The media database is locked by another program"},
    {SQLITE_LOCKED, kNotAvailable, "The media database is locked by another program"},
    {SQLITE_CORRUPT, kDamaged, "The media database is damaged"},
    {SQLITE_NOTADB, kDamaged, "The media database is not a database"},
    {SQLITE_IOERR, kNotAvailable, "The media database cannot be read or written"},
};

/** A full disk does not always say so: the file that readers share just fails to grow. */
bool isFull(const std::string& file) {
    struct statvfs space {};
    const std::string folder = file.substr(0, file.rfind('/') + 1);
    return ::statvfs(folder.c_str(), &space) == 0 && space.f_bavail == 0;
}

} // namespace

Error errorOf(const SQLite::Exception& exception, const std::string& file) {
    int code = exception.getErrorCode() & 0xff;
    if ((code == SQLITE_IOERR || code == SQLITE_CANTOPEN) && isFull(file))
        code = SQLITE_FULL;
    for (const Meaning& meaning : kMeanings) {
        if (meaning.code == code)
            return {meaning.result,
                    std::string(meaning.text) + ": " + file + " (" + exception.what() + ")",
                    meaning.result == kDamaged};
    }
    return {kInternal, "The media database failed: " + file + " (" + exception.what() + ")"};
}

} // namespace library
