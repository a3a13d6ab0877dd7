// SPDX-License-Identifier: MIT
#pragma once

#include <boost/interprocess/sync/interprocess_semaphore.hpp>

namespace PTC {

/** Waits for a post, also when signal handlers run on the waiting thread meanwhile. */
void waitThroughSignals(boost::interprocess::interprocess_semaphore& semaphore);

} // namespace PTC
