// SPDX-License-Identifier: MIT
#include "cli/MediaTime.h"

#include <charconv>
#include <string_view>

namespace {

/** A thousand years: whatever is counted in nanoseconds stays in range. */
constexpr double kMostSeconds = 9e9;

/** Digits and at most one point; no sign, no exponent, no blanks. */
std::optional<double> parseNumber(std::string_view text) {
    double number = 0;
    const char* const end = text.data() + text.size();
    const auto parsed = std::from_chars(text.data(), end, number, std::chars_format::fixed);
    if (parsed.ec != std::errc() || parsed.ptr != end || text.front() == '-')
        return std::nullopt;
    return number;
}

/** Seconds, or minutes and seconds, or hours too; only the first may be 60 and above. */
std::optional<double> parseSeconds(std::string_view text) {
    double seconds = 0;
    for (int parts = 0; parts < 3; ++parts) {
        const std::size_t colon = text.find(':');
        const auto number = parseNumber(text.substr(0, colon));
        if (!number || (parts > 0 && *number >= 60))
            return std::nullopt;
        seconds = seconds * 60 + *number;
        if (colon == std::string_view::npos)
            return seconds <= kMostSeconds ? std::optional(seconds) : std::nullopt;
        text.remove_prefix(colon + 1);
    }
    return std::nullopt;
}

} // namespace

qnsmedia::Nanoseconds MediaTime::in(qnsmedia::Nanoseconds duration) const {
    if (!percentage)
        return time;
    return std::chrono::duration_cast<qnsmedia::Nanoseconds>(duration * (*percentage / 100));
}

std::optional<MediaTime> parseMediaTime(const std::string& text) {
    if (!text.empty() && text.back() == '%') {
        const auto number = parseNumber(std::string_view(text).substr(0, text.size() - 1));
        if (!number || *number > 100)
            return std::nullopt;
        return MediaTime{{}, number};
    }
    const auto seconds = parseSeconds(text);
    if (!seconds)
        return std::nullopt;
    return MediaTime{
        std::chrono::duration_cast<qnsmedia::Nanoseconds>(std::chrono::duration<double>(*seconds)),
        std::nullopt};
}
