// SPDX-License-Identifier: MIT
#include "bench/rpc/DaemonPeer.h"

#include <cstdlib>

#include "bench/Programs.h"
#include "define/ObjectIds.h"

namespace bench {

ChildProcess startTimingDaemon() {
    ::setenv("LD_LIBRARY_PATH", (programFolder() + "/../lib/bench-engine").c_str(), 1);
    ChildProcess daemon = ChildProcess::run({programFolder() + "/QNSMediaService"});
    ::unsetenv("LD_LIBRARY_PATH");
    return daemon;
}

DaemonPeer::DaemonPeer()
    : mDaemon(startTimingDaemon()), mClient(MediaServiceDefine::kFirstClientIdentity) {}

} // namespace bench
