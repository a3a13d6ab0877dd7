// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "pack/ArgumentReader.h"
#include "qnsmedia/DiscovererTypes.h"

/** What the daemon's discoverer sends, decoded; nothing when it ends early. */
namespace qnsmedia {

/** What became of a request: 0, or the engine's code. */
struct Outcome {
    int result = 0;
};

std::optional<Outcome> readImageOutcome(ArgumentReader& arguments);
std::optional<std::vector<std::string>> readExtensions(ArgumentReader& arguments);

struct MetadataAnswer {
    Outcome outcome;
    Metadata metadata;
};
std::optional<MetadataAnswer> readMetadata(ArgumentReader& arguments);

} // namespace qnsmedia
