// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace importer {

/** Makes the folder, and those above it, so that they survive a power cut. Throws Failure. */
void makeFolders(const std::string& path);

/** Makes what has been done to the entries of the folder survive a power cut. Throws Failure. */
void syncFolder(int folder, const std::string& path);

} // namespace importer
