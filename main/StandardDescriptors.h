// SPDX-License-Identifier: MIT
#pragma once

/**
 * Opens /dev/null in the place of each of standard input, output and error that is closed. What
 * the process opened otherwise, a log file, a pipe or a client's connection, would get that number
 * and the trace lines with it. Call it before anything else is opened.
 */
void openStandardDescriptors();
