// SPDX-License-Identifier: MIT
#pragma once

namespace PTC {

class IProxyBase;
class IReceiver;

class IInstanceFactory {
public:
    virtual ~IInstanceFactory() = default;
    virtual bool initialize() = 0;
    virtual void createInstance(long id, void** instance) = 0;
};

class IAdapterFactory {
public:
    virtual ~IAdapterFactory() = default;
    virtual void* createAdapter(long id, IReceiver* receiver, void* target) = 0;

    /** Identity of the process's remote receiver, or -1. */
    virtual long getRRIdentity() = 0;
};

class IProxyFactory {
public:
    virtual ~IProxyFactory() = default;

    /** A proxy of the interface for a client's object, or null. The factory owns it. */
    virtual IProxyBase* createProxy(long interfaceId, long proxyId, long clientIdentity) = 0;
};

} // namespace PTC
