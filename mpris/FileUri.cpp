// SPDX-License-Identifier: MIT
#include "mpris/FileUri.h"

#include <algorithm>
#include <charconv>

namespace mpris {
namespace {

constexpr std::string_view kScheme = "file:";

bool isLetterOrDigit(char character) {
    return (character >= 'a' && character <= 'z') || (character >= 'A' && character <= 'Z') ||
           (character >= '0' && character <= '9');
}

char lower(char character) {
    return character >= 'A' && character <= 'Z' ? static_cast<char>(character - 'A' + 'a')
                                                : character;
}

/** Nothing when a percent sign is not followed by the number of a character. */
std::optional<std::string> decoded(std::string_view text) {
    std::string result;
    for (std::size_t at = 0; at < text.size(); ++at) {
        if (text[at] != '%') {
            result += text[at];
            continue;
        }
        unsigned char byte = 0;
        const char* const digits = text.data() + at + 1;
        const auto length = std::min<std::size_t>(2, text.size() - at - 1);
        const auto read = std::from_chars(digits, digits + length, byte, 16);
        if (read.ptr != digits + 2 || byte == 0)
            return std::nullopt;
        result += static_cast<char>(byte);
        at += 2;
    }
    return result;
}

/** What follows "//" and a host, which is this one. */
std::optional<std::string_view> withoutHost(std::string_view text) {
    if (text.substr(0, 2) != "//")
        return text;
    text.remove_prefix(2);
    const std::size_t slash = text.find('/');
    const std::string_view host = text.substr(0, slash);
    if (slash == std::string_view::npos || (!host.empty() && host != "localhost"))
        return std::nullopt;
    return text.substr(slash);
}

} // namespace

std::string fileUri(std::string_view path) {
    constexpr std::string_view kPlain = "/-._~";
    constexpr char kDigits[] = "0123456789ABCDEF";
    std::string uri = "file://";
    for (const char character : path) {
        if (isLetterOrDigit(character) || kPlain.find(character) != std::string_view::npos) {
            uri += character;
            continue;
        }
        const auto byte = static_cast<unsigned char>(character);
        uri += {'%', kDigits[byte / 16], kDigits[byte % 16]};
    }
    return uri;
}

bool isFileUri(std::string_view text) {
    return text.size() >= kScheme.size() &&
           std::equal(kScheme.begin(), kScheme.end(), text.begin(),
                      [](char expected, char given) { return lower(given) == expected; });
}

std::optional<std::string> filePath(std::string_view uri) {
    if (!isFileUri(uri))
        return std::nullopt;
    const auto path = withoutHost(uri.substr(kScheme.size()));
    if (!path || path->substr(0, 1) != "/")
        return std::nullopt;
    return decoded(*path);
}

bool isUri(std::string_view text) {
    const std::size_t end = text.find("://");
    if (end == std::string_view::npos || end == 0)
        return false;
    return std::all_of(text.begin(), text.begin() + static_cast<std::ptrdiff_t>(end), [](char c) {
        return isLetterOrDigit(c) || c == '+' || c == '-' || c == '.';
    });
}

} // namespace mpris
