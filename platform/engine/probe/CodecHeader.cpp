// SPDX-License-Identifier: MIT
#include "probe/CodecHeader.h"

#include <cstdint>

namespace probe {

namespace {

void readFlac(AVCodecParameters& stream) {
    constexpr int kSize = 34;
    if (stream.extradata_size < kSize)
        return;
    const std::uint8_t* const data = stream.extradata;
    stream.sample_rate = data[10] << 12 | data[11] << 4 | data[12] >> 4;
    stream.bits_per_raw_sample = ((data[12] & 1) << 4 | data[13] >> 4) + 1;
    if (stream.ch_layout.nb_channels == 0)
        av_channel_layout_default(&stream.ch_layout, (data[12] >> 1 & 7) + 1);
}

int alacDepth(const AVCodecParameters& stream) {
    constexpr int kSize = 36;
    return stream.extradata_size < kSize ? 0 : stream.extradata[17];
}

} // namespace

void readLossless(AVCodecParameters& stream) {
    switch (stream.codec_id) {
    case AV_CODEC_ID_FLAC:
        return readFlac(stream);
    case AV_CODEC_ID_ALAC:
        stream.bits_per_raw_sample = alacDepth(stream);
        return;
    case AV_CODEC_ID_WAVPACK:
    case AV_CODEC_ID_TTA:
    case AV_CODEC_ID_APE:
        stream.bits_per_raw_sample = stream.bits_per_coded_sample;
        return;
    default:
        return;
    }
}

bool tellsAacFormat(const AVCodecParameters& stream) {
    constexpr int kLowComplexity = 2;
    constexpr int kFastestOfExtended = 24000; // the extension doubles it
    if (stream.codec_id != AV_CODEC_ID_AAC || stream.extradata_size < 2)
        return false;
    const int object = stream.extradata[0] >> 3;
    const int channels = stream.extradata[1] >> 3 & 0x0f;
    return object == kLowComplexity && channels > 0 && stream.sample_rate > kFastestOfExtended &&
           stream.ch_layout.nb_channels > 0;
}

AVCodecID layerOfMpeg(const AVPacket& packet) {
    constexpr AVCodecID kLayers[] = {AV_CODEC_ID_MP3, AV_CODEC_ID_MP3, AV_CODEC_ID_MP2,
                                     AV_CODEC_ID_MP1}; // by the header's code, of which 0 is none
    return packet.size > 1 ? kLayers[packet.data[1] >> 1 & 3] : AV_CODEC_ID_MP3;
}

AVPixelFormat pixelFormatOfVp9(const AVPacket& packet) {
    // Two bits that mark a frame, and the profile: 0 has eight bits and this subsampling only.
    constexpr int kMarkAndProfile = 0xf0;
    constexpr int kFrameOfProfile0 = 0x80;
    const bool usual = packet.size > 0 && (packet.data[0] & kMarkAndProfile) == kFrameOfProfile0;
    return usual ? AV_PIX_FMT_YUV420P : AV_PIX_FMT_NONE;
}

} // namespace probe
