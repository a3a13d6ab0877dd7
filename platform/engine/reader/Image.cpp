// SPDX-License-Identifier: MIT
#include "reader/Image.h"

#include <cerrno>
#include <memory>
#include <unistd.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "reader/Canvas.h"
#include "reader/FrameFinder.h"
#include "reader/ImageEncoder.h"
#include "reader/OpenMedia.h"

namespace reader {

using namespace LibMediaPlayer;
using discoverer::ImageForm;
using probe::MediaFile;

namespace {

/** Decoding takes longer than looking; still an answer comes within five seconds. */
constexpr MediaFile::Bounds kBounds{256 * 1024 * 1024, std::chrono::milliseconds(3500)};

int drawPicture(MediaFile& file, std::chrono::nanoseconds position, Size asked, Canvas& canvas) {
    Picture picture;
    if (const int result = findPicture(file, position, picture); result != kOk)
        return result;
    const AVFrame& frame = *picture.frame.get();
    const Size natural =
        naturalSize({frame.width, frame.height}, picture.pixelAspect, picture.rotation);
    const auto layout = layOut(natural, asked.width, asked.height);
    return layout ? draw(picture, *layout, canvas) : static_cast<int>(kWrongState);
}

int writeAll(int output, const void* data, std::size_t size) {
    const auto* bytes = static_cast<const char*>(data);
    while (size > 0) {
        const ssize_t count = ::write(output, bytes, size);
        if (count < 0 && errno == EINTR)
            continue;
        if (count <= 0)
            return kNoSpace;
        size -= static_cast<std::size_t>(count);
        bytes += count;
    }
    return kOk;
}

int writeImage(const Canvas& canvas, ImageForm form, int output) {
    if (form == ImageForm::kPixels)
        return writeAll(output, canvas.pixels.data(), canvas.pixels.size() * sizeof(std::uint32_t));
    const probe::Packet packet = encode(canvas, form == ImageForm::kPng ? kPng : kJpeg);
    return packet ? writeAll(output, packet->data, static_cast<std::size_t>(packet->size))
                  : static_cast<int>(kInternal);
}

} // namespace

int drawImage(probe::RegularFile file, std::chrono::nanoseconds position, Size size, ImageForm form,
              int output) {
    if (!layOut({1, 1}, size.width, size.height))
        return kWrongState;
    std::unique_ptr<MediaFile> pMedia;
    if (const int result = openMedia(std::move(file), kBounds, pMedia); result != kOk)
        return result;
    Canvas canvas;
    const int result = drawPicture(*pMedia, position, size, canvas);
    return result == kOk ? writeImage(canvas, form, output) : result;
}

} // namespace reader
