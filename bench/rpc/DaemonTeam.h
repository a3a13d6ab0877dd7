// SPDX-License-Identifier: MIT
#pragma once

#include <deque>

#include "bench/rpc/DaemonClient.h"
#include "bench/rpc/DaemonPeer.h"
#include "define/ObjectIds.h"

namespace bench {

constexpr int kMostClients = static_cast<int>(MediaServiceDefine::kLastClientIdentity -
                                              MediaServiceDefine::kFirstClientIdentity + 1);

/** A daemon with the bench's engine, and as many registered clients as it can have. */
class DaemonTeam {
public:
    DaemonTeam() : mDaemon(startTimingDaemon()) {
        for (int i = 0; i < kMostClients; ++i)
            mClients.emplace_back(MediaServiceDefine::kFirstClientIdentity + i);
    }

    [[nodiscard]] bool ready() const {
        for (const DaemonClient& client : mClients)
            if (!client.ready())
                return false;
        return true;
    }

    [[nodiscard]] DaemonClient& client(std::size_t index) { return mClients[index]; }

private:
    ChildProcess mDaemon;
    std::deque<DaemonClient> mClients;
};

} // namespace bench
