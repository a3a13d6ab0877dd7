// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/ClientConnection.h"
#include "ptc/IFactory.h"

#include <memory>

namespace PTC {

class IRemoteReceiver;

/**
 * Base of a process's object factory. Owns the remote receiver, the proxies and one sender per
 * client module, and destroys them in this order: what sends goes before what it sends through.
 *
 * The threads behind the remote receiver call createProxy(). A factory whose createProxy() may
 * run up to the end therefore resets mpRemoteReceiver in its own destructor: by the time that of
 * this class runs, the overriding function is gone.
 *
 * Not locked: the senders and proxies belong to the thread that dispatches events.
 */
class InstanceFactory : public IInstanceFactory, public IAdapterFactory, public IProxyFactory {
public:
    InstanceFactory();
    ~InstanceFactory() override;

    bool initialize() override;
    long getRRIdentity() override;

    /** The sender of that module, or null. Stays owned by the factory. */
    [[nodiscard]] ISender* findSender(long moduleId) const;

    /** Takes ownership, unless the id is present already: then nothing happens. */
    void addSender(ISender* sender);

protected:
    /** Keeps the proxy as long as the sender of that module. */
    void addProxy(long moduleId, std::unique_ptr<IProxyBase> proxy);

    std::unique_ptr<IRemoteReceiver> mpRemoteReceiver;
    ClientConnections mConnections;
};

} // namespace PTC
