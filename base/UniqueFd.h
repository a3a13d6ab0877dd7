// SPDX-License-Identifier: MIT
#pragma once

#include <unistd.h>
#include <utility>

namespace qns {

/** Owns a file descriptor and closes it. -1 means none. A plain `int` is a borrowed one. */
class UniqueFd {
public:
    UniqueFd() noexcept = default;
    explicit UniqueFd(int fd) noexcept : mFd(fd) {}
    ~UniqueFd() { reset(); }

    UniqueFd(UniqueFd&& other) noexcept : mFd(other.release()) {}
    UniqueFd& operator=(UniqueFd&& other) noexcept {
        if (this != &other)
            reset(other.release());
        return *this;
    }
    UniqueFd(const UniqueFd&) = delete;
    UniqueFd& operator=(const UniqueFd&) = delete;

    [[nodiscard]] int get() const noexcept { return mFd; }
    [[nodiscard]] int release() noexcept { return std::exchange(mFd, -1); }
    void reset(int fd = -1) noexcept {
        if (mFd >= 0)
            ::close(mFd);
        mFd = fd;
    }
    explicit operator bool() const noexcept { return mFd >= 0; }

private:
    int mFd = -1;
};

} // namespace qns
