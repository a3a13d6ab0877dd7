// SPDX-License-Identifier: MIT
#pragma once

#include <set>
#include <string>
#include <sys/types.h>
#include <vector>

namespace importer {

/** File systems that have been synced as a whole. */
using SyncedDevices = std::set<dev_t>;

/**
 * Syncs every file system that several of these files lie on as a whole: that takes hardly longer
 * than syncing one of them.
 */
SyncedDevices syncShared(const std::vector<int>& files);

/** Makes the content of a file survive a power cut, if its device is not among `synced`. Throws
 *  Failure, also when the content could not be written then. */
void syncFile(int file, const std::string& path, const SyncedDevices& synced);

/** The same for the entry of a file that lies at `path`. */
void syncEntry(int file, const std::string& path, const SyncedDevices& synced);

} // namespace importer
