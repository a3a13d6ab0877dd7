// SPDX-License-Identifier: MIT
#include "ptc/CallbackProxy.h"

#include "ptc/Event.h"
#include "ptc/ISender.h"

#include <cassert>

namespace PTC {

CallbackProxy::CallbackProxy(long id, bool isRemote)
    : mId(static_cast<int32_t>(id)), mIsRemote(isRemote) {}

long CallbackProxy::getId() {
    return mId;
}

void CallbackProxy::setSender(ISender* sender) {
    mpSender = sender;
}

void CallbackProxy::invokeMethod(long methodId, void* data, long size) {
    assert(mpSender);
    mpSender->send(new Event(mId, methodId, data, size, mIsRemote, true));
}

} // namespace PTC
