// SPDX-License-Identifier: MIT
#include "ptc/Adapter.h"

#include "ptc/IFactory.h"

#include <cassert>

namespace PTC {

Adapter::Adapter(long id) : mId(id) {}

long Adapter::getId() {
    return mId;
}

void Adapter::setProxyFactory(IProxyFactory* factory) {
    mpProxyFactory = factory;
}

IProxyBase* Adapter::createProxy(long interfaceId, long proxyId, long clientIdentity) {
    assert(mpProxyFactory);
    return mpProxyFactory->createProxy(interfaceId, proxyId, clientIdentity);
}

} // namespace PTC
