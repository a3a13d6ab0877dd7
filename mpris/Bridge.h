// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <memory>
#include <sdbus-c++/IConnection.h>

#include "cli/EventLoop.h"
#include "mpris/Options.h"
#include "mpris/Session.h"

namespace mpris {

/** Shows the daemon's player on the session bus until something ends that. For one thread. */
class Bridge {
public:
    /** Throws std::runtime_error without a bus. */
    explicit Bridge(const Options& options);

    /**
     * Until a signal comes, whose number is returned. Throws qnsmedia::Error when the daemon
     * cannot be reached or has gone, sdbus::Error when the bus has, and std::runtime_error when
     * another process has the name.
     */
    int run();

private:
    std::unique_ptr<Session> connect();
    void follow(Session& session);
    bool takeSignal();
    void wait(std::chrono::milliseconds time);

    const Options mOptions;
    const std::unique_ptr<sdbus::IConnection> mpBus;
    EventLoop mLoop; ///< after the bus, which its tasks use
    int mSignal = 0;
};

} // namespace mpris
