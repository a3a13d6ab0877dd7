// SPDX-License-Identifier: MIT
#include "ptc/ClientNotify.h"

ClientNotify::~ClientNotify() = default;

int ClientNotify::getNewID() {
    const std::lock_guard<std::mutex> lock(mMutex);
    return ++mLastID;
}

int ClientNotify::registerClient(void* callback) {
    const std::lock_guard<std::mutex> lock(mMutex);
    mClientMap.emplace(++mLastID, callback);
    return mLastID;
}

void ClientNotify::registerNotifyClient(int id, void* notify) {
    const std::lock_guard<std::mutex> lock(mMutex);
    mNotifyMap.emplace(id, notify);
}

void ClientNotify::unregisterClient(int id) {
    const std::lock_guard<std::mutex> lock(mMutex);
    mClientMap.erase(id);
}

void ClientNotify::unregisterNotifyClient(int id) {
    const std::lock_guard<std::mutex> lock(mMutex);
    mNotifyMap.erase(id);
}

bool ClientNotify::isEnableID(int id) const {
    const std::lock_guard<std::mutex> lock(mMutex);
    return mClientMap.count(id) != 0;
}

void* ClientNotify::getCurrentMethod(int id) const {
    const std::lock_guard<std::mutex> lock(mMutex);
    const auto client = mClientMap.find(id);
    return client == mClientMap.end() ? nullptr : client->second;
}

std::map<int, void*> ClientNotify::notifyClients() const {
    const std::lock_guard<std::mutex> lock(mMutex);
    return mNotifyMap;
}
