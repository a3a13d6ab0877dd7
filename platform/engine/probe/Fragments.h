// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>

#include "probe/FileInput.h"

namespace probe {

/** Whether an MP4 file is made of fragments, of which its header does not know. */
bool hasFragments(FileInput& input);

/** How long all that is in an MP4 file's header and fragments plays; 0 when nothing tells. */
std::chrono::nanoseconds timeOfFragments(FileInput& input);

} // namespace probe
