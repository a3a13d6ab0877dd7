// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>

#include "discoverer/DetailsCache.h"
#include "probe/MediaFile.h"

namespace discoverer {

/** A file whose details are wanted. It is not opened when they are known. For one thread. */
class DescribedFile {
public:
    explicit DescribedFile(DetailsCache& cache = DetailsCache::shared()) : mCache(cache) {}

    /** Returns 0 or a LibMediaPlayer::Result. */
    int open(const std::string& path);
    void close();

    /** Null when nothing is open. */
    std::shared_ptr<const Details> describe();

private:
    void read();

    DetailsCache& mCache;
    FileIdentity mIdentity;
    std::unique_ptr<probe::MediaFile> mpFile; ///< until it has been read
    std::shared_ptr<const Details> mDetails;
};

} // namespace discoverer
