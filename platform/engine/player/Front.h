// SPDX-License-Identifier: MIT
#pragma once

#include "player/Outlet.h"
#include "player/StatusClock.h"

namespace engine {

/** What of a player its callers and its engine both use; it lives as long as either. */
struct Front {
    Outlet outlet;
    StatusClock status;
};

} // namespace engine
