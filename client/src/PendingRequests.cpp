// SPDX-License-Identifier: MIT
#include "client/src/PendingRequests.h"

#include <algorithm>
#include <utility>

namespace qnsmedia {

template<typename Matches>
PendingRequests::List PendingRequests::takeWhere(Matches matches) {
    List taken;
    for (auto request = mWaiting.begin(); request != mWaiting.end();) {
        const auto next = std::next(request);
        if (matches(*request))
            taken.splice(taken.end(), mWaiting, request);
        request = next;
    }
    return taken;
}

PendingRequests::Added PendingRequests::add(PendingRequest& request) {
    const auto servesIt = [&](const PendingRequest& other) {
        return other.object == request.object && other.method == request.method &&
               other.answers == Answers::mayBeLost;
    };
    const std::lock_guard lock(mMutex);
    if (mClosed)
        return {};
    const bool isServed = request.answers == Answers::shared &&
                          std::any_of(mWaiting.begin(), mWaiting.end(), servesIt);
    request.ticket = ++mLastTicket;
    mWaiting.push_back(std::move(request));
    return {mLastTicket, isServed};
}

PendingRequests::List PendingRequests::takeAnswered(long object, long method) {
    const auto isAnswered = [=](const PendingRequest& request) {
        return request.object == object && request.method == method;
    };
    const std::lock_guard lock(mMutex);
    const auto late = std::find_if(mExpired.begin(), mExpired.end(), isAnswered);
    if (late != mExpired.end()) {
        mExpired.erase(late);
        return {};
    }
    bool isTaken = false;
    return takeWhere([&](const PendingRequest& request) {
        if (!isAnswered(request))
            return false;
        return !std::exchange(isTaken, true) || request.answers == Answers::shared;
    });
}

PendingRequests::List PendingRequests::takeOverdue(Clock::time_point now) {
    const std::lock_guard lock(mMutex);
    List taken = takeWhere([=](const PendingRequest& request) { return request.deadline <= now; });
    for (const PendingRequest& request : taken)
        if (request.answers == Answers::inOrder)
            mExpired.push_back({request.ticket,
                                request.object,
                                request.method,
                                request.answers,
                                request.deadline,
                                {},
                                {}});
    return taken;
}

PendingRequests::List PendingRequests::takeTicket(long ticket) {
    const std::lock_guard lock(mMutex);
    return takeWhere([=](const PendingRequest& request) { return request.ticket == ticket; });
}

PendingRequests::List PendingRequests::takeObject(long object) {
    const auto isFor = [=](const PendingRequest& request) { return request.object == object; };
    const std::lock_guard lock(mMutex);
    mExpired.remove_if(isFor);
    return takeWhere(isFor);
}

PendingRequests::List PendingRequests::close() {
    const std::lock_guard lock(mMutex);
    mClosed = true;
    mExpired.clear();
    return std::exchange(mWaiting, {});
}

std::optional<Clock::time_point> PendingRequests::nextDeadline() {
    const std::lock_guard lock(mMutex);
    std::optional<Clock::time_point> next;
    for (const PendingRequest& request : mWaiting)
        next = std::min(next.value_or(request.deadline), request.deadline);
    return next;
}

} // namespace qnsmedia
