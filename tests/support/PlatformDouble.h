// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

/** The platform library's place in the services' tests: keeps the system log's lines. */
namespace platform_double {

constexpr char kPrefix[] = "/opt/caf\xC3\xA9";

struct LogLine {
    int level;
    std::string text;

    bool operator==(const LogLine& other) const {
        return level == other.level && text == other.text;
    }
};

/** The lines logged since the last call. Any thread may log and call it. */
std::vector<LogLine> takeLog();

} // namespace platform_double
