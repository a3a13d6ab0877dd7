// SPDX-License-Identifier: MIT
#pragma once

#include <optional>

#include "pack/ArgumentReader.h"
#include "qnsmedia/Types.h"

/** What the daemon's player sends, decoded; nothing when it ends early. */
namespace qnsmedia {

std::optional<PlayerStatus> readStatus(ArgumentReader& arguments);
std::optional<PlayerNotification> readNotification(ArgumentReader& arguments);

} // namespace qnsmedia
