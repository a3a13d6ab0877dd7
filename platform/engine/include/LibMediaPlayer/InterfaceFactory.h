// SPDX-License-Identifier: MIT
#pragma once

#include "LibMediaPlayer/Export.h"

/**
 * The media engine's entry points.
 *
 * This folder of headers is a contract: a device brings its own libmediaplayer_proxy.so.1 that
 * implements it, and the daemon runs with it unchanged. See docs/engine.md.
 */
namespace LibMediaPlayer {

class IMediaPlayer;
class IMediaDiscoverer;
class IMediaImporter;

/** Each call makes a new object, which the caller owns and deletes; null when it cannot. */
class LIBMEDIAPLAYER_API InterfaceFactory {
public:
    /** `window` is a native window handle or null; `flags` are PlayerFlag bits. */
    static IMediaPlayer* createPlayer(void* window, unsigned int flags);
    static IMediaDiscoverer* createDiscoverer();
    static IMediaImporter* createImporter();
};

} // namespace LibMediaPlayer
