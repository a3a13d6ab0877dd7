// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <mutex>
#include <utility>

#include "client/src/Link.h"

namespace qnsmedia {

/** Who is told of a service's notifications. Any thread may set it. */
template<typename Record>
class NotificationHandler {
public:
    using Function = std::function<void(const Record& record)>;

    void set(Function handler) {
        const std::lock_guard lock(mMutex);
        mHandler = std::move(handler);
    }

    /** On the dispatching thread. */
    void tell(Link& link, const Record& record) {
        const Function handler = copy();
        if (handler)
            link.callUser([&] { handler(record); });
    }

private:
    Function copy() {
        const std::lock_guard lock(mMutex);
        return mHandler;
    }

    std::mutex mMutex; ///< guards mHandler
    Function mHandler;
};

} // namespace qnsmedia
