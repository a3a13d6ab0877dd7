// SPDX-License-Identifier: MIT
#include "reader/Canvas.h"

#include <utility>

extern "C" {
#include <libavutil/pixdesc.h>
}

#include "LibMediaPlayer/Result.h"
#include "reader/Scaler.h"

namespace reader {

using namespace LibMediaPlayer;

namespace {

constexpr std::uint32_t kBlack = 0xff000000;

bool hasAlpha(int format) {
    const AVPixFmtDescriptor* const known = av_pix_fmt_desc_get(static_cast<AVPixelFormat>(format));
    return known && (known->flags & (AV_PIX_FMT_FLAG_ALPHA | AV_PIX_FMT_FLAG_PAL)) != 0;
}

/** What shines through is black. */
std::uint32_t opaque(std::uint32_t pixel) {
    const std::uint32_t alpha = pixel >> 24;
    std::uint32_t result = kBlack;
    for (int shift = 0; shift < 24; shift += 8)
        result |= ((pixel >> shift & 0xff) * alpha + 127) / 255 << shift;
    return result;
}

Size unturned(Size size, int rotation) {
    if (rotation % 180 != 0)
        std::swap(size.width, size.height);
    return size;
}

/** Where the pixel at column x, row y of what was decoded is seen. */
Size turned(int x, int y, Size decoded, int rotation) {
    switch (rotation) {
    case 90:
        return {decoded.height - 1 - y, x};
    case 180:
        return {decoded.width - 1 - x, decoded.height - 1 - y};
    case 270:
        return {y, decoded.width - 1 - x};
    default:
        return {x, y};
    }
}

} // namespace

int draw(const Picture& picture, const Layout& layout, Canvas& canvas) {
    const Size decoded = unturned(layout.picture, picture.rotation);
    std::vector<std::uint32_t> pixels;
    if (!scaleToPixels(*picture.frame.get(), decoded, pixels))
        return kInternal;
    const bool shines = hasAlpha(picture.frame->format);
    canvas.size = layout.canvas;
    const std::size_t count = static_cast<std::size_t>(layout.canvas.width) *
                              static_cast<std::size_t>(layout.canvas.height);
    canvas.pixels.reserve(count + kReadAhead);
    canvas.pixels.assign(count, kBlack);
    const std::uint32_t* next = pixels.data();
    for (int y = 0; y < decoded.height; ++y) {
        for (int x = 0; x < decoded.width; ++x, ++next) {
            const Size place = turned(x, y, decoded, picture.rotation);
            const auto row = static_cast<std::size_t>(layout.top + place.height);
            const auto column = static_cast<std::size_t>(layout.left + place.width);
            canvas.pixels[row * static_cast<std::size_t>(layout.canvas.width) + column] =
                shines ? opaque(*next) : *next | kBlack;
        }
    }
    return kOk;
}

} // namespace reader
