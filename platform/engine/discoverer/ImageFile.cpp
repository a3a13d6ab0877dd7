// SPDX-License-Identifier: MIT
#include "discoverer/ImageFile.h"

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <string_view>
#include <sys/stat.h>
#include <unistd.h>

#include "LibMediaPlayer/Result.h"
#include "base/UniqueFd.h"
#include "discoverer/ImageEncoder.h"

namespace discoverer {

using namespace LibMediaPlayer;

namespace {

bool endsWith(const std::string& path, std::string_view ending) {
    const auto isSame = [](char one, char other) {
        return (one >= 'A' && one <= 'Z' ? one - 'A' + 'a' : one) == other;
    };
    return path.size() >= ending.size() &&
           std::equal(ending.begin(), ending.end(), path.end() - static_cast<int>(ending.size()),
                      [&](char expected, char given) { return isSame(given, expected); });
}

int resultOfErrno(int error) {
    switch (error) {
    case ENOENT:
    case ENOTDIR:
        return kNotFound;
    case ENOSPC:
    case EDQUOT:
        return kNoSpace;
    case EACCES:
    case EPERM:
    case EROFS:
    case EISDIR:
        return kAccessDenied;
    default:
        return kNotAvailable;
    }
}

/** A file that has another name until it is whole. */
class WholeFile {
public:
    explicit WholeFile(const std::string& path)
        : mPath(path),
          mTemporary(path + ".part-" + std::to_string(::getpid()) + "-" +
                     std::to_string(++gNumber)),
          mFile(::open(mTemporary.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666)) {
        mResult = mFile ? kOk : resultOfErrno(errno);
    }
    ~WholeFile() {
        if (mFile)
            ::unlink(mTemporary.c_str());
    }
    WholeFile(const WholeFile&) = delete;
    WholeFile& operator=(const WholeFile&) = delete;

    void write(const void* data, std::size_t size) {
        const auto* bytes = static_cast<const char*>(data);
        while (mResult == kOk && size > 0) {
            const ssize_t count = ::write(mFile.get(), bytes, size);
            if (count < 0 && errno == EINTR)
                continue;
            if (count < 0) {
                mResult = resultOfErrno(errno);
                return;
            }
            size -= static_cast<std::size_t>(count);
            bytes += count;
        }
    }

    /** Gives it its name. */
    int finish() {
        if (mResult == kOk && ::rename(mTemporary.c_str(), mPath.c_str()) != 0)
            mResult = resultOfErrno(errno);
        if (mResult == kOk)
            mFile.reset();
        return mResult;
    }

private:
    static std::atomic<unsigned int> gNumber;

    const std::string mPath;
    const std::string mTemporary;
    qns::UniqueFd mFile;
    int mResult = kOk;
};

std::atomic<unsigned int> WholeFile::gNumber{0};

/** A file would take the place of a device or a folder. */
bool isTaken(const std::string& path) {
    struct stat status {};
    return ::stat(path.c_str(), &status) == 0 && !S_ISREG(status.st_mode);
}

int writeWhole(const std::string& path, const void* data, std::size_t size) {
    if (isTaken(path))
        return kAccessDenied;
    WholeFile file(path);
    file.write(data, size);
    return file.finish();
}

int writeEncoded(const Canvas& canvas, const Encoding& encoding, const std::string& path) {
    const probe::Packet packet = encode(canvas, encoding);
    if (!packet)
        return kInternal;
    return writeWhole(path, packet->data, static_cast<std::size_t>(packet->size));
}

} // namespace

int writeImage(const Canvas& canvas, const std::string& path) {
    if (endsWith(path, ".png"))
        return writeEncoded(canvas, kPng, path);
    if (endsWith(path, ".jpg") || endsWith(path, ".jpeg"))
        return writeEncoded(canvas, kJpeg, path);
    return writeWhole(path, canvas.pixels.data(), canvas.pixels.size() * sizeof(std::uint32_t));
}

} // namespace discoverer
