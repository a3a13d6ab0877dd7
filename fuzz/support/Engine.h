// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include "LibMediaPlayer/IMediaDiscoverer.h"
#include "LibMediaPlayer/IMediaImporter.h"
#include "LibMediaPlayer/IMediaPlayer.h"

namespace fuzz {

/**
 * The engine that is linked into a fuzz target: it does nothing, answers what it is told to, and
 * checks what it is asked. For the main thread, as the services use an engine.
 */
struct Engine {
    int result = 0; ///< of every operation
    long position = 0;
    long duration = 0;
    LibMediaPlayer::MediaMetaInfo info;
    LibMediaPlayer::SupportedExtensions extensions;

    /** Null while there is no player, or no importer. */
    std::function<void(LibMediaPlayer::MediaPlayerNotify&)> notifyPlayer;
    std::function<void(LibMediaPlayer::MediaImporterNotify&)> notifyImporter;
};

Engine& engine();

} // namespace fuzz
