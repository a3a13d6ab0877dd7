// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <set>

#include "discoverer/DiscovererIds.h"
#include "tests/support/DiscovererMock.h"

/** What the engine's factory has given, by the order of the calls, and does not give at all. */
struct EngineFactory {
    std::array<testing::NiceMock<DiscovererMock>*, kDiscovererCount> given{}; ///< owned elsewhere
    std::size_t calls = 0;
    std::set<std::size_t> refused;
};
EngineFactory& engineFactory();
