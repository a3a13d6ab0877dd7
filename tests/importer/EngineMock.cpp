// SPDX-License-Identifier: MIT
#include "tests/importer/EngineMock.h"

#include <utility>

#include "LibMediaPlayer/InterfaceFactory.h"

EngineFactory& engineFactory() {
    static EngineFactory factory;
    return factory;
}

namespace LibMediaPlayer {

IMediaImporter* InterfaceFactory::createImporter() {
    return std::exchange(engineFactory().importer, nullptr);
}

IMediaDiscoverer* InterfaceFactory::createDiscoverer() {
    return std::exchange(engineFactory().discoverer, nullptr);
}

} // namespace LibMediaPlayer
