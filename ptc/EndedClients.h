// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/ClientConnection.h"

#include <list>
#include <vector>

namespace PTC {

class IProxyHolder;

/**
 * Decides which clients have ended, and clears up after them, so that their identities can be
 * used again. A client has ended when its end of the connection to it is closed, or when it was
 * given up because it did not read.
 *
 * Belongs to the thread that dispatches events, and never waits. Other threads may meanwhile
 * send through a proxy that they have looked up: proxies and senders are freed only when
 * nobody can, which may be a later release().
 */
class EndedClients {
public:
    /** `holder` is not owned and must be there at every release(). */
    void addHolder(IProxyHolder& holder);

    /**
     * Takes the connections of ended clients out. Nothing is sent through them any more, and all
     * holders let go of their proxies. Senders other than a SocketRemoteSender never end.
     */
    void release(ClientConnections& connections);

private:
    void takeEnded(ClientConnections& connections);
    [[nodiscard]] bool letGo(const ClientConnection& connection) const;

    std::vector<IProxyHolder*> mHolders;
    std::list<ClientConnection> mEnded; ///< some thread may still be using these
};

} // namespace PTC
