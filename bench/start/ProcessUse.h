// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <sys/types.h>

namespace bench {

/** What the kernel tells of a process and its children, in sum. */
struct ProcessUse {
    double residentMegabytes = 0; ///< what several have in common counts for each
    double anonymousMegabytes =
        0; ///< the same without what is a part of files: programs, libraries
    double cpuSeconds = 0;
    int64_t contextSwitches = 0;
};

ProcessUse readProcessUse(pid_t pid);

/** The most memory that was resident at once, of the process and of its children, in sum. */
double readPeakMegabytes(pid_t pid);

} // namespace bench
