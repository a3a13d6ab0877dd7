// SPDX-License-Identifier: MIT
#pragma once

#include "bench/Report.h"

namespace bench {

/**
 * What a row costs while the library's database grows to a hundred thousand, and how long
 * searching takes then; without files and daemon.
 */
void measureLibraryRows(int rounds, Report& report);

} // namespace bench
