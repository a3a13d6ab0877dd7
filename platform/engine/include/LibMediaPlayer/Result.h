// SPDX-License-Identifier: MIT
#pragma once

namespace LibMediaPlayer {

/** What operations return and notifications carry. 0 means success or accepted. */
enum Result : int {
    kOk = 0,
    kWrongState = -1, ///< wrong state or argument
    kNotFound = 1,
    kAccessDenied = 2,
    kNotMedia = 3, ///< not media, or no decoder for it
    kDamaged = 4,
    kNotAvailable = 5,
    kCancelled = 6,
    kTimedOut = 7,
    kNoSpace = 8,
    kInternal = 9
};

} // namespace LibMediaPlayer
