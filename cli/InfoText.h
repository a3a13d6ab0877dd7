// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <nlohmann/json.hpp>

#include "qnsmedia/DiscovererTypes.h"

/** A table of what a file is, a line a fact, each ended. */
std::string infoText(const qnsmedia::Metadata& metadata);

/** The same for programs; times in nanoseconds. */
nlohmann::ordered_json infoJson(const qnsmedia::Metadata& metadata);
