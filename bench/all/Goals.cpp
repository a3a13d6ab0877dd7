// SPDX-License-Identifier: MIT
#include "bench/all/Goals.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <regex>

namespace bench {
namespace {

constexpr Goal kGoals[] = {
    {"rpc", "request to reply", "bare sockets, thread hop", 0.87},
    {"rpc", "request to reply", "D-Bus", 1.33},
    {"rpc", "request to reply, 2 ms between", "D-Bus", 1.67},
    {"rpc", "pipelined", "bare sockets, thread hop", 0.9},
    {"pack", ".*", "msgpack-c", 1},
    {"pack", "pack wide text.*", "msgpack-c + wcstombs", 1},
    {"pack", "pack notification.*", "msgpack-c + wcstombs", 5},
    {"start", "exec to first accepted connection", "empty QApplication", 1.0 / 3},
    {"start", "resident when idle", "MPD", 1},
    {"start", "processor when idle", "", 0},
    {"player", ".*, open to ready", "libmpv", 2},
    {"player", ".*, seek .*", "libmpv", 1},
    {"player", ".*, close", "libmpv", 1},
    {"player", "films, loop: error a round", "", 40},   // one picture
    {"player", "sound, loop: error a round", "", 26.2}, // the longest packet, that of MP3
    {"media", "metadata by the engine, repeated", "libavformat", 4},
    {"media", "metadata of a file", "ffprobe", 100},
    {"media", "metadata of a file", "mediainfo", 25},
    {"media", "picture of a key frame", "ffmpegthumbnailer", 15},
    {"media", "picture between key frames", "ffmpegthumbnailer", 3},
    {"import", "import of (\\w+|mp3 with covers)", "MPD", 3},
    {"import", "import of (\\w+|mp3 with covers)", "minidlna", 2},
    {"import", "import of mp3 with covers, with thumbnails", "MPD", 1},
    {"scale", "search, .*", "", 10},
};

/** Rows that differ in the file or the value only make one line together. */
struct Kind {
    const char* bench;
    const char* row;  ///< regular expression
    const char* line; ///< with $1 for the expression's first group
};

constexpr Kind kKinds[] = {
    {"player", "film\\.\\w+, (.*)", "films, $1"},
    {"player", "sound\\.\\w+, (.*)", "sound, $1"},
    {"pack", "pack (nil|bool|float|double|fix.*|u?int\\d+)", "pack nil, bool, fixed-width numbers"},
    {"pack", "pack smallest .*", "pack numbers in their smallest form"},
    {"pack", "pack (raw|narrow text) of (5|40)( bytes)?", "pack raw or narrow text, short"},
    {"pack", "pack (raw|narrow text) of \\d+( bytes)?", "pack raw or narrow text, long"},
    {"pack", "unpack raw .*", "unpack raw"},
    {"pack", "unpack (nil|bool|float|double|fix.*|u?int\\d+|smallest .*)", "unpack a number"},
};

} // namespace

std::vector<Goal> goalsOf(const std::string& bench, const std::string& line) {
    std::vector<Goal> goals;
    for (const Goal& goal : kGoals)
        if (bench == goal.bench && std::regex_match(line, std::regex(goal.line)))
            goals.push_back(goal);
    return goals;
}

std::optional<bool> isReached(const Goal& goal, const Row& row) {
    const std::string versus = goal.versus;
    if (versus.empty())
        return row.entries.front().figures.median <= goal.bound;
    const auto other = std::find_if(row.entries.begin(), row.entries.end(),
                                    [&](const Entry& entry) { return entry.who == versus; });
    if (other == row.entries.end())
        return std::nullopt;
    return ratio(row, *other) >= goal.bound;
}

std::string textOf(const Goal& goal, const std::string& unit) {
    char bound[32];
    std::snprintf(bound, sizeof bound, "%.3g ", goal.bound);
    const std::string versus = goal.versus;
    return bound + (versus.empty() ? unit : "x " + versus);
}

std::string lineOf(const std::string& bench, const std::string& row) {
    for (const Kind& kind : kKinds) {
        std::smatch match;
        if (bench == kind.bench && std::regex_match(row, match, std::regex(kind.row)))
            return match.format(kind.line);
    }
    return row;
}

std::string figureText(double figure) {
    char text[32];
    const double size = std::abs(figure);
    const int decimals = size >= 100 || figure == 0 ? 0 : size >= 10 ? 1 : size >= 0.1 ? 2 : 4;
    std::snprintf(text, sizeof text, "%.*f", decimals, figure);
    return text;
}

} // namespace bench
