// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace library {

struct Tag {
    std::string key; ///< in capitals
    std::string value;
};

/** The tags of a `KEY=value` list, one a line, in UTF-8. Lines without a key are left out. */
std::vector<Tag> parseTags(std::wstring_view lines);

/** The first value of that key; empty when there is none. */
std::string firstValue(const std::vector<Tag>& tags, std::string_view key);

} // namespace library
