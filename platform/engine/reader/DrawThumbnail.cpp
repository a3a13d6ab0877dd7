// SPDX-License-Identifier: MIT
#include "reader/DrawThumbnail.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <memory>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "reader/Canvas.h"
#include "reader/FrameFinder.h"
#include "reader/ImageEncoder.h"
#include "reader/Layout.h"
#include "reader/OpenMedia.h"

namespace reader {

using namespace LibMediaPlayer;
using probe::MediaFile;
using std::chrono::nanoseconds;
using std::chrono::seconds;

namespace {

constexpr MediaFile::Bounds kBounds{64 * 1024 * 1024, std::chrono::milliseconds(5000)};

/** Enough for the key frame itself, where two packets make one picture too. */
constexpr int kKeyFrameBudget = 3;

/** From a key frame that is dark: four seconds of most films. */
constexpr int kSceneBudget = 100;

/** Mean of the three colours, of 255: titles on black are above it, fades to black below. */
constexpr std::uint64_t kDark = 20;

struct Attempt {
    nanoseconds position;
    int frameBudget;
};

/** What files say can be anything; where they say nothing, it is a few seconds. */
nanoseconds lengthOf(const MediaFile& file) {
    constexpr std::chrono::microseconds kLongest = std::chrono::hours(1000);
    const std::chrono::microseconds told(file.context().duration);
    return told.count() > 0 ? std::min(told, kLongest) : seconds(10);
}

/** Key frames are cheap. Where only the first one is there, and dark, one has to be decoded to. */
std::array<Attempt, 4> attemptsFor(const MediaFile& file) {
    const nanoseconds length = lengthOf(file);
    return {{{std::min<nanoseconds>(length / 10, seconds(10)), kKeyFrameBudget},
             {length / 4, kKeyFrameBudget},
             {length / 2, kKeyFrameBudget},
             {length / 2, kSceneBudget}}};
}

Layout layOutSmall(Size natural) {
    const bool isWide = natural.width >= natural.height;
    const int side = std::min(discoverer::kThumbnailSide, isWide ? natural.width : natural.height);
    return layOut(natural, isWide ? side : 0, isWide ? 0 : side).value_or(Layout{});
}

int drawSmall(const Picture& picture, Canvas& canvas) {
    const Size frame{picture.frame->width, picture.frame->height};
    const Layout layout = layOutSmall(naturalSize(frame, picture.pixelAspect, picture.rotation));
    return layout.canvas.width > 0 ? draw(picture, layout, canvas) : static_cast<int>(kDamaged);
}

std::uint64_t brightness(const Canvas& canvas) {
    std::uint64_t sum = 0;
    for (const std::uint32_t pixel : canvas.pixels)
        sum += (pixel >> 16 & 0xff) + (pixel >> 8 & 0xff) + (pixel & 0xff);
    return canvas.pixels.empty() ? 0 : sum / (3 * canvas.pixels.size());
}

int drawCover(MediaFile& file, Canvas& canvas) {
    Picture cover;
    const int result = findCover(file, cover);
    return result == kOk ? drawSmall(cover, canvas) : result;
}

int drawScene(MediaFile& file, const Attempt& attempt, Canvas& canvas) {
    Picture picture;
    const int result = findPicture(file, attempt.position, picture, attempt.frameBudget);
    return result == kOk ? drawSmall(picture, canvas) : result;
}

/** The first one that is not dark, otherwise the brightest. */
int drawBrightScene(MediaFile& file, Canvas& brightest) {
    int result = kNotAvailable;
    for (const Attempt& attempt : attemptsFor(file)) {
        Canvas canvas;
        const int outcome = drawScene(file, attempt, canvas);
        if (outcome == kOk && (result != kOk || brightness(canvas) > brightness(brightest)))
            brightest = std::move(canvas);
        if (result != kOk)
            result = outcome;
        if (file.isPicture() || file.isExhausted() || brightness(brightest) >= kDark)
            break;
    }
    return result;
}

} // namespace

discoverer::Thumbnail drawThumbnail(probe::RegularFile file) {
    discoverer::Thumbnail thumbnail;
    std::unique_ptr<MediaFile> pFile;
    thumbnail.result = openMedia(std::move(file), kBounds, pFile);
    if (!pFile)
        return thumbnail;
    Canvas canvas;
    if (drawCover(*pFile, canvas) != kOk)
        thumbnail.result = drawBrightScene(*pFile, canvas);
    if (thumbnail.result != kOk)
        return thumbnail;
    const probe::Packet jpeg = encode(canvas, kSmallJpeg);
    if (jpeg)
        thumbnail.jpeg.assign(reinterpret_cast<const char*>(jpeg->data),
                              static_cast<std::size_t>(jpeg->size));
    else
        thumbnail.result = kInternal;
    return thumbnail;
}

} // namespace reader
