// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <cstdint>

#include "probe/AvTypes.h"
#include "probe/RegularFile.h"

namespace probe {

/**
 * A regular file as libavformat reads it, with a budget of bytes and time: once that is used up
 * every read fails, so that no file keeps its reader busy. For one thread.
 */
class FileInput {
public:
    FileInput(RegularFile file, std::int64_t byteBudget, std::chrono::milliseconds timeBudget);
    FileInput(const FileInput&) = delete;
    FileInput& operator=(const FileInput&) = delete;

    [[nodiscard]] AVIOContext* context() const { return mContext.get(); }
    [[nodiscard]] std::int64_t size() const { return mFile.size; } ///< bytes
    [[nodiscard]] bool isExhausted() const;

    /** Reads beside the context, which stays where it is; returns how many bytes, less at the end.
     */
    std::size_t readAt(std::int64_t place, char* buffer, std::size_t size);

private:
    static int readBytes(void* input, std::uint8_t* buffer, int size);
    static std::int64_t seekTo(void* input, std::int64_t offset, int whence);

    int read(std::uint8_t* buffer, int size);
    std::int64_t seek(std::int64_t offset, int whence);

    const RegularFile mFile;
    const std::chrono::steady_clock::time_point mDeadline;
    std::int64_t mBytesLeft;
    std::int64_t mOffset = 0;
    IoContext mContext;
};

} // namespace probe
