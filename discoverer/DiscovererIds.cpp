// SPDX-License-Identifier: MIT
#include "discoverer/DiscovererIds.h"

#include <algorithm>

void DiscovererIds::setMediaDiscovererIdList(int iClientID) {
    const std::lock_guard lock(mMutex);
    const auto free = std::find(mClientOf.begin(), mClientOf.end(), kNoClient);
    if (free == mClientOf.end())
        return;
    *free = iClientID;
    mDiscovererOf.emplace(iClientID, static_cast<int>(free - mClientOf.begin()));
}

int DiscovererIds::getMediaDiscovererId(int iClientID) const {
    const std::lock_guard lock(mMutex);
    const auto entry = mDiscovererOf.find(iClientID);
    return entry == mDiscovererOf.end() ? kNone : entry->second;
}

void DiscovererIds::resetMediaDiscovererIdList(int iClientID) {
    const std::lock_guard lock(mMutex);
    const auto entry = mDiscovererOf.find(iClientID);
    if (entry == mDiscovererOf.end())
        return;
    mClientOf.at(static_cast<std::size_t>(entry->second)) = kNoClient;
    mDiscovererOf.erase(entry);
}

int DiscovererIds::clientOf(int iDiscovererID) const {
    const std::lock_guard lock(mMutex);
    return mClientOf.at(static_cast<std::size_t>(iDiscovererID));
}
