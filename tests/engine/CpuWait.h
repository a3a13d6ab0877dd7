// SPDX-License-Identifier: MIT
#pragma once

#include "tests/engine/TestPlayer.h"

/**
 * How long this process's threads have waited for a processor since it was made. Tests of what
 * happens in real time allow for it: a busy machine is not the player's fault.
 */
class CpuWait {
public:
    CpuWait();

    /** Of all threads together; of those that have ended, nothing. Never negative. */
    [[nodiscard]] Seconds elapsed() const;

private:
    Seconds mBefore;
};
