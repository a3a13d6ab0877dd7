// SPDX-License-Identifier: MIT
#include "discoverer/DetailsCache.h"

#include <algorithm>
#include <utility>

namespace discoverer {

namespace {

/** As far as the importer may lag behind what clients ask for; half a megabyte of usual files. */
constexpr std::size_t kCapacity = 256;

constexpr std::size_t kMostTags = 8 * 1024; // characters

} // namespace

std::shared_ptr<const Details> DetailsCache::find(const FileIdentity& file) const {
    const std::lock_guard lock(mMutex);
    // Who asks twice asks soon: the newest are the likeliest, but all are looked at in no time.
    const auto found = std::find_if(mEntries.begin(), mEntries.end(),
                                    [&](const Entry& entry) { return entry.file == file; });
    return found == mEntries.end() ? nullptr : found->details;
}

void DetailsCache::put(const FileIdentity& file, std::shared_ptr<const Details> details) {
    if (details->info.system.tags.size() > kMostTags)
        return;
    const std::lock_guard lock(mMutex);
    if (mEntries.size() < mCapacity) {
        mEntries.push_back({file, std::move(details)});
        return;
    }
    mEntries[mOldest] = {file, std::move(details)};
    mOldest = (mOldest + 1) % mCapacity;
}

DetailsCache& DetailsCache::shared() {
    static DetailsCache cache(kCapacity);
    return cache;
}

} // namespace discoverer
