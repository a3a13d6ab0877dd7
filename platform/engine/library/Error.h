// SPDX-License-Identifier: MIT
#pragma once

#include <stdexcept>
#include <string>

namespace library {

/** Why the database did not do what was asked. */
class Error : public std::runtime_error {
public:
    Error(int result, const std::string& message, bool damaged = false)
        : std::runtime_error(message), mResult(result), mDamaged(damaged) {}

    /** A LibMediaPlayer::Result. */
    [[nodiscard]] int result() const { return mResult; }

    /** The file is no database, or one that has lost its shape. */
    [[nodiscard]] bool isDamaged() const { return mDamaged; }

private:
    int mResult;
    bool mDamaged;
};

} // namespace library
