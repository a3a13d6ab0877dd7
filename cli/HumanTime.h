// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "qnsmedia/Types.h"

/** "1:23.5", or "1:02:03.5" from an hour on; tenths are cut, not rounded. */
std::string humanTime(qnsmedia::Nanoseconds time);
