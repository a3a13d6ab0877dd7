// SPDX-License-Identifier: MIT
#include "LibMediaPlayer/InterfaceFactory.h"

#include <memory>

#include "handle/Barrier.h"
#include "player/Player.h"

namespace LibMediaPlayer {

IMediaPlayer* InterfaceFactory::createPlayer(void* window, unsigned int flags) {
    return handle::guarded<IMediaPlayer*>(
        nullptr, [&] { return std::make_unique<engine::Player>(window, flags).release(); });
}

// This engine plays only, and says so: null.
IMediaDiscoverer* InterfaceFactory::createDiscoverer() {
    return nullptr;
}

IMediaImporter* InterfaceFactory::createImporter() {
    return nullptr;
}

} // namespace LibMediaPlayer
