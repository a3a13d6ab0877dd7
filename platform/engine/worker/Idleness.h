// SPDX-License-Identifier: MIT
#pragma once

namespace worker {

/** From now on this process gets processor and disk only while nobody else wants them. */
void runWhenIdle();

} // namespace worker
