// SPDX-License-Identifier: MIT
#pragma once

#include "LibMediaPlayer/IMediaDiscoverer.h"

namespace fuzz {

/**
 * What holds for the engine's answer whatever the file: the texts are clean and bounded, the counts
 * no larger than the room, and the discoverer makes of it an answer that fits into a packet and
 * that a client can read. For one thread.
 */
void requireSound(const LibMediaPlayer::MediaMetaInfo& info);

/** One tag a line, KEY=value, as many and as long as an answer can hold. */
void requireTags(const std::wstring& tags);

} // namespace fuzz
