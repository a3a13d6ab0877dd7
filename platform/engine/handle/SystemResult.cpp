// SPDX-License-Identifier: MIT
#include "handle/SystemResult.h"

#include <cerrno>

#include "LibMediaPlayer/Result.h"

using namespace LibMediaPlayer;

int handle::resultOfErrno(int error) {
    switch (error) {
    case ENOENT:
    case ENOTDIR:
    case ENAMETOOLONG:
    case ELOOP:
        return kNotFound;
    case EACCES:
    case EPERM:
    case EROFS:
    case EISDIR:
        return kAccessDenied;
    case ENOSPC:
    case EDQUOT:
    case EFBIG:
        return kNoSpace;
    default:
        return kNotAvailable;
    }
}
