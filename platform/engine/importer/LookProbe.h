// SPDX-License-Identifier: MIT
#pragma once

#include "importer/Probe.h"

namespace importer {

/** The details that a short look at a file tells; a discoverer may have had it lately. */
Probed probeByLook(const std::string& path);

} // namespace importer
