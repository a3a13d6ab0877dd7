// SPDX-License-Identifier: MIT
#include "library/Tags.h"

#include <algorithm>

#include "text/Text.h"

namespace library {

namespace {

void appendTag(std::wstring_view line, std::vector<Tag>& tags) {
    const std::size_t equals = line.find(L'=');
    if (equals == std::wstring_view::npos || equals == 0)
        return;
    tags.push_back(
        {engine::toUtf8(line.substr(0, equals)), engine::toUtf8(line.substr(equals + 1))});
}

} // namespace

std::vector<Tag> parseTags(std::wstring_view lines) {
    std::vector<Tag> tags;
    while (!lines.empty()) {
        const std::size_t end = std::min(lines.find(L'\n'), lines.size());
        appendTag(lines.substr(0, end), tags);
        lines.remove_prefix(std::min(end + 1, lines.size()));
    }
    return tags;
}

std::string firstValue(const std::vector<Tag>& tags, std::string_view key) {
    const auto found =
        std::find_if(tags.begin(), tags.end(), [&](const Tag& tag) { return tag.key == key; });
    return found == tags.end() ? std::string() : found->value;
}

} // namespace library
