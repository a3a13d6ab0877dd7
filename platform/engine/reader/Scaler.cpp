// SPDX-License-Identifier: MIT
#include "reader/Scaler.h"

#include <algorithm>

extern "C" {
#include <libswscale/swscale.h>
}

namespace reader {

namespace {

/** In memory blue first: 0xAARRGGBB on the machines that there are. */
constexpr AVPixelFormat kPixels = AV_PIX_FMT_BGRA;

/** From this height on what does not name its colour matrix has that of high definition. */
constexpr int kHighDefinition = 720;

struct ScalerTraits {
    using Pointer = SwsContext*;
    static void release(SwsContext* scaler) { sws_freeContext(scaler); }
};
using Scaler = handle::UniqueHandle<ScalerTraits>;

struct Shape {
    Size size;
    AVPixelFormat format;
};

Scaler makeScaler(Shape from, Shape to) {
    return {handle::kAdopt,
            sws_getContext(from.size.width, from.size.height, from.format, to.size.width,
                           to.size.height, to.format, SWS_BICUBIC, nullptr, nullptr, nullptr)};
}

int matrixOf(const AVFrame& frame) {
    if (frame.colorspace == AVCOL_SPC_UNSPECIFIED)
        return frame.height >= kHighDefinition ? SWS_CS_ITU709 : SWS_CS_ITU601;
    return frame.colorspace;
}

void setColours(const Scaler& scaler, int matrix, bool fromFull, bool toFull) {
    constexpr int kNeutral = 1 << 16;
    sws_setColorspaceDetails(scaler.get(), sws_getCoefficients(matrix), fromFull ? 1 : 0,
                             sws_getCoefficients(SWS_CS_DEFAULT), toFull ? 1 : 0, 0, kNeutral,
                             kNeutral);
}

/** The library writes in steps: rows run over by less than so many pixels. */
constexpr std::size_t kSlack = 64;

std::size_t paddedWidth(Size size) {
    return (static_cast<std::size_t>(size.width) / kSlack + 2) * kSlack;
}

/** Rows of `padded` pixels become rows of the width. */
void removePadding(std::vector<std::uint32_t>& pixels, std::size_t padded, Size size) {
    const auto width = static_cast<std::size_t>(size.width);
    for (std::size_t row = 1; row < static_cast<std::size_t>(size.height); ++row)
        std::copy_n(pixels.begin() + static_cast<std::ptrdiff_t>(row * padded), width,
                    pixels.begin() + static_cast<std::ptrdiff_t>(row * width));
    pixels.resize(width * static_cast<std::size_t>(size.height));
}

} // namespace

bool scaleToPixels(const AVFrame& frame, Size size, std::vector<std::uint32_t>& pixels) {
    const auto format = static_cast<AVPixelFormat>(frame.format);
    const Scaler scaler = makeScaler({{frame.width, frame.height}, format}, {size, kPixels});
    if (!scaler)
        return false;
    setColours(scaler, matrixOf(frame), frame.color_range == AVCOL_RANGE_JPEG, true);
    const std::size_t padded = paddedWidth(size);
    pixels.resize(padded * static_cast<std::size_t>(size.height));
    std::uint8_t* const planes[] = {reinterpret_cast<std::uint8_t*>(pixels.data()), nullptr,
                                    nullptr, nullptr};
    const int strides[] = {static_cast<int>(padded) * 4, 0, 0, 0};
    if (sws_scale(scaler.get(), frame.data, frame.linesize, 0, frame.height, planes, strides) !=
        size.height)
        return false;
    removePadding(pixels, padded, size);
    return true;
}

bool convertFromPixels(const std::vector<std::uint32_t>& pixels, Size size, AVPixelFormat format,
                       AVFrame& frame) {
    const Scaler scaler = makeScaler({size, kPixels}, {size, format});
    frame.width = size.width;
    frame.height = size.height;
    frame.format = format;
    frame.color_range = AVCOL_RANGE_JPEG;
    if (!scaler || av_frame_get_buffer(&frame, 0) < 0)
        return false;
    setColours(scaler, SWS_CS_ITU601, true, true);
    const std::uint8_t* const planes[] = {reinterpret_cast<const std::uint8_t*>(pixels.data()),
                                          nullptr, nullptr, nullptr};
    const int strides[] = {size.width * 4, 0, 0, 0};
    return sws_scale(scaler.get(), planes, strides, 0, size.height, frame.data, frame.linesize) ==
           size.height;
}

} // namespace reader
