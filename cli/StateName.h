// SPDX-License-Identifier: MIT
#pragma once

#include "qnsmedia/Types.h"

/** The state in one or two words. */
constexpr const char* stateName(qnsmedia::PlayerState state) {
    switch (state) {
    case qnsmedia::PlayerState::closed:
        return "closed";
    case qnsmedia::PlayerState::paused:
        return "paused";
    case qnsmedia::PlayerState::notReady:
        return "not ready";
    case qnsmedia::PlayerState::playing:
        return "playing";
    case qnsmedia::PlayerState::ended:
        return "ended";
    case qnsmedia::PlayerState::failed:
        return "failed";
    case qnsmedia::PlayerState::unknown:
        break;
    }
    return "unknown";
}
