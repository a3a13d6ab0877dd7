// SPDX-License-Identifier: MIT
#include "cli/MediaPath.h"

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <string_view>

namespace {

bool isUri(std::string_view text) {
    const std::size_t end = text.find("://");
    if (end == std::string_view::npos || end == 0)
        return false;
    const std::string_view scheme = text.substr(0, end);
    return std::all_of(scheme.begin(), scheme.end(), [](unsigned char letter) {
        return std::isalnum(letter) || letter == '+' || letter == '-' || letter == '.';
    });
}

} // namespace

std::string mediaPath(const std::string& file) {
    if (file.empty() || isUri(file))
        return file;
    return std::filesystem::absolute(file).lexically_normal().string();
}
