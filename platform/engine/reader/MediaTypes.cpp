// SPDX-License-Identifier: MIT
#include "reader/MediaTypes.h"

#include <algorithm>
#include <iterator>
#include <string_view>

namespace reader {

namespace {

struct ContainerType {
    std::string_view format; ///< libavformat's name
    std::string_view type;
    std::string_view soundType; ///< when there is no video; empty: the same
};

constexpr ContainerType kContainers[] = {
    {"aac", "audio/aac", ""},
    {"ac3", "audio/ac3", ""},
    {"aiff", "audio/x-aiff", ""},
    {"amr", "audio/amr", ""},
    {"ape", "audio/x-ape", ""},
    {"apng", "image/apng", ""},
    {"asf", "video/x-ms-asf", "audio/x-ms-wma"},
    {"au", "audio/basic", ""},
    {"avi", "video/x-msvideo", ""},
    {"bmp_pipe", "image/bmp", ""},
    {"caf", "audio/x-caf", ""},
    {"dts", "audio/vnd.dts", ""},
    {"dv", "video/dv", ""},
    {"eac3", "audio/eac3", ""},
    {"flac", "audio/flac", ""},
    {"flv", "video/x-flv", ""},
    {"gif", "image/gif", ""},
    {"h264", "video/x-h264", ""},
    {"hevc", "video/x-h265", ""},
    {"ivf", "video/x-ivf", ""},
    {"jpeg_pipe", "image/jpeg", ""},
    {"m4v", "video/mpeg", ""},
    {"mp3", "audio/mpeg", ""},
    {"mpeg", "video/mpeg", ""},
    {"mpegts", "video/mp2t", ""},
    {"mpegvideo", "video/mpeg", ""},
    {"mxf", "application/mxf", ""},
    {"ogg", "video/ogg", "audio/ogg"},
    {"png_pipe", "image/png", ""},
    {"rm", "application/vnd.rn-realmedia", ""},
    {"tiff_pipe", "image/tiff", ""},
    {"tta", "audio/x-tta", ""},
    {"voc", "audio/x-voc", ""},
    {"w64", "audio/x-w64", ""},
    {"wav", "audio/x-wav", ""},
    {"webp_pipe", "image/webp", ""},
    {"wv", "audio/x-wavpack", ""},
};

struct CodecType {
    AVCodecID codec;
    std::string_view type;
};

/** Those whose type is not "video/x-" or "audio/x-" and libavcodec's name. */
constexpr CodecType kCodecs[] = {
    {AV_CODEC_ID_AAC, "audio/mpeg"},        {AV_CODEC_ID_AAC_LATM, "audio/mpeg"},
    {AV_CODEC_ID_BMP, "image/bmp"},         {AV_CODEC_ID_GIF, "image/gif"},
    {AV_CODEC_ID_HEVC, "video/x-h265"},     {AV_CODEC_ID_MJPEG, "image/jpeg"},
    {AV_CODEC_ID_MP1, "audio/mpeg"},        {AV_CODEC_ID_MP2, "audio/mpeg"},
    {AV_CODEC_ID_MP3, "audio/mpeg"},        {AV_CODEC_ID_MPEG1VIDEO, "video/mpeg"},
    {AV_CODEC_ID_MPEG2VIDEO, "video/mpeg"}, {AV_CODEC_ID_MPEG4, "video/mpeg"},
    {AV_CODEC_ID_PNG, "image/png"},         {AV_CODEC_ID_APNG, "image/apng"},
    {AV_CODEC_ID_RAWVIDEO, "video/x-raw"},  {AV_CODEC_ID_TIFF, "image/tiff"},
    {AV_CODEC_ID_WEBP, "image/webp"},       {AV_CODEC_ID_WMAV1, "audio/x-wma"},
    {AV_CODEC_ID_WMAV2, "audio/x-wma"},     {AV_CODEC_ID_WMV1, "video/x-wmv"},
    {AV_CODEC_ID_WMV2, "video/x-wmv"},      {AV_CODEC_ID_WMV3, "video/x-wmv"},
};

bool hasVideo(const AVFormatContext& context) {
    return std::any_of(context.streams, context.streams + context.nb_streams,
                       [](const AVStream* stream) { return probe::isVideo(*stream); });
}

/** The brand of Apple's own files; all others are MPEG's. */
bool isQuickTime(const AVFormatContext& context) {
    const AVDictionaryEntry* const brand = av_dict_get(context.metadata, "major_brand", nullptr, 0);
    return !brand || std::string_view(brand->value) == "qt  ";
}

/** What WebM allows; its files say so in no field that libavformat tells. */
bool isWebM(const AVFormatContext& context) {
    constexpr AVCodecID kAllowed[] = {AV_CODEC_ID_VP8,  AV_CODEC_ID_VP9,    AV_CODEC_ID_AV1,
                                      AV_CODEC_ID_OPUS, AV_CODEC_ID_VORBIS, AV_CODEC_ID_WEBVTT};
    return std::all_of(context.streams, context.streams + context.nb_streams,
                       [&](const AVStream* stream) {
                           return std::find(std::begin(kAllowed), std::end(kAllowed),
                                            stream->codecpar->codec_id) != std::end(kAllowed);
                       });
}

} // namespace

std::string containerType(probe::MediaFile& file) {
    const AVFormatContext& context = file.context();
    const std::string kind = hasVideo(context) ? "video/" : "audio/";
    const std::string_view format = file.formatName();
    if (format.substr(0, 4) == "mov,")
        return kind + (isQuickTime(context) ? "quicktime" : "mp4");
    if (format.substr(0, 8) == "matroska")
        return kind + (isWebM(context) ? "webm" : "x-matroska");
    const auto* const row =
        std::find_if(std::begin(kContainers), std::end(kContainers),
                     [&](const ContainerType& known) { return known.format == format; });
    if (row == std::end(kContainers))
        return kind + "x-" + std::string(format);
    const bool sound = kind == "audio/" && !row->soundType.empty();
    return std::string(sound ? row->soundType : row->type);
}

std::string codecType(const AVCodecParameters& stream) {
    const auto* const row =
        std::find_if(std::begin(kCodecs), std::end(kCodecs),
                     [&](const CodecType& known) { return known.codec == stream.codec_id; });
    if (row != std::end(kCodecs))
        return std::string(row->type);
    const std::string name = avcodec_get_name(stream.codec_id);
    if (stream.codec_type == AVMEDIA_TYPE_VIDEO)
        return "video/x-" + name;
    return name.substr(0, 4) == "pcm_" ? "audio/x-raw" : "audio/x-" + name;
}

} // namespace reader
