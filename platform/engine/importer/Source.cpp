// SPDX-License-Identifier: MIT
#include "importer/Source.h"

#include <cstdlib>
#include <ctime>
#include <fcntl.h>
#include <memory>

#include "LibMediaPlayer/Result.h"
#include "importer/Failure.h"
#include "player/Medium.h"
#include "text/Text.h"

namespace importer {

using namespace LibMediaPlayer;

namespace {

constexpr char kUnreadable[] = "The file cannot be read";

std::string withoutLinks(const std::string& path) {
    struct Free {
        void operator()(char* memory) const { std::free(memory); }
    };
    const std::unique_ptr<char, Free> real(::realpath(path.c_str(), nullptr));
    if (!real)
        throw systemFailure(kUnreadable, path);
    return real.get();
}

std::string lastName(const std::string& path) {
    return path.substr(path.rfind('/') + 1);
}

void requireRegular(const struct stat& status, const std::string& path) {
    if (!S_ISREG(status.st_mode))
        throw Failure(kNotMedia, "Only regular files can be imported: " + path);
}

} // namespace

std::string pathOf(const std::wstring& text) {
    std::string path = engine::toMedium(text).path;
    // A zero byte would make the system see another, shorter path.
    return path.find('\0') == std::string::npos ? path : std::string();
}

std::int64_t modifiedTime(const struct stat& status) {
    return status.st_mtim.tv_sec * INT64_C(1'000'000'000) + status.st_mtim.tv_nsec;
}

Source::Source(const std::wstring& text) {
    const std::string path = pathOf(text);
    if (path.empty())
        throw Failure(kWrongState, "Not the path of a file: " + engine::toBytes(text));
    mPath = withoutLinks(path);
    mName = lastName(path);
    // A pipe or a device could block, or be set going, by opening it alone.
    if (::stat(mPath.c_str(), &mStatus) != 0)
        throw systemFailure(kUnreadable, path);
    requireRegular(mStatus, path);
    mFile.reset(::open(mPath.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY));
    if (!mFile || ::fstat(mFile.get(), &mStatus) != 0)
        throw systemFailure(kUnreadable, path);
    requireRegular(mStatus, path);
}

bool Source::mayBeUnwritten() const {
    constexpr std::time_t kLongestInMemory = 300;
    return std::time(nullptr) < mStatus.st_ctim.tv_sec + kLongestInMemory;
}

void Source::checkUnchanged() const {
    struct stat now {};
    if (::fstat(mFile.get(), &now) != 0)
        throw systemFailure(kUnreadable, mPath);
    if (now.st_size != mStatus.st_size || modifiedTime(now) != modified())
        throw Failure(kNotAvailable, "The file changed while it was imported: " + mPath);
}

} // namespace importer
