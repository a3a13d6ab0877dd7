// SPDX-License-Identifier: MIT
#include "ptc/InstanceFactory.h"

#include "ptc/IProxy.h"
#include "ptc/IRemoteReceiver.h"
#include "ptc/ISender.h"

namespace PTC {

InstanceFactory::InstanceFactory() = default;

InstanceFactory::~InstanceFactory() {
    mpRemoteReceiver.reset();
    mProxies.clear();
    mSenders.clear();
}

bool InstanceFactory::initialize() {
    return true;
}

long InstanceFactory::getRRIdentity() {
    return mpRemoteReceiver ? mpRemoteReceiver->getIdentity() : -1;
}

ISender* InstanceFactory::findSender(long moduleId) const {
    const auto sender = mSenders.find(moduleId);
    return sender == mSenders.end() ? nullptr : sender->second.get();
}

void InstanceFactory::addSender(ISender* sender) {
    mSenders.try_emplace(sender->getId(), sender);
}

void InstanceFactory::addProxy(std::unique_ptr<IProxyBase> proxy) {
    mProxies.push_back(std::move(proxy));
}

} // namespace PTC
