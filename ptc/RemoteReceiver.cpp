// SPDX-License-Identifier: MIT
#include "ptc/RemoteReceiver.h"

#include "ptc/Event.h"
#include "ptc/EventPacket.h"
#include "ptc/IReceiver.h"

namespace PTC {

RemoteReceiver::RemoteReceiver(long id) : mId(id) {}

RemoteReceiver::~RemoteReceiver() = default;

long RemoteReceiver::getId() {
    return mId;
}

bool RemoteReceiver::initialize(long identity) {
    mIdentity = identity;
    return true;
}

long RemoteReceiver::getIdentity() {
    return mIdentity;
}

void RemoteReceiver::addReceiver(IReceiver* receiver) {
    mReceivers.try_emplace(receiver->getId(), receiver);
}

std::unique_ptr<IReceiver> RemoteReceiver::releaseReceiver(long id) {
    auto entry = mReceivers.extract(id);
    return entry ? std::move(entry.mapped()) : nullptr;
}

void RemoteReceiver::handleEventPacket(EventPacket* packet) {
    const auto receiver = mReceivers.find(packet->receiverId);
    if (receiver == mReceivers.end())
        return;
    auto* const event = new Event(packet->objectId, packet->methodId, packet->data, packet->size,
                                  packet->isRemote != 0, packet->isCallback != 0);
    packet->data = nullptr;
    receiver->second->recv(event);
}

void RemoteReceiver::deleteReceivers() {
    mReceivers.clear();
}

} // namespace PTC
