// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>

namespace mpris {

/** Where the daemon writes the pictures of tracks, and this user's programs read them. */
class PictureFolder {
public:
    /**
     * A folder that is there, or, when it is empty, one for this object alone, which ends with
     * it: in $XDG_RUNTIME_DIR if there is one, else where temporary files are. Throws
     * std::system_error or std::filesystem::filesystem_error.
     */
    explicit PictureFolder(const std::string& folder);
    ~PictureFolder();
    PictureFolder(const PictureFolder&) = delete;
    PictureFolder& operator=(const PictureFolder&) = delete;

    /**
     * Of a track's picture, whether it is there or not. There are few names: in a folder of the
     * daemon's, pictures may have to stay that we may not remove.
     */
    [[nodiscard]] std::string path(int track) const;

    /** Removes it if it is there and we may. */
    void remove(int track) const;

private:
    const bool mIsOurs;
    std::filesystem::path mPath;
};

} // namespace mpris
