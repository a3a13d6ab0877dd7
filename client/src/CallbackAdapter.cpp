// SPDX-License-Identifier: MIT
#include "client/src/CallbackAdapter.h"

#include "ptc/Event.h"

namespace qnsmedia {

void CallbackAdapter::receive(PTC::Event* event) {
    const std::lock_guard lock(mMutex);
    const Link::EventHandler handler = mHandler;
    if (!handler)
        return;
    ArgumentReader arguments(event->data, event->size);
    handler(event->methodId, arguments);
}

bool CallbackAdapter::claim(Link::EventHandler handler) {
    const std::lock_guard lock(mMutex);
    if (mHandler)
        return false;
    mHandler = std::move(handler);
    return true;
}

void CallbackAdapter::release() {
    const std::lock_guard lock(mMutex);
    mHandler = nullptr;
}

} // namespace qnsmedia
