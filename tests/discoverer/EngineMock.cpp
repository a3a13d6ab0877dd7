// SPDX-License-Identifier: MIT
#include "tests/discoverer/EngineMock.h"

#include "LibMediaPlayer/InterfaceFactory.h"

EngineFactory& engineFactory() {
    static EngineFactory factory;
    return factory;
}

LibMediaPlayer::IMediaDiscoverer* LibMediaPlayer::InterfaceFactory::createDiscoverer() {
    EngineFactory& factory = engineFactory();
    const std::size_t call = factory.calls++;
    if (factory.refused.count(call) != 0)
        return nullptr;
    return factory.given.at(call) = new testing::NiceMock<DiscovererMock>;
}
