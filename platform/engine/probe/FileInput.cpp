// SPDX-License-Identifier: MIT
#include "probe/FileInput.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <unistd.h>
#include <utility>

namespace probe {

namespace {

constexpr int kBufferSize = 32 * 1024;

} // namespace

FileInput::FileInput(RegularFile file, std::int64_t byteBudget,
                     std::chrono::milliseconds timeBudget)
    : mFile(std::move(file)),
      mDeadline(std::chrono::steady_clock::now() + timeBudget),
      mBytesLeft(byteBudget),
      mContext(kAdopt, avio_alloc_context(static_cast<unsigned char*>(av_malloc(kBufferSize)),
                                          kBufferSize, 0, this, readBytes, nullptr, seekTo)) {}

bool FileInput::isExhausted() const {
    return mBytesLeft <= 0 || std::chrono::steady_clock::now() >= mDeadline;
}

int FileInput::readBytes(void* input, std::uint8_t* buffer, int size) {
    return static_cast<FileInput*>(input)->read(buffer, size);
}

std::int64_t FileInput::seekTo(void* input, std::int64_t offset, int whence) {
    return static_cast<FileInput*>(input)->seek(offset, whence);
}

int FileInput::read(std::uint8_t* buffer, int size) {
    if (isExhausted())
        return AVERROR_EXIT;
    const ssize_t count = ::pread(mFile.fd.get(), buffer, static_cast<std::size_t>(size),
                                  static_cast<off_t>(mOffset));
    if (count < 0)
        return AVERROR(errno);
    if (count == 0)
        return AVERROR_EOF;
    mOffset += count;
    mBytesLeft -= count;
    return static_cast<int>(count);
}

std::size_t FileInput::readAt(std::int64_t place, char* buffer, std::size_t size) {
    if (isExhausted())
        return 0;
    const ssize_t count = ::pread(mFile.fd.get(), buffer, size, static_cast<off_t>(place));
    mBytesLeft -= std::max<ssize_t>(count, 0);
    return static_cast<std::size_t>(std::max<ssize_t>(count, 0));
}

std::int64_t FileInput::seek(std::int64_t offset, int whence) {
    switch (whence & ~AVSEEK_FORCE) {
    case AVSEEK_SIZE:
        return mFile.size;
    case SEEK_SET:
        return mOffset = offset;
    case SEEK_CUR:
        return mOffset += offset;
    case SEEK_END:
        return mOffset = mFile.size + offset;
    default:
        return AVERROR(EINVAL);
    }
}

} // namespace probe
