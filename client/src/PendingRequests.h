// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <exception>
#include <functional>
#include <list>
#include <mutex>
#include <optional>
#include <string>

#include "pack/ArgumentReader.h"

namespace qnsmedia {

using Clock = std::chrono::steady_clock;

/** Which answers belong to a kind of request. */
enum class Answers {
    inOrder,   ///< one each, in the order of the requests
    mayBeLost, ///< the same, but one that is overdue may as well have gone to another client
    shared     ///< one answer serves all that wait: it tells how things are now
};

/** Who is told of a request's outcome. */
struct Completion {
    /** Told once: an error, or null and the answer's arguments. */
    std::function<void(std::exception_ptr error, ArgumentReader* answer)> tell;

    /** Then it is told on the dispatching thread only, else on any. */
    bool callsUser = false;
};

struct PendingRequest {
    long ticket = 0; ///< set by PendingRequests
    long object = 0; ///< that gets the answer
    long method = 0; ///< that is the answer
    Answers answers = Answers::inOrder;
    Clock::time_point deadline;
    std::string what; ///< for error texts, such as "play"
    Completion completion;
};

/** The requests that wait for their answers. Any thread may use it; it never calls anybody. */
class PendingRequests {
public:
    using List = std::list<PendingRequest>;

    struct Added {
        long ticket = 0;       ///< 0 when closed, and then the request is as it was
        bool isServed = false; ///< shares another's answer that is to come, so need not be sent
    };

    Added add(PendingRequest& request);

    /**
     * Takes what an answer completes. An answer that comes too late still uses up its own
     * request, not the next one.
     */
    List takeAnswered(long object, long method);

    List takeOverdue(Clock::time_point now);
    List takeTicket(long ticket);
    List takeObject(long object);

    /** Takes all; from now on add() refuses. */
    List close();

    /** The earliest deadline, if there is one. */
    std::optional<Clock::time_point> nextDeadline();

private:
    template<typename Matches>
    List takeWhere(Matches matches);

    std::mutex mMutex;
    bool mClosed = false;
    long mLastTicket = 0;
    List mWaiting;
    List mExpired; ///< told already, but their answers may come
};

} // namespace qnsmedia
