// SPDX-License-Identifier: MIT
#include "importer/LookProbe.h"

#include <algorithm>
#include <memory>
#include <variant>

#include "LibMediaPlayer/Result.h"
#include "discoverer/Description.h"
#include "probe/MediaFile.h"

namespace importer {

using namespace LibMediaPlayer;
using probe::MediaFile;

namespace {

bool hasPicture(const AVFormatContext& context) {
    return std::any_of(
        context.streams, context.streams + context.nb_streams,
        [](const AVStream* stream) { return probe::isVideo(*stream) || probe::isCover(*stream); });
}

} // namespace

Probed probeByLook(const std::string& path) {
    const auto opened = MediaFile::open(path);
    if (const auto* const failure = std::get_if<probe::LookFailure>(&opened))
        return {failure->result, {}, false};
    if (const auto* const pFile = std::get_if<std::unique_ptr<MediaFile>>(&opened))
        return {kOk, discoverer::describe(**pFile), hasPicture((*pFile)->context())};
    return {kTimedOut, {}, false};
}

} // namespace importer
