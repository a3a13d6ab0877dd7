// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>

namespace mpris {

/**
 * A folder for the pictures of tracks, where this user's programs and the daemon can get at it:
 * in $XDG_RUNTIME_DIR if there is one, else where temporary files are. Gone with this object.
 */
class PictureFolder {
public:
    /** Throws std::system_error or std::filesystem::filesystem_error. */
    PictureFolder();
    ~PictureFolder();
    PictureFolder(const PictureFolder&) = delete;
    PictureFolder& operator=(const PictureFolder&) = delete;

    /** Of a track's picture, whether it is there or not. */
    [[nodiscard]] std::string path(int track) const;

    /** Removes it if it is there. */
    void remove(int track) const;

private:
    std::filesystem::path mPath;
};

} // namespace mpris
