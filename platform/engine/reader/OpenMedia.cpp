// SPDX-License-Identifier: MIT
#include "reader/OpenMedia.h"

#include <algorithm>
#include <utility>
#include <variant>

#include "LibMediaPlayer/Result.h"

namespace reader {

using namespace LibMediaPlayer;
using probe::MediaFile;

namespace {

bool canDecode(const AVFormatContext& context) {
    return std::any_of(context.streams, context.streams + context.nb_streams,
                       [](const AVStream* stream) {
                           return (probe::isVideo(*stream) || probe::isAudio(*stream)) &&
                                  avcodec_find_decoder(stream->codecpar->codec_id);
                       });
}

} // namespace

int openMedia(probe::RegularFile file, MediaFile::Bounds bounds,
              std::unique_ptr<MediaFile>& pFile) {
    auto opened = MediaFile::open(std::move(file), bounds);
    if (const auto* const failure = std::get_if<probe::LookFailure>(&opened))
        return failure->result;
    if (std::holds_alternative<probe::LookUndecided>(opened))
        return kTimedOut;
    auto& pOpened = std::get<std::unique_ptr<MediaFile>>(opened);
    if (!canDecode(pOpened->context()))
        return kNotMedia;
    pFile = std::move(pOpened);
    return kOk;
}

} // namespace reader
