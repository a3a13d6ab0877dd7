// SPDX-License-Identifier: MIT
#include "discoverer/ImageFile.h"

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <string_view>
#include <sys/sendfile.h>
#include <sys/stat.h>
#include <unistd.h>

#include "LibMediaPlayer/Result.h"
#include "base/UniqueFd.h"
#include "handle/SystemResult.h"

namespace discoverer {

using namespace LibMediaPlayer;

namespace {

constexpr std::size_t kLargestStep = 64 * 1024 * 1024;

bool endsWith(const std::string& path, std::string_view ending) {
    const auto isSame = [](char one, char other) {
        return (one >= 'A' && one <= 'Z' ? one - 'A' + 'a' : one) == other;
    };
    return path.size() >= ending.size() &&
           std::equal(ending.begin(), ending.end(), path.end() - static_cast<int>(ending.size()),
                      [&](char expected, char given) { return isSame(given, expected); });
}

/** A file that has another name until it is whole. */
class WholeFile {
public:
    explicit WholeFile(const std::string& path)
        : mPath(path),
          mTemporary(path + ".part-" + std::to_string(::getpid()) + "-" +
                     std::to_string(++gNumber)),
          mFile(::open(mTemporary.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666)) {
        mResult = mFile ? kOk : handle::resultOfErrno(errno);
    }
    ~WholeFile() {
        if (mFile)
            ::unlink(mTemporary.c_str());
    }
    WholeFile(const WholeFile&) = delete;
    WholeFile& operator=(const WholeFile&) = delete;

    /** All that `content` holds. */
    void fill(int content) {
        off_t place = 0;
        ssize_t count = 1;
        while (mResult == kOk && count > 0) {
            count = ::sendfile(mFile.get(), content, &place, kLargestStep);
            if (count < 0 && errno != EINTR)
                mResult = handle::resultOfErrno(errno);
        }
    }

    /** Gives it its name. */
    int finish() {
        if (mResult == kOk && ::rename(mTemporary.c_str(), mPath.c_str()) != 0)
            mResult = handle::resultOfErrno(errno);
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

} // namespace

ImageForm formOf(const std::string& path) {
    if (endsWith(path, ".png"))
        return ImageForm::kPng;
    return endsWith(path, ".jpg") || endsWith(path, ".jpeg") ? ImageForm::kJpeg
                                                             : ImageForm::kPixels;
}

int writeWhole(const std::string& path, int content) {
    if (isTaken(path))
        return kAccessDenied;
    WholeFile file(path);
    file.fill(content);
    return file.finish();
}

} // namespace discoverer
