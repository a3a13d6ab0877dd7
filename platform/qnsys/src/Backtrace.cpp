// SPDX-License-Identifier: MIT
#include <execinfo.h>
#include <unistd.h>

#include "qnsys.h"

namespace {

constexpr int kMaxFrames = 64;

} // namespace

int qnsys_init(void) {
    // The first back-trace loads libgcc, which allocates; one from a signal handler must not.
    void* frame = nullptr;
    backtrace(&frame, 1);
    return 0;
}

void qnsys_print_backtrace(void) {
    void* frames[kMaxFrames];
    backtrace_symbols_fd(frames, backtrace(frames, kMaxFrames), STDERR_FILENO);
}
