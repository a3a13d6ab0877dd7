// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <functional>
#include <memory>
#include <optional>

#include "qnsmedia/Export.h"

namespace qnsmedia {

class Link;

/**
 * A process's connection to the daemon: takes one of the identities 1000 to 1007, which is also
 * the loopback port at which the daemon reaches this process. Objects made from a connection keep
 * it open. Any thread may use it.
 */
class QNSMEDIA_API Connection {
public:
    struct Options {
        /** 1000 to 1007; without one, the first that no other process uses. */
        std::optional<int> identity;
        /** How long requests wait for their answers. */
        std::chrono::milliseconds deadline = std::chrono::seconds(5);
    };

    /** Throws IdentityInUse, DaemonNotRunning or Error. */
    Connection();
    explicit Connection(const Options& options);
    ~Connection();

    [[nodiscard]] int identity() const;

    /** False once the daemon has gone. A new connection can then be made. */
    [[nodiscard]] bool alive() const;

    /** `handler` is told once, on a thread of the library, when the daemon goes. */
    void onLost(std::function<void()> handler);

private:
    friend class Player;
    std::shared_ptr<Link> mpLink;
};

} // namespace qnsmedia
