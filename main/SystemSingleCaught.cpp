// SPDX-License-Identifier: MIT
#include "main/SystemSingleCaught.h"

#include <cstdlib>

#include "log/Logging.h"
#include "main/HostLog.h"

/**
 * The event loop is not asked to quit: the request would wait for a main thread that may be busy
 * for seconds, or let it run into the orderly end beside this one. Nor is it exit(), which
 * would run destructors under the feet of threads that go on. Nothing is lost: trace lines and
 * log lines are with the kernel as soon as they are written.
 */
void onSystemSingleCaught() {
    LOG_EVENT(host::kLogModule, host::kLogCode, L"main::onSystemSingleCaught",
              host::kLogInformational);
    std::_Exit(EXIT_SUCCESS);
}
