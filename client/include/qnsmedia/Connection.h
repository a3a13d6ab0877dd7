// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <exception>
#include <functional>
#include <memory>
#include <optional>

#include "qnsmedia/Export.h"

namespace qnsmedia {

class Link;

/**
 * A process's connection to the daemon: takes one of the identities 1000 to 1007, which is also
 * the loopback port at which the daemon reaches this process. What is made from a connection
 * keeps it open.
 *
 * Threads: any thread may use the library. All callbacks and handlers are called one after
 * another, on one thread of the library's own. They may make requests, but not wait for a future:
 * its answer would arrive on that very thread. Nor may they destroy a connection or a player.
 */
class QNSMEDIA_API Connection {
public:
    struct Options {
        /** 1000 to 1007; without one, the first that no other process uses. */
        std::optional<int> identity;

        /** How long a request waits for its answer: 1 millisecond to 24 hours. */
        std::chrono::milliseconds deadline = std::chrono::seconds(5);
    };

    /** Throws IdentityInUse, DaemonNotRunning, or Error when the options make no sense. */
    Connection();
    explicit Connection(const Options& options);
    ~Connection();

    [[nodiscard]] int identity() const;

    /** False once the daemon has gone. This connection stays lost; a new one can be made. */
    [[nodiscard]] bool alive() const;

    /** `handler` is told once when the daemon goes, or now when it has gone before. */
    void onLost(std::function<void()> handler);

    /** `handler` is told what another handler or a callback has thrown; else that is dropped. */
    void onError(std::function<void(std::exception_ptr error)> handler);

private:
    friend class Discoverer;
    friend class Importer;
    friend class Player;
    std::shared_ptr<Link> mpLink;
};

} // namespace qnsmedia
