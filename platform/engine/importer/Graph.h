// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "importer/JobQueue.h"

namespace importer {

/** Writes how imports flow, and how many wait, in Graphviz's dot format. Returns a Result. */
int writeGraph(const std::string& path, const JobQueue& queue);

} // namespace importer
