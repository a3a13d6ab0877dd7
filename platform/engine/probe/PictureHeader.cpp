// SPDX-License-Identifier: MIT
#include "probe/PictureHeader.h"

#include <algorithm>
#include <iterator>

namespace probe {

namespace {

struct Header {
    int width = 0;
    int height = 0;
    AVPixelFormat format = AV_PIX_FMT_NONE;
    int profile = FF_PROFILE_UNKNOWN;
};

/** The code of a segment that begins a picture, which is its profile too. */
bool isFrame(int marker) {
    constexpr int kBaseline = 0xc0;
    constexpr int kProgressive = 0xc2;
    return marker >= kBaseline && marker <= kProgressive;
}

AVPixelFormat formatOfJpeg(int bits, int components) {
    if (bits != 8)
        return AV_PIX_FMT_NONE;
    return components == 3   ? AV_PIX_FMT_YUVJ444P
           : components == 1 ? AV_PIX_FMT_GRAY8
                             : AV_PIX_FMT_NONE;
}

Header readFrame(AVIOContext& input, int marker) {
    Header header;
    avio_rb16(&input); // the segment's length
    const int bits = avio_r8(&input);
    header.height = static_cast<int>(avio_rb16(&input));
    header.width = static_cast<int>(avio_rb16(&input));
    header.format = formatOfJpeg(bits, avio_r8(&input));
    header.profile = marker;
    return header;
}

/** Segment after segment, each with its length, to the one that begins the picture. */
Header readJpeg(AVIOContext& input) {
    constexpr unsigned int kBegin = 0xffd8;
    constexpr int kMostSegments = 1000;
    if (avio_rb16(&input) != kBegin)
        return {};
    for (int count = 0; count < kMostSegments && !avio_feof(&input); ++count) {
        const unsigned int code = avio_rb16(&input);
        const int marker = static_cast<int>(code & 0xff);
        if (code >> 8 != 0xff || marker == 0xda)
            return {};
        if (isFrame(marker))
            return readFrame(input, marker);
        const unsigned int length = avio_rb16(&input);
        if (length < 2)
            return {};
        avio_skip(&input, length - 2);
    }
    return {};
}

struct PngFormat {
    int bits;
    int colours; ///< what a pixel consists of, in the file's code
    AVPixelFormat format;
};

/** Those whose depth a later chunk cannot change. */
constexpr PngFormat kPngFormats[] = {
    {8, 3, AV_PIX_FMT_PAL8},     {8, 4, AV_PIX_FMT_YA8},       {16, 4, AV_PIX_FMT_YA16BE},
    {8, 6, AV_PIX_FMT_RGBA},     {16, 6, AV_PIX_FMT_RGBA64BE}, {8, 2, AV_PIX_FMT_RGB24},
    {16, 2, AV_PIX_FMT_RGB48BE}, {8, 0, AV_PIX_FMT_GRAY8},     {16, 0, AV_PIX_FMT_GRAY16BE}};

/** A transparent colour adds a component. Such chunks come before the picture. */
bool hasTransparentColour(AVIOContext& input) {
    constexpr int kMostChunks = 1000;
    for (int count = 0; count < kMostChunks && !avio_feof(&input); ++count) {
        const unsigned int length = avio_rb32(&input);
        const unsigned int type = avio_rb32(&input);
        if (type == MKBETAG('I', 'D', 'A', 'T'))
            return false;
        if (type == MKBETAG('t', 'R', 'N', 'S'))
            return true;
        avio_skip(&input, static_cast<std::int64_t>(length) + 4);
    }
    return true;
}

Header readPng(AVIOContext& input) {
    constexpr int kSignature = 8;
    constexpr unsigned int kSize = 13;
    avio_skip(&input, kSignature);
    if (avio_rb32(&input) != kSize || avio_rb32(&input) != MKBETAG('I', 'H', 'D', 'R'))
        return {};
    Header header;
    header.width = static_cast<int>(avio_rb32(&input));
    header.height = static_cast<int>(avio_rb32(&input));
    const int bits = avio_r8(&input);
    const int colours = avio_r8(&input);
    avio_skip(&input, 3 + 4);
    const auto* const row =
        std::find_if(std::begin(kPngFormats), std::end(kPngFormats), [=](const PngFormat& known) {
            return known.bits == bits && known.colours == colours;
        });
    if (row != std::end(kPngFormats) && (colours == 3 || !hasTransparentColour(input)))
        header.format = row->format;
    return header;
}

} // namespace

bool readPictureHeader(AVIOContext& input, AVCodecParameters& stream) {
    const std::int64_t begin = avio_tell(&input);
    Header header;
    if (stream.codec_id == AV_CODEC_ID_MJPEG)
        header = readJpeg(input);
    else if (stream.codec_id == AV_CODEC_ID_PNG)
        header = readPng(input);
    const bool isComplete = !avio_feof(&input) && header.format != AV_PIX_FMT_NONE;
    avio_seek(&input, begin, SEEK_SET);
    if (!isComplete || header.width <= 0 || header.height <= 0)
        return false;
    stream.width = header.width;
    stream.height = header.height;
    stream.format = header.format;
    stream.profile = header.profile;
    return true;
}

} // namespace probe
