// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/IAdapter.h"

namespace PTC {

class IProxyBase;

/**
 * Base of the service adapters: their id and their access to the proxy factory. Called by the
 * thread that dispatches events, and set up before the first of them.
 */
class Adapter : public IAdapter {
public:
    explicit Adapter(long id);

    long getId() override;
    void setProxyFactory(IProxyFactory* factory) override;

    /**
     * A proxy for object `proxyId` of the client `clientIdentity`, or null. The factory owns it.
     * setProxyFactory() must have been called.
     */
    virtual IProxyBase* createProxy(long interfaceId, long proxyId, long clientIdentity);

private:
    IProxyFactory* mpProxyFactory = nullptr;
    long mId;
};

} // namespace PTC
