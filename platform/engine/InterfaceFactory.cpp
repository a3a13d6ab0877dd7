// SPDX-License-Identifier: MIT
#include "LibMediaPlayer/InterfaceFactory.h"

#include <memory>

#include "gst/Barrier.h"
#include "player/Player.h"

namespace LibMediaPlayer {

IMediaPlayer* InterfaceFactory::createPlayer(void* window, unsigned int flags) {
    return gst::guarded<IMediaPlayer*>(
        nullptr, [&] { return std::make_unique<engine::Player>(window, flags).release(); });
}

} // namespace LibMediaPlayer
