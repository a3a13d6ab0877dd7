// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <sdbus-c++/Types.h>
#include <string>

#include "mpris/Track.h"

namespace mpris {

using MetadataMap = std::map<std::string, sdbus::Variant>;

/** The bus's name of a track. */
std::string trackId(int number);

/** What the bus calls metadata; empty without a track. Without a title it is the file's name. */
MetadataMap metadataOf(const Track& track);

} // namespace mpris
