// SPDX-License-Identifier: MIT
#include "importer/Syncs.h"

#include <fcntl.h>
#include <map>
#include <sys/stat.h>
#include <unistd.h>

#include "base/UniqueFd.h"
#include "importer/Failure.h"
#include "importer/Folders.h"

namespace importer {

namespace {

constexpr std::size_t kSeveral = 3;

dev_t deviceOf(int file) {
    struct stat status {};
    return ::fstat(file, &status) == 0 ? status.st_dev : 0;
}

} // namespace

SyncedDevices syncShared(const std::vector<int>& files) {
    std::map<dev_t, std::vector<int>> filesOf;
    for (const int file : files)
        filesOf[deviceOf(file)].push_back(file);
    SyncedDevices synced;
    for (const auto& [device, onDevice] : filesOf) {
        if (onDevice.size() >= kSeveral && ::syncfs(onDevice.front()) == 0)
            synced.insert(device);
    }
    return synced;
}

void syncFile(int file, const std::string& path, const SyncedDevices& synced) {
    // Older systems do not tell what a sync as a whole failed to write; waiting for nothing does.
    const bool isSynced = synced.count(deviceOf(file)) != 0;
    if ((isSynced ? ::sync_file_range(file, 0, 0, SYNC_FILE_RANGE_WAIT_BEFORE) : ::fsync(file)) !=
        0)
        throw systemFailure("The file cannot be synced", path);
}

void syncEntry(int file, const std::string& path, const SyncedDevices& synced) {
    if (synced.count(deviceOf(file)) != 0)
        return;
    const std::string folder = folderOf(path);
    const qns::UniqueFd open(::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (!open)
        throw systemFailure("The folder cannot be synced", folder);
    syncFolder(open.get(), folder);
}

} // namespace importer
