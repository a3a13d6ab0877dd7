// SPDX-License-Identifier: MIT
#include "cli/HumanSize.h"

#include <array>
#include <cstdio>

std::string humanSize(std::int64_t bytes) {
    constexpr const char* kUnits[] = {"kB", "MB", "GB", "TB", "PB", "EB"};
    if (bytes < 1000)
        return std::to_string(bytes) + " B";
    auto value = static_cast<double>(bytes) / 1000;
    std::size_t unit = 0;
    for (; value >= 999.5; value /= 1000)
        ++unit;
    std::array<char, 32> text{};
    std::snprintf(text.data(), text.size(), value < 9.95 ? "%.1f %s" : "%.0f %s", value,
                  kUnits[unit]);
    return text.data();
}
