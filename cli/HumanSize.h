// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>

/** "512 B", "1.5 kB", "23 MB": three digits at most, in powers of a thousand. */
std::string humanSize(std::int64_t bytes);
