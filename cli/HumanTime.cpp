// SPDX-License-Identifier: MIT
#include "cli/HumanTime.h"

#include <array>
#include <cstdio>

std::string humanTime(qnsmedia::Nanoseconds time) {
    const bool negative = time.count() < 0;
    const long tenths = (negative ? -time : time).count() / 100'000'000;
    const long seconds = tenths / 10;
    std::array<char, 64> text{};
    const char* sign = negative ? "-" : "";
    if (seconds >= 3600)
        std::snprintf(text.data(), text.size(), "%s%ld:%02ld:%02ld.%ld", sign, seconds / 3600,
                      seconds / 60 % 60, seconds % 60, tenths % 10);
    else
        std::snprintf(text.data(), text.size(), "%s%ld:%02ld.%ld", sign, seconds / 60, seconds % 60,
                      tenths % 10);
    return text.data();
}
