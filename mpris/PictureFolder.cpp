// SPDX-License-Identifier: MIT
#include "mpris/PictureFolder.h"

#include <cerrno>
#include <cstdlib>
#include <system_error>

namespace fs = std::filesystem;

namespace mpris {
namespace {

fs::path parentFolder() {
    const char* const runtime = std::getenv("XDG_RUNTIME_DIR");
    return runtime && *runtime ? fs::path(runtime) : fs::temp_directory_path();
}

} // namespace

PictureFolder::PictureFolder() {
    std::string path = fs::absolute(parentFolder() / "qnsmedia-mpris-XXXXXX");
    if (!::mkdtemp(path.data()))
        throw std::system_error(errno, std::generic_category(), path);
    mPath = path;
}

PictureFolder::~PictureFolder() {
    std::error_code ignored;
    fs::remove_all(mPath, ignored);
}

std::string PictureFolder::path(int track) const {
    return mPath / (std::to_string(track) + ".jpg");
}

void PictureFolder::remove(int track) const {
    std::error_code ignored;
    fs::remove(path(track), ignored);
}

} // namespace mpris
