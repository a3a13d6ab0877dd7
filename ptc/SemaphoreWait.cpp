// SPDX-License-Identifier: MIT
#include "ptc/SemaphoreWait.h"

#include <boost/interprocess/exceptions.hpp>

#include <cerrno>

namespace PTC {

void waitThroughSignals(boost::interprocess::interprocess_semaphore& semaphore) {
    for (;;) {
        try {
            semaphore.wait();
            return;
        } catch (const boost::interprocess::interprocess_exception& error) {
            if (error.get_native_error() != EINTR)
                throw;
        }
    }
}

} // namespace PTC
