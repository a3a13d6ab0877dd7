// SPDX-License-Identifier: MIT
#pragma once

namespace worker {

/**
 * Gives up, for good, all that reading files which are handed in does not need: no file can be
 * opened, nothing be started, no network be reached; memory is bounded, and the system takes this
 * process first when it runs out. What the kernel or its administrator does not allow is left
 * out: the process is then still one of its own.
 */
void enterSandbox();

} // namespace worker
