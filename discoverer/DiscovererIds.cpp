// SPDX-License-Identifier: MIT
#include "discoverer/DiscovererIds.h"

void DiscovererIds::setMediaDiscovererIdList(int iClientID) {
    const std::lock_guard lock(mMutex);
    const int iDiscovererID = firstFree();
    if (iDiscovererID == kNone)
        return;
    mClientOf.at(static_cast<std::size_t>(iDiscovererID)) = iClientID;
    mDiscovererOf.emplace(iClientID, iDiscovererID);
}

int DiscovererIds::getMediaDiscovererId(int iClientID) const {
    const std::lock_guard lock(mMutex);
    const auto entry = mDiscovererOf.find(iClientID);
    return entry == mDiscovererOf.end() ? kNone : entry->second;
}

void DiscovererIds::resetMediaDiscovererIdList(int iClientID) {
    const std::lock_guard lock(mMutex);
    freeDiscovererOf(iClientID);
}

int DiscovererIds::setAside(int iClientID) {
    const std::lock_guard lock(mMutex);
    const int iDiscovererID = freeDiscovererOf(iClientID);
    if (iDiscovererID != kNone)
        ++mSetAside.at(static_cast<std::size_t>(iDiscovererID));
    return iDiscovererID;
}

void DiscovererIds::takeBack(int iDiscovererID) {
    const std::lock_guard lock(mMutex);
    --mSetAside.at(static_cast<std::size_t>(iDiscovererID));
}

int DiscovererIds::clientOf(int iDiscovererID) const {
    const std::lock_guard lock(mMutex);
    return mClientOf.at(static_cast<std::size_t>(iDiscovererID));
}

int DiscovererIds::firstFree() const {
    int setAside = kNone;
    for (std::size_t id = 0; id < mClientOf.size(); ++id) {
        if (mClientOf.at(id) != kNoClient)
            continue;
        if (mSetAside.at(id) == 0)
            return static_cast<int>(id);
        if (setAside == kNone)
            setAside = static_cast<int>(id);
    }
    return setAside;
}

int DiscovererIds::freeDiscovererOf(int iClientID) {
    const auto entry = mDiscovererOf.find(iClientID);
    if (entry == mDiscovererOf.end())
        return kNone;
    const int iDiscovererID = entry->second;
    mClientOf.at(static_cast<std::size_t>(iDiscovererID)) = kNoClient;
    mDiscovererOf.erase(entry);
    return iDiscovererID;
}
