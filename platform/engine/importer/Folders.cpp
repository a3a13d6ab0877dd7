// SPDX-License-Identifier: MIT
#include "importer/Folders.h"

#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "base/UniqueFd.h"
#include "importer/Failure.h"

namespace importer {

namespace {

constexpr char kMaking[] = "The folder cannot be made";

} // namespace

std::string folderOf(const std::string& path) {
    const std::size_t slash = path.rfind('/');
    return slash == 0 ? "/" : path.substr(0, slash);
}

void makeFolders(const std::string& path) {
    struct stat status {};
    if (path.empty() || (::stat(path.c_str(), &status) == 0 && S_ISDIR(status.st_mode)))
        return;
    const std::string parent = folderOf(path);
    if (parent != path)
        makeFolders(parent);
    if (::mkdir(path.c_str(), 0777) != 0 && errno != EEXIST)
        throw systemFailure(kMaking, path);
    const qns::UniqueFd folder(::open(parent.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (!folder)
        throw systemFailure(kMaking, path);
    syncFolder(folder.get(), parent);
}

void syncFolder(int folder, const std::string& path) {
    if (::fsync(folder) != 0)
        throw systemFailure("The folder cannot be synced", path);
}

} // namespace importer
