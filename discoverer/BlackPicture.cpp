// SPDX-License-Identifier: MIT
#include "discoverer/BlackPicture.h"

#include <algorithm>
#include <cstddef>
#include <memory>
#include <new>

#include "discoverer/ClientFile.h"

namespace {

constexpr uint32_t kOpaqueBlack = 0xFF000000;

} // namespace

bool qns::writeBlackPicture(const std::wstring& path, int32_t width, int32_t height) {
    const int64_t pixels = static_cast<int64_t>(width) * height;
    if (width < 0 || height < 0 || pixels > kMaxBlackPixels)
        return false;
    const auto count = static_cast<std::size_t>(pixels);
    const std::unique_ptr<uint32_t[]> picture(new (std::nothrow) uint32_t[count]);
    if (!picture)
        return false;
    std::fill_n(picture.get(), count, kOpaqueBlack);
    writeClientFile(path, picture.get(), count * sizeof(uint32_t));
    return true;
}
