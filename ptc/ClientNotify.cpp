// SPDX-License-Identifier: MIT
#include "ptc/ClientNotify.h"

#include <algorithm>
#include <optional>

namespace {

std::optional<int> idOf(const void* object, const std::map<int, void*>& objects) {
    const auto entry = std::find_if(objects.begin(), objects.end(),
                                    [object](const auto& known) { return known.second == object; });
    return entry == objects.end() ? std::nullopt : std::optional(entry->first);
}

} // namespace

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

void ClientNotify::forget(const void* object) {
    std::unique_lock<std::mutex> lock(mMutex);
    const auto client = idOf(object, mClientMap);
    const auto notify = idOf(object, mNotifyMap);
    lock.unlock();
    if (client)
        clientEnded(*client);
    if (notify)
        unregisterNotifyClient(*notify);
}

void ClientNotify::clientEnded(int id) {
    unregisterClient(id);
}

bool ClientNotify::isInUse() const {
    const std::unique_lock<std::shared_mutex> free(mUseMutex, std::try_to_lock);
    return !free.owns_lock();
}

std::shared_lock<std::shared_mutex> ClientNotify::use() const {
    return std::shared_lock<std::shared_mutex>(mUseMutex);
}
