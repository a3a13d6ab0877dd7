// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "LibMediaPlayer/IMediaDiscoverer.h"

namespace script {

/**
 * The answer to `metadata`: `return result "type" "tags" seekable live duration`, then for each
 * stream `video "type" "description"` with eleven numbers or `audio "type" "description"` with
 * five, in the order of the record.
 */
std::string metadataAnswer(int result, const LibMediaPlayer::MediaMetaInfo& info);

/** The record in such an answer; what is missing stays as it is in a new record. */
LibMediaPlayer::MediaMetaInfo metadataIn(const std::vector<std::wstring>& answer);

} // namespace script
