// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>

/**
 * Something mounted on a folder until the object goes; for tests that run isolated. Throws when
 * it cannot be mounted.
 */
class Mount {
public:
    /** A file system in memory with room for so many bytes. */
    static Mount memory(const std::filesystem::path& folder, std::size_t size);
    /** The folder itself, for reading only. */
    static Mount readOnly(const std::filesystem::path& folder);

    Mount(Mount&& other) noexcept;
    Mount& operator=(Mount&&) = delete;
    ~Mount();

private:
    explicit Mount(std::filesystem::path folder);

    std::filesystem::path mFolder;
};
