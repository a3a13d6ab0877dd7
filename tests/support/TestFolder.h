// SPDX-License-Identifier: MIT
#pragma once

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <string>
#include <string_view>

/** A folder of its own for a test's files, and what is in them. */
class TestFolder {
public:
    TestFolder() {
        std::string path = std::filesystem::temp_directory_path() / "qns-test-XXXXXX";
        if (!::mkdtemp(path.data()))
            throw std::runtime_error("cannot make " + path);
        mPath = path;
    }
    ~TestFolder() {
        std::error_code ignored;
        std::filesystem::remove_all(mPath, ignored);
    }
    TestFolder(const TestFolder&) = delete;
    TestFolder& operator=(const TestFolder&) = delete;

    [[nodiscard]] std::string path(std::string_view name) const { return mPath / name; }
    [[nodiscard]] std::wstring widePath(std::string_view name) const {
        return (mPath / name).wstring();
    }
    [[nodiscard]] bool has(std::string_view name) const {
        return std::filesystem::exists(mPath / name);
    }
    [[nodiscard]] std::string contents(std::string_view name) const {
        std::ifstream file(mPath / name, std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

private:
    std::filesystem::path mPath;
};
