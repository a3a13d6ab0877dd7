// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>

namespace engine {

/**
 * A file name or URI as the file system knows it: in the environment's character set, or, where
 * that lacks a character, in UTF-8. Any thread; the process's locale is left alone.
 */
std::string toBytes(std::wstring_view text);

/** The way back. Any thread. */
std::wstring toWide(std::string_view bytes);

/** Text in UTF-8, whatever the environment says; what is none becomes U+FFFD. */
std::wstring fromUtf8(std::string_view bytes);

/** The text in UTF-8, whatever the environment says. */
std::string toUtf8(std::wstring_view text);

} // namespace engine
