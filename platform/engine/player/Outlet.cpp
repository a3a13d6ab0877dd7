// SPDX-License-Identifier: MIT
#include "player/Outlet.h"

#include "handle/Barrier.h"

namespace engine {

void Outlet::setFunction(Function function) {
    const std::lock_guard lock(mDelivery);
    mFunction = std::move(function);
}

void Outlet::drain() {
    const std::lock_guard lock(mDelivery);
}

void Outlet::deliver(std::uint64_t session, Notification notification) {
    const std::lock_guard lock(mDelivery);
    if (isCurrent(session))
        call(notification);
}

void Outlet::call(Notification& notification) const {
    // A copy, because the function may set another one.
    if (const Function function = mFunction)
        handle::guarded([&] { function(notification); });
}

} // namespace engine
