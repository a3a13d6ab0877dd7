// SPDX-License-Identifier: MIT
#include "tests/engine/Mount.h"

#include <cerrno>
#include <string>
#include <sys/mount.h>
#include <system_error>
#include <utility>

namespace fs = std::filesystem;

namespace {

void mountOrThrow(const char* from, const fs::path& folder, const char* type, unsigned long flags,
                  const std::string& options = {}) {
    fs::create_directories(folder);
    if (::mount(from, folder.c_str(), type, flags, options.c_str()) != 0)
        throw std::system_error(errno, std::generic_category(), "mount " + folder.string());
}

} // namespace

Mount Mount::memory(const fs::path& folder, std::size_t size) {
    mountOrThrow("none", folder, "tmpfs", 0, "size=" + std::to_string(size));
    return Mount(folder);
}

Mount Mount::readOnly(const fs::path& folder) {
    mountOrThrow(folder.c_str(), folder, nullptr, MS_BIND);
    Mount mount(folder);
    mountOrThrow(nullptr, folder, nullptr, MS_BIND | MS_REMOUNT | MS_RDONLY);
    return mount;
}

Mount::Mount(fs::path folder) : mFolder(std::move(folder)) {}

Mount::Mount(Mount&& other) noexcept : mFolder(std::exchange(other.mFolder, {})) {}

Mount::~Mount() {
    if (!mFolder.empty())
        ::umount2(mFolder.c_str(), MNT_DETACH);
}
