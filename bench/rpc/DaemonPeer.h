// SPDX-License-Identifier: MIT
#pragma once

#include "bench/ChildProcess.h"
#include "bench/rpc/DaemonClient.h"

namespace bench {

/** Runs the daemon with an engine whose operations tell the time of their own call. */
ChildProcess startTimingDaemon();

/** Such a daemon, and one registered client. */
class DaemonPeer {
public:
    DaemonPeer();

    [[nodiscard]] bool ready() const { return mClient.ready(); }
    [[nodiscard]] DaemonClient& client() { return mClient; }

private:
    ChildProcess mDaemon;
    DaemonClient mClient;
};

} // namespace bench
