// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>

#include "player/ChainTable.h"
#include "player/Options.h"
#include "player/Pipeline.h"

namespace engine {

/**
 * A pipeline of exactly the planned elements. Nothing when one is not installed. A medium that
 * turns out not to be what the plan is for ends in an error of the pipeline.
 */
std::optional<Pipeline::Parts> buildFixedChain(const std::string& path, const ChainPlan& plan,
                                               const PlayerOptions& options);

} // namespace engine
