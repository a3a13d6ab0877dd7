// SPDX-License-Identifier: MIT
#include "worker/Idleness.h"

#include <sched.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace worker {

void runWhenIdle() {
    const sched_param parameters{};
    ::sched_setscheduler(0, SCHED_IDLE, &parameters);
    // The C library has no function for the disk.
    constexpr int kOneThread = 1;
    constexpr int kThisThread = 0;
    constexpr int kIdleClass = 3 << 13;
    ::syscall(SYS_ioprio_set, kOneThread, kThisThread, kIdleClass);
}

} // namespace worker
