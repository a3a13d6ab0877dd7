// SPDX-License-Identifier: MIT
#include "probe/MediaLook.h"

#include <utility>

#include "probe/MediaFile.h"

namespace probe {

namespace {

double frameRate(const AVStream& stream) {
    const AVRational rate = stream.avg_frame_rate;
    return rate.den == 0 ? 0 : av_q2d(rate);
}

void describe(const AVStream& stream, MediaLook& look) {
    const AVCodecParameters& parameters = *stream.codecpar;
    const char* const codec = avcodec_get_name(parameters.codec_id);
    if (isVideo(stream)) {
        if (look.videoCount++ == 0)
            look.video =
                MediaLook::Video{codec, parameters.width, parameters.height, frameRate(stream)};
    } else if (isAudio(stream)) {
        if (look.audioCount++ == 0)
            look.audio = MediaLook::Audio{codec};
    } else if (parameters.codec_type == AVMEDIA_TYPE_SUBTITLE) {
        ++look.textCount;
    }
}

MediaLook describe(MediaFile& file) {
    MediaLook look;
    look.container = file.formatName();
    look.tagged = file.isTagged();
    look.still = file.isPicture();
    for (unsigned int index = 0; index < file.context().nb_streams; ++index)
        describe(*file.context().streams[index], look);
    look.duration = file.duration();
    return look;
}

} // namespace

LookResult lookAt(RegularFile file) {
    auto opened = MediaFile::open(std::move(file));
    if (const auto* const failure = std::get_if<LookFailure>(&opened))
        return *failure;
    if (std::holds_alternative<LookUndecided>(opened))
        return LookUndecided{};
    return describe(*std::get<std::unique_ptr<MediaFile>>(opened));
}

} // namespace probe
