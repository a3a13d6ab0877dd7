// SPDX-License-Identifier: MIT
#include "mpris/PictureFolder.h"

#include <cerrno>
#include <cstdlib>
#include <system_error>

namespace fs = std::filesystem;

namespace mpris {
namespace {

/** Desktops keep pictures by their names, but not for long. */
constexpr int kNames = 100;

fs::path parentFolder() {
    const char* const runtime = std::getenv("XDG_RUNTIME_DIR");
    return runtime && *runtime ? fs::path(runtime) : fs::temp_directory_path();
}

fs::path makeFolder() {
    std::string path = fs::absolute(parentFolder() / "qnsmedia-mpris-XXXXXX");
    if (!::mkdtemp(path.data()))
        throw std::system_error(errno, std::generic_category(), path);
    return path;
}

} // namespace

PictureFolder::PictureFolder(const std::string& folder)
    : mIsOurs(folder.empty()), mPath(mIsOurs ? makeFolder() : fs::absolute(folder)) {}

PictureFolder::~PictureFolder() {
    std::error_code ignored;
    if (mIsOurs)
        fs::remove_all(mPath, ignored);
}

std::string PictureFolder::path(int track) const {
    return mPath / ("qnsmedia-mpris-" + std::to_string(track % kNames) + ".jpg");
}

void PictureFolder::remove(int track) const {
    std::error_code ignored;
    fs::remove(path(track), ignored);
}

} // namespace mpris
