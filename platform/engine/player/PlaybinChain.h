// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "player/Options.h"
#include "player/Pipeline.h"

namespace engine {

/** A pipeline that finds out by itself how to play `uri`. */
Pipeline::Parts buildPlaybinChain(const std::string& uri, const PlayerOptions& options);

} // namespace engine
