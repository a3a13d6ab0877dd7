// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>

#include "tests/daemon/support/LoadParts.h"

namespace load {

/** One of the processes of a load: a client of all three services. For one thread. */
class Client {
public:
    Client(long identity, unsigned seed, Board& board);

    /** Registers with all services, for notifications too. */
    void registerAll();

    /** Writes to the board what describes the film. */
    void learn() { mDiscoverer.learn(); }

    /** Asks until the board says stop, and takes all answers that are its own. */
    void work();

    /**
     * Takes all that was told before now: what was asked for is done by then. A client that has
     * gone wrong returns at once.
     */
    void settle();

    /** Has everybody's player closed and all imports ended. */
    void makeIdle();

    /** Takes packets until as many notifications have come as another client has. */
    void catchUp(const Client& other);

    void expectEnd() { mLink.expectEnd(); }

    [[nodiscard]] std::size_t asked() const { return mLink.asked(); }
    [[nodiscard]] const Notifications& played() const { return mPlayer.notifications(); }
    [[nodiscard]] const Notifications& imported() const { return mImporter.notifications(); }

private:
    void ask();
    bool takeNext();
    void takeOwn();
    [[nodiscard]] bool mustWait() const;

    Board& mBoard;
    Link mLink;
    PlayerPart mPlayer;
    ImporterPart mImporter;
    DiscovererPart mDiscoverer;
    unsigned mUnbraked = 0; ///< requests since the engine answered one
};

} // namespace load
