// SPDX-License-Identifier: MIT
#include "importer/LookProbe.h"

#include <cmath>
#include <variant>

#include "LibMediaPlayer/Result.h"
#include "probe/MediaLook.h"
#include "text/Text.h"

namespace importer {

using namespace LibMediaPlayer;

namespace {

constexpr double kRateScale = 1000;

void describe(const probe::MediaLook::Video& video, bool still, VideoMetaInfo& info) {
    info.description = engine::toWide(video.codec);
    info.width = video.width;
    info.height = video.height;
    info.frameRateNumerator = static_cast<int32_t>(std::lround(video.frameRate * kRateScale));
    info.frameRateDenominator = static_cast<int32_t>(kRateScale);
    info.stillPicture = still;
}

MediaMetaInfo describe(const probe::MediaLook& look) {
    MediaMetaInfo info;
    info.system.mediaType = look.container;
    info.system.duration = look.duration.count();
    info.system.seekable = !look.still;
    if (look.video) {
        info.videoCount = 1;
        describe(*look.video, look.still, info.video);
    }
    if (look.audio) {
        info.audioCount = 1;
        info.audio.front().description = engine::toWide(look.audio->codec);
    }
    return info;
}

} // namespace

Probed probeByLook(const std::string& path) {
    const probe::LookResult result = probe::lookAt(path);
    if (const auto* const failure = std::get_if<probe::LookFailure>(&result))
        return {failure->result, {}};
    if (const auto* const look = std::get_if<probe::MediaLook>(&result))
        return {kOk, describe(*look)};
    return {kTimedOut, {}};
}

} // namespace importer
