// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

/** The words of the lines that an engine script and the scripted engine exchange. */
namespace script {

/**
 * A text as one word, in double quotes: printable ASCII as it stands, `\` before a quote or a
 * backslash, and every other character as `\x{20ac}`. Independent of any locale.
 */
std::string quoted(std::wstring_view text);

/** The words of a line; a quoted word comes without its quotes and with its escapes undone. */
std::vector<std::wstring> words(std::string_view line);

/** The number that a word stands for, 0 when it stands for none. */
long number(const std::wstring& word);
unsigned long unsignedNumber(const std::wstring& word);

/** The result in an answer such as `return 3`, 0 when there is none. */
int resultIn(const std::vector<std::wstring>& answer);
int resultIn(std::string_view answer);

} // namespace script
