// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace importer {

/** The folder that an absolute path lies in. */
std::string folderOf(const std::string& path);

/** Makes the folder, and those above it, so that they survive a power cut. Throws Failure. */
void makeFolders(const std::string& path);

/** Makes what has been done to the entries of the folder survive a power cut. Throws Failure. */
void syncFolder(int folder, const std::string& path);

} // namespace importer
