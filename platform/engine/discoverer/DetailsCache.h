// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <memory>
#include <mutex>
#include <vector>

#include "discoverer/Details.h"
#include "discoverer/FileIdentity.h"

namespace discoverer {

/**
 * The details of the files that were read last, so that who asks after another need not read them
 * again. Any thread.
 */
class DetailsCache {
public:
    /** Holds so many; the oldest goes first. */
    explicit DetailsCache(std::size_t capacity) : mCapacity(capacity) {}

    /** Null when it is not known. */
    [[nodiscard]] std::shared_ptr<const Details> find(const FileIdentity& file) const;

    /** Details with tags of many kilobytes are not kept, so that memory is bounded. */
    void put(const FileIdentity& file, std::shared_ptr<const Details> details);

    /** The one of this process. */
    static DetailsCache& shared();

private:
    struct Entry {
        FileIdentity file;
        std::shared_ptr<const Details> details;
    };

    const std::size_t mCapacity;
    mutable std::mutex mMutex; ///< guards the next two
    std::vector<Entry> mEntries;
    std::size_t mOldest = 0; ///< once it is full
};

} // namespace discoverer
