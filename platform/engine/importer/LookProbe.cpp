// SPDX-License-Identifier: MIT
#include "importer/LookProbe.h"

#include <memory>
#include <variant>

#include "LibMediaPlayer/Result.h"
#include "discoverer/Description.h"
#include "probe/MediaFile.h"

namespace importer {

using namespace LibMediaPlayer;
using probe::MediaFile;

Probed probeByLook(const std::string& path) {
    const auto opened = MediaFile::open(path);
    if (const auto* const failure = std::get_if<probe::LookFailure>(&opened))
        return {failure->result, {}};
    if (const auto* const pFile = std::get_if<std::unique_ptr<MediaFile>>(&opened))
        return {kOk, discoverer::describe(**pFile)};
    return {kTimedOut, {}};
}

} // namespace importer
