// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/IReceiver.h"

#include <map>
#include <memory>

namespace PTC {

/**
 * Dispatches events on the caller's thread. Requests (`isCallback` false) and callbacks have
 * separate tables, so the same object id may stand in both. Not locked: fill the tables before
 * events arrive, or from the thread that dispatches them.
 */
class Receiver : public IReceiver {
public:
    explicit Receiver(long id);
    ~Receiver() override;

    long getId() override;
    void recv(Event* event) override;
    void addAdapter(IAdapterBase* adapter) override;
    void addCBAdapter(IAdapterBase* adapter) override;
    void removeCBAdapter(long id) override;

    /** Hands the event to its adapter; an unknown object is ignored. The event is not freed. */
    virtual void handleEvent(Event* event);

protected:
    /** Frees the event and its argument block; null is fine. */
    static void discard(Event* event);

private:
    using AdapterTable = std::map<long, std::unique_ptr<IAdapterBase>>;

    AdapterTable mAdapters;
    AdapterTable mCallbackAdapters;
    long mId;
};

} // namespace PTC
