// SPDX-License-Identifier: MIT
#pragma once

#include "tests/engine/TestPlayer.h"

/**
 * How much processor time other processes have had since it was made. Tests of a process whose own
 * threads compete for the processors allow for it, where CpuWait would allow for the competition.
 */
class BusyElsewhere {
public:
    BusyElsewhere();

    /** Of all processors together; never negative. */
    [[nodiscard]] Seconds elapsed() const;

private:
    Seconds mBefore;
};
