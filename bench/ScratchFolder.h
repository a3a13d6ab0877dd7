// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>
#include <system_error>
#include <unistd.h>

namespace bench {

/** An empty folder among the temporary files, which goes with this object. One at a time. */
class ScratchFolder {
public:
    ScratchFolder()
        : mPath(std::filesystem::temp_directory_path() /
                ("qnsmedia-bench-" + std::to_string(::getpid()))) {
        std::filesystem::create_directories(mPath);
    }
    ~ScratchFolder() {
        std::error_code isLeft;
        std::filesystem::remove_all(mPath, isLeft);
    }
    ScratchFolder(const ScratchFolder&) = delete;
    ScratchFolder& operator=(const ScratchFolder&) = delete;

    [[nodiscard]] const std::filesystem::path& path() const { return mPath; }

private:
    const std::filesystem::path mPath;
};

} // namespace bench
