// SPDX-License-Identifier: MIT
#pragma once

#include <deque>
#include <string>

#include "bench/ChildProcess.h"

struct sd_bus;

namespace bench {

/** A connection to a bus, for one thread at a time. */
class DbusConnection {
public:
    /** `address` is the bus's. */
    explicit DbusConnection(const std::string& address);
    ~DbusConnection();
    DbusConnection(const DbusConnection&) = delete;
    DbusConnection& operator=(const DbusConnection&) = delete;

    [[nodiscard]] bool ready() const { return mpBus != nullptr; }

    /** One call of the service's method and its answer. */
    bool call();

private:
    sd_bus* mpBus;
};

/**
 * A method call over D-Bus: a private bus daemon, a service process with one method that answers
 * with the same four values as a status request, and connections to call it.
 */
class DbusPeer {
public:
    explicit DbusPeer(int connections = 1);

    /** False when the bus or the service could not be started. */
    [[nodiscard]] bool ready() const { return mReady; }

    [[nodiscard]] DbusConnection& connection(std::size_t index = 0) { return mConnections[index]; }

private:
    bool awaitService();

    ChildProcess mBusDaemon;
    ChildProcess mService;
    std::deque<DbusConnection> mConnections;
    bool mReady = false;
};

} // namespace bench
