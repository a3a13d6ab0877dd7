// SPDX-License-Identifier: MIT
#include "reader/Layout.h"

#include <algorithm>
#include <utility>

extern "C" {
#include <libavutil/mathematics.h>
}

namespace reader {

namespace {

/** At least one pixel, and no overflow whatever the numbers. */
int scaled(int value, std::int64_t numerator, std::int64_t denominator) {
    const std::int64_t result = av_rescale(value, numerator, denominator);
    return static_cast<int>(std::clamp<std::int64_t>(result, 1, kLongestSide + 1));
}

bool isTooLarge(Size size) {
    return size.width > kLongestSide || size.height > kLongestSide ||
           static_cast<std::int64_t>(size.width) * size.height > kMostPixels;
}

Size canvasSize(Size natural, int width, int height) {
    if (width == 0 && height == 0)
        return natural;
    if (width == 0)
        return {scaled(height, natural.width, natural.height), height};
    if (height == 0)
        return {width, scaled(width, natural.height, natural.width)};
    return {width, height};
}

Size fittedSize(Size natural, Size canvas) {
    const auto wide = static_cast<std::int64_t>(natural.width) * canvas.height;
    const auto high = static_cast<std::int64_t>(natural.height) * canvas.width;
    if (wide >= high)
        return {canvas.width,
                std::min(canvas.height, scaled(canvas.width, natural.height, natural.width))};
    return {std::min(canvas.width, scaled(canvas.height, natural.width, natural.height)),
            canvas.height};
}

} // namespace

Size naturalSize(Size frame, AVRational pixelAspect, int rotation) {
    Size size = frame;
    if (pixelAspect.num > 0 && pixelAspect.den > 0)
        size.width = scaled(frame.width, pixelAspect.num, pixelAspect.den);
    if (rotation % 180 != 0)
        std::swap(size.width, size.height);
    return size;
}

std::optional<Layout> layOut(Size natural, int width, int height) {
    if (width < 0 || height < 0 || natural.width <= 0 || natural.height <= 0)
        return std::nullopt;
    Layout layout;
    layout.canvas = canvasSize(natural, width, height);
    if (isTooLarge(layout.canvas))
        return std::nullopt;
    layout.picture = fittedSize(natural, layout.canvas);
    layout.left = (layout.canvas.width - layout.picture.width) / 2;
    layout.top = (layout.canvas.height - layout.picture.height) / 2;
    return layout;
}

} // namespace reader
