// SPDX-License-Identifier: MIT
#pragma once

#include <nlohmann/json.hpp>
#include <string>

#include "cli/LibraryReader.h"

/** One line for people: id, duration, and what it is. */
std::string libraryLine(const LibraryRow& row);

/** All of it for people. */
std::string libraryText(const LibraryRow& row, const qnsmedia::Metadata& metadata);

/** Sizes in bytes, times as seconds since 1970, durations in nanoseconds. */
nlohmann::ordered_json libraryJson(const LibraryRow& row);
