// SPDX-License-Identifier: MIT
#pragma once

#include <string_view>

namespace qns {

/**
 * Writes trace lines to standard output, each with one write(2): lines of several threads never
 * mix, and a process that ends abruptly loses none. A pipe whose reader has stopped must not
 * stop the daemon, so a line that would block is dropped; to a pipe, a line longer than 4096 bytes
 * is cut there, since only that much is sure to be taken at once. Any thread may call these.
 */

/** Writes `text` and a newline. */
void printLine(std::string_view text);

/** Writes what printf(3) would, without adding a newline; cut at 4095 bytes. */
[[gnu::format(printf, 1, 2)]] void printFormatted(const char* format, ...);

} // namespace qns
