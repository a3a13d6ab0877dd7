// SPDX-License-Identifier: MIT
#include "importer/LookProbe.h"

#include "LibMediaPlayer/Result.h"
#include "discoverer/DescribedFile.h"

namespace importer {

Probed probeByLook(const std::string& path) {
    std::shared_ptr<const discoverer::Details> pDetails;
    if (const int result = discoverer::describeFile(path, pDetails); result != LibMediaPlayer::kOk)
        return {result, {}, false};
    return {LibMediaPlayer::kOk, pDetails->info, pDetails->hasPicture};
}

} // namespace importer
