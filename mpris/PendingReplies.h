// SPDX-License-Identifier: MIT
#pragma once

#include <exception>
#include <map>
#include <sdbus-c++/MethodResult.h>

#include "mpris/Handover.h"

namespace mpris {

/**
 * Calls that came over the bus and wait for their answer. They stay here, on the bus's thread,
 * while what is asked for the answer travels through others. Who has not been answered at the
 * end is told that the daemon has gone.
 */
class PendingReplies {
public:
    PendingReplies() = default;
    ~PendingReplies();
    PendingReplies(const PendingReplies&) = delete;
    PendingReplies& operator=(const PendingReplies&) = delete;

    /** The reply answers the call; it may be called once, for as long as this object lives. */
    [[nodiscard]] Reply add(sdbus::Result<>&& call);

private:
    void answer(unsigned int number, std::exception_ptr error);

    unsigned int mCount = 0;
    std::map<unsigned int, sdbus::Result<>> mCalls;
};

} // namespace mpris
