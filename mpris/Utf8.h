// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>

namespace mpris {

/**
 * The text with U+FFFD for each byte that is no part of a UTF-8 character: a bus ends the
 * connection of who sends anything else.
 */
std::string toUtf8(std::string_view text);

} // namespace mpris
