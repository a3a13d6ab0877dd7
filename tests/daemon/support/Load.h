// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <cstddef>
#include <functional>
#include <list>
#include <string>

#include "tests/daemon/support/LoadClient.h"

namespace load {

/** Eight client processes that use all services at random, all at once, as fast as they can. */
class Load {
public:
    /** Two loads with the same seed ask the same. Pictures go to `folder`. */
    Load(const std::string& folder, unsigned seed);

    /** Registers the clients, one after the other, and learns what describes the film. */
    void begin();

    /**
     * Asks for so long, and then has all answers: each must have come once, in its place, and
     * the notifications to all clients alike. Afterwards the player is closed and nothing runs.
     */
    void run(std::chrono::milliseconds time);

    /** Asks for so long and then calls `end`, which ends the daemon in the middle of it. */
    void runInto(const std::function<void()>& end, std::chrono::milliseconds time);

    /** Requests up to now. */
    [[nodiscard]] std::size_t asked() const;

    /** Notifications that each client was told up to now. */
    [[nodiscard]] std::size_t told() const;

private:
    void work(std::chrono::milliseconds time, const std::function<void()>& atItsEnd);
    void settle();
    void expectSameNotifications();

    Board mBoard;
    std::list<Client> mClients;
};

} // namespace load
