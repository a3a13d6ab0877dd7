// SPDX-License-Identifier: MIT
#pragma once

#include <cerrno>
#include <stdexcept>
#include <string>

namespace importer {

/** Why one import has failed: thrown where it is found, told in its notification. */
class Failure : public std::runtime_error {
public:
    /** `result` is a LibMediaPlayer::Result. */
    Failure(int result, const std::string& message)
        : std::runtime_error(message), mResult(result) {}

    [[nodiscard]] int result() const { return mResult; }

private:
    int mResult;
};

/** What a failed system call means: `what`, the path, and the system's reason. */
Failure systemFailure(const std::string& what, const std::string& path, int error = errno);

} // namespace importer
