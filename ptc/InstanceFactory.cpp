// SPDX-License-Identifier: MIT
#include "ptc/InstanceFactory.h"

#include "ptc/IRemoteReceiver.h"

#include <utility>

namespace PTC {

InstanceFactory::InstanceFactory() = default;

InstanceFactory::~InstanceFactory() {
    mpRemoteReceiver.reset();
    mConnections.clear();
}

bool InstanceFactory::initialize() {
    return true;
}

long InstanceFactory::getRRIdentity() {
    return mpRemoteReceiver ? mpRemoteReceiver->getIdentity() : -1;
}

ISender* InstanceFactory::findSender(long moduleId) const {
    const auto connection = mConnections.find(moduleId);
    return connection == mConnections.end() ? nullptr : connection->second.pSender.get();
}

void InstanceFactory::addSender(ISender* sender) {
    auto& kept = mConnections[sender->getId()].pSender;
    if (kept == nullptr)
        kept.reset(sender);
}

void InstanceFactory::addProxy(long moduleId, std::unique_ptr<IProxyBase> proxy) {
    mConnections[moduleId].proxies.push_back(std::move(proxy));
}

} // namespace PTC
