// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>

#include "bench/ChildProcess.h"

struct sd_bus;

namespace bench {

/**
 * A method call over D-Bus: a private bus daemon, a service process with one method that answers
 * with the same four values as a status request, and a connection to call it.
 */
class DbusPeer {
public:
    DbusPeer();
    ~DbusPeer();

    /** False when the bus or the service could not be started. */
    [[nodiscard]] bool ready() const { return mpBus != nullptr; }

    /** One call and its answer. */
    bool call();

private:
    ChildProcess mBusDaemon;
    ChildProcess mService;
    sd_bus* mpBus = nullptr;
};

} // namespace bench
