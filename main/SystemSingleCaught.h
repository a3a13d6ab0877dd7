// SPDX-License-Identifier: MIT
#pragma once

/**
 * What SIGINT and SIGTERM do: logs one line and ends the process with status 0 at once, whatever
 * its other threads are doing. Runs on a thread of the signal layer.
 */
[[noreturn]] void onSystemSingleCaught();
