// SPDX-License-Identifier: MIT
#include "probe/RegularFile.h"

#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "handle/SystemResult.h"

namespace probe {

using namespace LibMediaPlayer;

int RegularFile::open(const std::string& path) {
    struct stat status {};
    if (::stat(path.c_str(), &status) != 0)
        return handle::resultOfErrno(errno);
    if (!S_ISREG(status.st_mode))
        return kNotMedia;
    qns::UniqueFd opened(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY));
    return opened ? adopt(std::move(opened)) : handle::resultOfErrno(errno);
}

int RegularFile::adopt(qns::UniqueFd opened) {
    struct stat status {};
    if (::fstat(opened.get(), &status) != 0 || !S_ISREG(status.st_mode) || status.st_size == 0)
        return kNotMedia;
    fd = std::move(opened);
    size = status.st_size;
    return kOk;
}

} // namespace probe
