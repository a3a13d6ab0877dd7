// SPDX-License-Identifier: MIT
#include <cstdlib>
#include <cstring>
#include <dlfcn.h>
#include <filesystem>
#include <string>

#include "qnsys.h"

namespace {

int copyPath(const std::string& path, char* buffer, int capacity) {
    if (path.empty() || buffer == nullptr || capacity <= 0 ||
        path.size() >= static_cast<std::size_t>(capacity))
        return 0;
    std::memcpy(buffer, path.c_str(), path.size() + 1);
    return static_cast<int>(path.size());
}

std::string environmentOr(const char* variable, const std::string& otherwise) {
    const char* value = std::getenv(variable);
    return value != nullptr && *value != '\0' ? value : otherwise;
}

/**
 * The folder above this library that has the shared pictures: an installation or a build tree
 * can be moved as a whole.
 */
std::string findPrefix() {
    namespace fs = std::filesystem;
    // Not an exported symbol: another library might have taken its place.
    static const char kHere = 0;
    Dl_info info{};
    if (dladdr(&kHere, &info) == 0 || info.dli_fname == nullptr)
        return QNS_INSTALL_PREFIX;
    std::error_code error;
    const fs::path library = fs::canonical(info.dli_fname, error);
    for (fs::path folder = library.parent_path(); folder.has_relative_path();
         folder = folder.parent_path()) {
        if (fs::is_directory(folder / "share/mediaplayer", error))
            return folder.string();
    }
    return QNS_INSTALL_PREFIX;
}

} // namespace

int qnsys_getenv_hv_prefix(char* buffer, int capacity) {
    static const std::string kPrefix = findPrefix();
    return copyPath(environmentOr("QNS_HV_PREFIX", kPrefix), buffer, capacity);
}

int qnsys_getenv_hv_data(char* buffer, int capacity) {
    return copyPath(environmentOr("QNS_HV_DATA", "/var/lib/qnsmedia"), buffer, capacity);
}
