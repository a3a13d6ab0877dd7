// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/IObject.h"

namespace PTC {

struct Event;
class IAdapterBase;

/** Takes events and finds the adapter of the object that each is for. Owns its adapters. */
class IReceiver : public IObject {
public:
    /** Takes ownership of the event and of its argument block. */
    virtual void recv(Event* event) = 0;

    /** Takes ownership, unless the id is present already: then nothing happens. */
    virtual void addAdapter(IAdapterBase* adapter) = 0;
    virtual void addCBAdapter(IAdapterBase* adapter) = 0;

    /** Deletes that adapter, if there is one. */
    virtual void removeCBAdapter(long id) = 0;
};

} // namespace PTC
