// SPDX-License-Identifier: MIT
#include "importer/Failure.h"

#include <system_error>

#include "LibMediaPlayer/Result.h"

namespace importer {

using namespace LibMediaPlayer;

namespace {

int resultOfErrno(int error) {
    switch (error) {
    case ENOENT:
    case ENOTDIR:
    case ENAMETOOLONG:
        return kNotFound;
    case EACCES:
    case EPERM:
    case EROFS:
    case ELOOP:
        return kAccessDenied;
    case ENOSPC:
    case EDQUOT:
    case EFBIG:
        return kNoSpace;
    default:
        return kNotAvailable;
    }
}

} // namespace

Failure systemFailure(const std::string& what, const std::string& path, int error) {
    return {resultOfErrno(error),
            what + ": " + path + " (" + std::generic_category().message(error) + ")"};
}

} // namespace importer
