// SPDX-License-Identifier: MIT
#include "tests/player/EngineMock.h"

#include <utility>

#include "LibMediaPlayer/InterfaceFactory.h"

EngineFactory& engineFactory() {
    static EngineFactory factory;
    return factory;
}

namespace LibMediaPlayer {

IMediaPlayer* InterfaceFactory::createPlayer(void* window, unsigned int flags) {
    engineFactory().window = window;
    engineFactory().flags = flags;
    return std::exchange(engineFactory().next, nullptr);
}

} // namespace LibMediaPlayer
