// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>

namespace qns {

/** The most pixels of a black picture: those of 8192 x 4096, 128 MiB of memory. */
constexpr int64_t kMaxBlackPixels = 1L << 25;

/**
 * Writes an opaque black picture, as 32-bit pixels 0xAARRGGBB without a header; without pixels
 * when a dimension is 0. Returns false, before any memory is taken and without touching the
 * file, for a negative dimension and for more than kMaxBlackPixels, and when memory is out.
 */
bool writeBlackPicture(const std::wstring& path, int32_t width, int32_t height);

} // namespace qns
