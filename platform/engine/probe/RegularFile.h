// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>

#include "base/UniqueFd.h"

namespace probe {

/** A regular file that is not empty, open for reading. */
struct RegularFile {
    qns::UniqueFd fd;
    std::int64_t size = 0; ///< bytes

    /**
     * Returns 0 or a LibMediaPlayer::Result. A pipe or a device is refused unopened: opening it
     * alone could block, or set it going.
     */
    [[nodiscard]] int open(const std::string& path);

    /** The same of what is open already, which becomes this object's. */
    [[nodiscard]] int adopt(qns::UniqueFd opened);
};

} // namespace probe
