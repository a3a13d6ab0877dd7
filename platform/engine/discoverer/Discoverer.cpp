// SPDX-License-Identifier: MIT
#include "discoverer/Discoverer.h"

#include <algorithm>
#include <sys/mman.h>

#include "LibMediaPlayer/Result.h"
#include "base/UniqueFd.h"
#include "discoverer/DescribedFile.h"
#include "discoverer/Extensions.h"
#include "discoverer/ImageFile.h"
#include "handle/Barrier.h"
#include "player/Medium.h"
#include "text/Text.h"
#include "worker/Media.h"

namespace discoverer {

using namespace LibMediaPlayer;

namespace {

/** A file in memory; a worker writes what it draws there. */
qns::UniqueFd makeSheet() {
    return qns::UniqueFd(::memfd_create("qnsmedia-image", MFD_CLOEXEC));
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
    const int result = describeFile(medium.path, mpDetails);
    if (result == kOk)
        mPath = medium.path;
    return result;
}

int Discoverer::close() {
    mFailure = kWrongState;
    mPath.clear();
    mpDetails.reset();
    return kOk;
}

int Discoverer::metadata(MediaMetaInfo& info) {
    return handle::guarded(static_cast<int>(kInternal), [&] {
        if (!mpDetails)
            return mFailure;
        info = mpDetails->info;
        return static_cast<int>(kOk);
    });
}

int Discoverer::reserved5() {
    return kWrongState;
}

int Discoverer::makeImage(int64_t position, int32_t width, int32_t height,
                          const std::wstring& path) {
    return handle::guarded(static_cast<int>(kInternal), [&] {
        if (mPath.empty())
            return static_cast<int>(kWrongState);
        const std::string target = engine::toBytes(path);
        const qns::UniqueFd sheet = makeSheet();
        if (!sheet)
            return static_cast<int>(kNotAvailable);
        const worker::Drawing drawing{std::max<int64_t>(position, 0), width, height,
                                      formOf(target)};
        const int result = worker::draw(mPath, drawing, sheet.get());
        return result == kOk ? writeWhole(target, sheet.get()) : result;
    });
}

int Discoverer::reserved7() {
    return kWrongState;
}

int Discoverer::supportedExtensions(SupportedExtensions& extensions) {
    return handle::guarded(static_cast<int>(kInternal),
                           [&] { return discoverer::findExtensions(extensions); });
}

} // namespace discoverer
