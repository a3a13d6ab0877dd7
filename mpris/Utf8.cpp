// SPDX-License-Identifier: MIT
#include "mpris/Utf8.h"

#include <algorithm>

namespace mpris {
namespace {

constexpr std::string_view kReplacement = "\xEF\xBF\xBD";

/** First bytes of characters, the range of the second byte, and the length in bytes. */
struct Form {
    unsigned char first;
    unsigned char last;
    unsigned char secondFirst;
    unsigned char secondLast;
    std::size_t length;
};

constexpr Form kForms[] = {
    {0x01, 0x7F, 0, 0, 1},       {0xC2, 0xDF, 0x80, 0xBF, 2}, {0xE0, 0xE0, 0xA0, 0xBF, 3},
    {0xE1, 0xEC, 0x80, 0xBF, 3}, {0xED, 0xED, 0x80, 0x9F, 3}, {0xEE, 0xEF, 0x80, 0xBF, 3},
    {0xF0, 0xF0, 0x90, 0xBF, 4}, {0xF1, 0xF3, 0x80, 0xBF, 4}, {0xF4, 0xF4, 0x80, 0x8F, 4},
};

bool isBetween(char byte, unsigned char first, unsigned char last) {
    const auto value = static_cast<unsigned char>(byte);
    return value >= first && value <= last;
}

bool hasForm(std::string_view text, const Form& form) {
    if (text.size() < form.length || !isBetween(text[0], form.first, form.last))
        return false;
    if (form.length > 1 && !isBetween(text[1], form.secondFirst, form.secondLast))
        return false;
    return std::all_of(text.begin() + 1, text.begin() + static_cast<std::ptrdiff_t>(form.length),
                       [](char byte) { return isBetween(byte, 0x80, 0xBF); });
}

/** Of the character that the text begins with; 0 when it begins with none. */
std::size_t lengthOfFirst(std::string_view text) {
    for (const Form& form : kForms)
        if (hasForm(text, form))
            return form.length;
    return 0;
}

} // namespace

std::string toUtf8(std::string_view text) {
    std::string result;
    while (!text.empty()) {
        const std::size_t length = lengthOfFirst(text);
        result += length > 0 ? text.substr(0, length) : kReplacement;
        text.remove_prefix(std::max<std::size_t>(length, 1));
    }
    return result;
}

} // namespace mpris
