// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>

#include "discoverer/Details.h"
#include "discoverer/ImageForm.h"
#include "discoverer/Thumbnail.h"
#include "probe/MediaLook.h"

namespace worker {

/**
 * What a worker can be asked. A request comes with the descriptor of the file that it is about,
 * open for reading, but for kDemuxers; kDraw also with one to write to.
 */
enum class Kind : std::uint8_t {
    kDemuxers,  ///< answered by Demuxers
    kLook,      ///< answered by Looked
    kDescribe,  ///< answered by discoverer::Details
    kDraw,      ///< answered by the result alone
    kThumbnail, ///< answered by discoverer::Thumbnail
};

/** A picture that is wanted. */
struct Drawing {
    std::int64_t position = 0; ///< nanoseconds
    std::int32_t width = 0;
    std::int32_t height = 0;
    discoverer::ImageForm form = discoverer::ImageForm::kPixels;
};

/** An answer is a LibMediaPlayer::Result and then, when that is 0, the record that Kind names. */
struct Request {
    Kind kind = Kind::kDemuxers;
    Drawing drawing; ///< of kDraw
};

struct Demuxers {
    std::string names; ///< libavformat's, comma separated
};

struct Looked {
    bool isDecided = false; ///< the look counts only then
    probe::MediaLook look;
};

template<typename Message>
void fields(Message& message, Request& request) {
    Drawing& drawing = request.drawing;
    message(request.kind, drawing.position, drawing.width, drawing.height, drawing.form);
}

template<typename Message>
void fields(Message& message, Demuxers& demuxers) {
    message(demuxers.names);
}

template<typename Message>
void fields(Message& message, probe::MediaLook::Video& video) {
    message(video.codec, video.width, video.height, video.frameRate);
}

template<typename Message>
void fields(Message& message, probe::MediaLook::Audio& audio) {
    message(audio.codec);
}

template<typename Message>
void fields(Message& message, probe::Duration& duration) {
    std::int64_t count = duration.time.count();
    message(count, duration.isMeasured);
    duration.time = std::chrono::nanoseconds(count);
}

template<typename Message>
void fields(Message& message, Looked& looked) {
    probe::MediaLook& look = looked.look;
    message(looked.isDecided, look.container, look.still, look.tagged, look.duration,
            look.videoCount, look.audioCount, look.textCount, look.video, look.audio);
}

template<typename Message>
void fields(Message& message, LibMediaPlayer::SystemMetaInfo& info) {
    message(info.mediaType, info.tags, info.seekable, info.live, info.duration);
}

template<typename Message>
void fields(Message& message, LibMediaPlayer::VideoMetaInfo& info) {
    message(info.mediaType, info.description, info.width, info.height, info.depth,
            info.frameRateNumerator, info.frameRateDenominator, info.pixelAspectNumerator,
            info.pixelAspectDenominator, info.interlaced, info.bitRate, info.maxBitRate,
            info.stillPicture);
}

template<typename Message>
void fields(Message& message, LibMediaPlayer::AudioMetaInfo& info) {
    message(info.mediaType, info.description, info.channels, info.sampleRate, info.depth,
            info.bitRate, info.maxBitRate);
}

template<typename Message>
void fields(Message& message, discoverer::Details& details) {
    LibMediaPlayer::MediaMetaInfo& info = details.info;
    message(info.system, info.videoCount, info.video, info.audioCount, info.audio,
            details.hasPicture);
}

template<typename Message>
void fields(Message& message, discoverer::Thumbnail& thumbnail) {
    message(thumbnail.jpeg);
}

} // namespace worker
