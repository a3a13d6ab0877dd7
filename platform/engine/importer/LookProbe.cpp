// SPDX-License-Identifier: MIT
#include "importer/LookProbe.h"

#include "LibMediaPlayer/Result.h"
#include "discoverer/DescribedFile.h"

namespace importer {

Probed probeByLook(const std::string& path) {
    discoverer::DescribedFile file;
    if (const int result = file.open(path); result != LibMediaPlayer::kOk)
        return {result, {}, false};
    const auto details = file.describe();
    return {LibMediaPlayer::kOk, details->info, details->hasPicture};
}

} // namespace importer
