// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <string>

#include "tests/engine/TestPlayer.h"

/**
 * How long this process's threads have waited for a processor since it was made. Tests of what
 * happens in real time allow for it: a busy machine is not the player's fault.
 */
class CpuWait {
public:
    CpuWait();

    /** Of all threads that live now, together. */
    [[nodiscard]] Seconds elapsed() const;

private:
    std::map<std::string, Seconds> mBefore; ///< by thread
};
