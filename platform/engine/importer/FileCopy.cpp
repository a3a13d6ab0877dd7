// SPDX-License-Identifier: MIT
#include "importer/FileCopy.h"

#include <algorithm>
#include <cerrno>
#include <fcntl.h>
#include <linux/fs.h>
#include <sys/ioctl.h>
#include <unistd.h>
#include <vector>

#include "LibMediaPlayer/Result.h"
#include "importer/Failure.h"

namespace importer {

namespace {

/** Small enough that a slow card takes it within the time in which a cancel must work. */
constexpr std::int64_t kChunk = 512 * 1024;

/** Written, but not yet known to be on the disk. */
constexpr std::int64_t kBacklog = 8 * kChunk;

constexpr char kWriting[] = "The file cannot be copied into the library";
constexpr char kReading[] = "The file cannot be read";

/** One copy: the ways to do it go on where the one before them stopped. */
class FileCopy {
public:
    FileCopy(int from, int to, std::int64_t size, const std::string& path,
             const CopyProgress& progress)
        : mFrom(from), mTo(to), mSize(size), mPath(path), mProgress(progress) {}

    void run() {
        if (shareBlocks())
            return;
        reserve();
        copyInKernel();
        readAndWrite();
    }

private:
    bool shareBlocks() {
        if (::ioctl(mTo, FICLONE, mFrom) != 0)
            return false;
        advance(mSize);
        return true;
    }

    void reserve() {
        // The size stays: some file systems would fill it with zeros, which takes long.
        if (mSize > 0 && ::fallocate(mTo, FALLOC_FL_KEEP_SIZE, 0, mSize) != 0 &&
            (errno == ENOSPC || errno == EDQUOT || errno == EFBIG))
            throw systemFailure(kWriting, mPath);
    }

    /** Until all is copied, or the file systems cannot do it together. */
    void copyInKernel() {
        while (mDone < mSize) {
            off_t from = mDone;
            off_t to = mDone;
            const ssize_t count = ::copy_file_range(mFrom, &from, mTo, &to, nextLength(), 0);
            if (count < 0 && (errno == ENOSPC || errno == EDQUOT))
                throw systemFailure(kWriting, mPath);
            if (count == 0 || (count < 0 && errno != EINTR))
                return;
            advance(std::max<ssize_t>(count, 0));
        }
    }

    void readAndWrite() {
        if (mDone == mSize)
            return;
        std::vector<char> buffer(static_cast<std::size_t>(kChunk));
        while (mDone < mSize) {
            const ssize_t count = ::pread(mFrom, buffer.data(), nextLength(), mDone);
            if (count < 0)
                throw systemFailure(kReading, mPath);
            if (count == 0)
                throw Failure(LibMediaPlayer::kNotAvailable,
                              "The file became shorter while it was imported: " + mPath);
            writeAll(buffer.data(), static_cast<std::size_t>(count));
            advance(count);
        }
    }

    void writeAll(const char* bytes, std::size_t size) {
        for (std::size_t written = 0; written < size;) {
            const ssize_t count = ::pwrite(mTo, bytes + written, size - written,
                                           mDone + static_cast<std::int64_t>(written));
            if (count < 0)
                throw systemFailure(kWriting, mPath);
            written += static_cast<std::size_t>(count);
        }
    }

    [[nodiscard]] std::size_t nextLength() const {
        return static_cast<std::size_t>(std::min(kChunk, mSize - mDone));
    }

    void advance(std::int64_t count) {
        if (count > 0)
            pushOut(count);
        mDone += count;
        mProgress(mDone);
    }

    /** Errors are told again by the sync that ends the copy. */
    void pushOut(std::int64_t count) {
        ::sync_file_range(mTo, mDone, count, SYNC_FILE_RANGE_WRITE);
        if (mDone >= kBacklog)
            ::sync_file_range(mTo, mDone - kBacklog, count,
                              SYNC_FILE_RANGE_WAIT_BEFORE | SYNC_FILE_RANGE_WRITE |
                                  SYNC_FILE_RANGE_WAIT_AFTER);
    }

    const int mFrom;
    const int mTo;
    const std::int64_t mSize;
    const std::string& mPath;
    const CopyProgress& mProgress;
    std::int64_t mDone = 0;
};

} // namespace

void copyFile(int from, int to, std::int64_t size, const std::string& path,
              const CopyProgress& progress) {
    FileCopy(from, to, size, path, progress).run();
}

} // namespace importer
