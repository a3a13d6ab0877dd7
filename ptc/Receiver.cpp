// SPDX-License-Identifier: MIT
#include "ptc/Receiver.h"

#include "ptc/Event.h"
#include "ptc/IAdapter.h"

namespace PTC {

Receiver::Receiver(long id) : mId(id) {}

Receiver::~Receiver() = default;

long Receiver::getId() {
    return mId;
}

void Receiver::recv(Event* event) {
    const std::unique_ptr<Event, void (*)(Event*)> owned(event, discard);
    handleEvent(event);
}

void Receiver::addAdapter(IAdapterBase* adapter) {
    mAdapters.try_emplace(adapter->getId(), adapter);
}

void Receiver::addCBAdapter(IAdapterBase* adapter) {
    mCallbackAdapters.try_emplace(adapter->getId(), adapter);
}

void Receiver::removeCBAdapter(long id) {
    mCallbackAdapters.erase(id);
}

void Receiver::handleEvent(Event* event) {
    if (!event)
        return;
    const AdapterTable& table = event->isCallback ? mCallbackAdapters : mAdapters;
    const auto adapter = table.find(event->objectId);
    if (adapter != table.end())
        adapter->second->receive(event);
}

void Receiver::discard(Event* event) {
    if (!event)
        return;
    delete[] event->data;
    delete event;
}

} // namespace PTC
