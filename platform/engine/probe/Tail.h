// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

#include "probe/FileInput.h"

namespace probe {

/** Puts the reader of a file of packets, such as a transport stream, so many bytes before its end.
 */
bool seekToTail(AVFormatContext& context, FileInput& input, std::int64_t reach);

/** Puts the reader of a Matroska file without an index to a cluster that lies so near its end. */
bool seekToCluster(AVFormatContext& context, FileInput& input, std::int64_t reach);

} // namespace probe
