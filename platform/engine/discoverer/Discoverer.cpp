// SPDX-License-Identifier: MIT
#include "discoverer/Discoverer.h"

#include <algorithm>
#include <chrono>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "discoverer/Canvas.h"
#include "discoverer/Extensions.h"
#include "discoverer/FrameFinder.h"
#include "discoverer/ImageFile.h"
#include "discoverer/Layout.h"
#include "discoverer/OpenMedia.h"
#include "handle/Barrier.h"
#include "player/Medium.h"
#include "text/Text.h"

namespace discoverer {

using namespace LibMediaPlayer;
using probe::MediaFile;

namespace {

/** Decoding takes longer than looking; still an answer comes within five seconds. */
constexpr MediaFile::Bounds kImageBounds{256 * 1024 * 1024, std::chrono::milliseconds(3500)};

int drawImage(MediaFile& file, std::chrono::nanoseconds position, Size asked,
              const std::string& path) {
    Picture picture;
    if (const int result = findPicture(file, position, picture); result != kOk)
        return result;
    const AVFrame& frame = *picture.frame.get();
    const Size natural =
        naturalSize({frame.width, frame.height}, picture.pixelAspect, picture.rotation);
    const auto layout = layOut(natural, asked.width, asked.height);
    if (!layout)
        return kWrongState;
    Canvas canvas;
    if (const int result = draw(picture, *layout, canvas); result != kOk)
        return result;
    return writeImage(canvas, path);
}

} // namespace

int Discoverer::open(const std::wstring& path) {
    close();
    mFailure = handle::guarded(static_cast<int>(kInternal), [&] { return openMedium(path); });
    return mFailure;
}

int Discoverer::openMedium(const std::wstring& path) {
    const engine::Medium medium = engine::toMedium(path);
    if (medium.path.empty())
        return medium.uri.empty() ? kNotFound : kNotAvailable;
    const int result = mFile.open(medium.path);
    if (result == kOk)
        mPath = medium.path;
    return result;
}

int Discoverer::close() {
    mFailure = kWrongState;
    mPath.clear();
    mFile.close();
    return kOk;
}

int Discoverer::metadata(MediaMetaInfo& info) {
    return handle::guarded(static_cast<int>(kInternal), [&] {
        const auto details = mFile.describe();
        if (!details)
            return mFailure;
        info = details->info;
        return static_cast<int>(kOk);
    });
}

int Discoverer::reserved5() {
    return kWrongState;
}

int Discoverer::makeImage(int64_t position, int32_t width, int32_t height,
                          const std::wstring& path) {
    return handle::guarded(static_cast<int>(kInternal), [&] {
        // Before anything is read: such sizes are refused whatever the file.
        if (mPath.empty() || !layOut({1, 1}, width, height))
            return static_cast<int>(kWrongState);
        std::unique_ptr<MediaFile> pFile;
        if (const int result = openMedia(mPath, kImageBounds, pFile); result != kOk)
            return result;
        const std::chrono::nanoseconds from(std::max<int64_t>(position, 0));
        return drawImage(*pFile, from, {width, height}, engine::toBytes(path));
    });
}

int Discoverer::reserved7() {
    return kWrongState;
}

int Discoverer::supportedExtensions(SupportedExtensions& extensions) {
    return handle::guarded(static_cast<int>(kInternal), [&] {
        extensions = discoverer::supportedExtensions();
        return static_cast<int>(kOk);
    });
}

} // namespace discoverer
