// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/IObject.h"

namespace PTC {

struct Event;
class IProxyFactory;

/** Turns events for one object into calls on its target. */
class IAdapterBase : public IObject {
public:
    /** Decodes and calls. The event stays with the caller. */
    virtual void receive(Event* event) = 0;
    virtual void setTarget(void* target) = 0;
};

/** An adapter that can make proxies for the clients that its events name. */
class IAdapter : public IAdapterBase {
public:
    /** The factory must outlive the adapter. */
    virtual void setProxyFactory(IProxyFactory* factory) = 0;
};

} // namespace PTC
