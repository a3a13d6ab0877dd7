// SPDX-License-Identifier: MIT
#include "reader/Description.h"

#include <algorithm>
#include <climits>
#include <cmath>

extern "C" {
#include <libavutil/pixdesc.h>
}

#include "probe/Completion.h"
#include "probe/Duration.h"
#include "reader/MediaTypes.h"
#include "reader/TagText.h"
#include "text/Text.h"

namespace reader {

using namespace LibMediaPlayer;

namespace {

constexpr std::size_t kDescriptionLength = 100;

/** What an unknown pixel format most likely has. */
constexpr int kUsualDepth = 24;

int toInt(std::int64_t value) {
    return static_cast<int>(std::clamp<std::int64_t>(value, 0, INT_MAX));
}

std::wstring codecDescription(const AVCodecParameters& stream) {
    const AVCodecDescriptor* const codec = avcodec_descriptor_get(stream.codec_id);
    std::string text =
        codec && codec->long_name ? codec->long_name : avcodec_get_name(stream.codec_id);
    text = text.substr(0, text.find(" / ")); // the other names of the same
    if (const char* const profile = avcodec_profile_name(stream.codec_id, stream.profile))
        text += std::string(", profile ") + profile;
    return engine::fromUtf8(text).substr(0, kDescriptionLength);
}

/** Of all components of a picture element, as if none were subsampled. */
int depthOf(int pixelFormat) {
    const AVPixFmtDescriptor* const format =
        av_pix_fmt_desc_get(static_cast<AVPixelFormat>(pixelFormat));
    if (!format)
        return kUsualDepth;
    if ((format->flags & AV_PIX_FMT_FLAG_PAL) != 0)
        return 8;
    int depth = 0;
    for (int index = 0; index < format->nb_components; ++index)
        depth += format->comp[index].depth;
    return depth;
}

int depthOf(const AVCodecParameters& sound) {
    if (sound.bits_per_raw_sample > 0)
        return sound.bits_per_raw_sample;
    return av_get_bits_per_sample(sound.codec_id);
}

bool isInterlaced(AVFieldOrder order) {
    return order != AV_FIELD_UNKNOWN && order != AV_FIELD_PROGRESSIVE;
}

int maxBitRate(const AVStream& stream) {
    const auto* const properties = reinterpret_cast<const AVCPBProperties*>(
        av_stream_get_side_data(&stream, AV_PKT_DATA_CPB_PROPERTIES, nullptr));
    return properties ? toInt(properties->max_bitrate) : 0;
}

AVRational pixelAspect(AVFormatContext& context, AVStream& stream) {
    const AVRational aspect = av_guess_sample_aspect_ratio(&context, &stream, nullptr);
    return aspect.num > 0 && aspect.den > 0 ? aspect : AVRational{1, 1};
}

bool isRate(AVRational rate) {
    return rate.num > 0 && rate.den > 0;
}

/**
 * The average, and where that has been reckoned from too few frames to be exact, the one that
 * they keep. Pictures have none, whatever the library invents for them.
 */
AVRational frameRate(const AVStream& stream, bool isPicture) {
    constexpr double kClose = 0.03;
    const AVRational average = stream.avg_frame_rate;
    const AVRational kept = stream.r_frame_rate;
    if (isPicture || (!isRate(average) && !isRate(kept)))
        return {0, 1};
    if (!isRate(kept))
        return average;
    if (!isRate(average) || std::abs(av_q2d(average) / av_q2d(kept) - 1) < kClose)
        return kept;
    return average;
}

/** Streams by number, the counts bounded by what there is room for. */
class Describer {
public:
    explicit Describer(probe::MediaFile& file) : mFile(file), mContext(file.context()) {}

    MediaMetaInfo run() {
        for (unsigned int index = 0; index < mContext.nb_streams; ++index)
            describe(*mContext.streams[index]);
        describeSystem();
        shareBitRate();
        return std::move(mInfo);
    }

private:
    void describe(AVStream& stream) {
        if (probe::isVideo(stream) && mInfo.videoCount == 0)
            describeVideo(stream);
        else if (probe::isAudio(stream) && mInfo.audioCount < kMostAudio)
            describeAudio(stream);
    }

    void describeVideo(AVStream& stream) {
        ++mInfo.videoCount;
        VideoMetaInfo& video = mInfo.video;
        const AVCodecParameters& known = *stream.codecpar;
        video.mediaType = codecType(known);
        video.description = codecDescription(known);
        video.width = toInt(known.width);
        video.height = toInt(known.height);
        video.depth = depthOf(known.format);
        const AVRational rate = frameRate(stream, mFile.isPicture());
        video.frameRateNumerator = rate.num;
        video.frameRateDenominator = rate.den;
        const AVRational aspect = pixelAspect(mContext, stream);
        video.pixelAspectNumerator = aspect.num;
        video.pixelAspectDenominator = aspect.den;
        video.interlaced = isInterlaced(known.field_order);
        video.bitRate = mFile.isPicture() ? 0 : toInt(known.bit_rate);
        video.maxBitRate = maxBitRate(stream);
        video.stillPicture = mFile.isPicture();
    }

    void describeAudio(const AVStream& stream) {
        AudioMetaInfo& audio = mInfo.audio[static_cast<std::size_t>(mInfo.audioCount++)];
        const AVCodecParameters& known = *stream.codecpar;
        audio.mediaType = codecType(known);
        audio.description = codecDescription(known);
        audio.channels = toInt(known.ch_layout.nb_channels);
        audio.sampleRate = toInt(known.sample_rate);
        audio.depth = depthOf(known);
        audio.bitRate = toInt(known.bit_rate);
        audio.maxBitRate = maxBitRate(stream);
    }

    void describeSystem() {
        mInfo.system.mediaType = containerType(mFile);
        mInfo.system.tags = tagText(mContext);
        mInfo.system.duration = mFile.duration().time.count();
        mInfo.system.seekable = mInfo.system.duration > 0;
    }

    /** A file with one stream is that stream. */
    void shareBitRate() {
        const bool alone = mInfo.videoCount + mInfo.audioCount == 1 && !mFile.isPicture();
        int& rate = mInfo.videoCount == 1 ? mInfo.video.bitRate : mInfo.audio.front().bitRate;
        // A frame's rate is not that of all of them.
        const bool isGuessed = probe::isBareSound(mFile.formatName()) && mContext.duration <= 0;
        if (alone && (rate == 0 || isGuessed) && mInfo.system.duration > 0)
            rate = toInt(av_rescale(mFile.size(), 8'000'000'000, mInfo.system.duration));
    }

    static constexpr int kMostAudio = 8;

    probe::MediaFile& mFile;
    AVFormatContext& mContext;
    MediaMetaInfo mInfo;
};

} // namespace

discoverer::Details readDetails(probe::MediaFile& file) {
    probe::complete(file);
    const AVFormatContext& context = file.context();
    const bool hasPicture = std::any_of(
        context.streams, context.streams + context.nb_streams,
        [](const AVStream* stream) { return probe::isVideo(*stream) || probe::isCover(*stream); });
    return {Describer(file).run(), hasPicture};
}

} // namespace reader
