// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <functional>
#include <string>

namespace importer {

/** Told how many bytes have been copied, at least every half megabyte; ends a copy by throwing. */
using CopyProgress = std::function<void(std::int64_t bytes)>;

/**
 * Fills the empty file `to` with all `size` bytes of `from`, in the cheapest way that the file
 * systems offer: sharing the blocks, copying within the kernel, reading and writing. Room is
 * reserved first, so that a full disk is told at once. What was written is handed to the disk as
 * the copy goes, so that syncing it afterwards is short. Throws Failure with `path` in its text.
 */
void copyFile(int from, int to, std::int64_t size, const std::string& path,
              const CopyProgress& progress);

} // namespace importer
