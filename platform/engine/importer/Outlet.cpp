// SPDX-License-Identifier: MIT
#include "importer/Outlet.h"

#include <utility>

#include "handle/Barrier.h"

namespace importer {

using namespace LibMediaPlayer;

Outlet::Outlet(std::chrono::microseconds gap) : mGap(gap), mThread([this] { run(); }) {}

Outlet::~Outlet() {
    {
        const std::lock_guard lock(mMutex);
        mClosed = true;
    }
    mChanged.notify_one();
    mThread.join();
}

void Outlet::setFunction(Function function) {
    const std::lock_guard lock(mDelivery);
    mFunction = std::move(function);
}

void Outlet::tell(ImporterNotifyKind kind, int result, const std::wstring& text) {
    {
        const std::lock_guard lock(mMutex);
        if (kind != kImportFinished && !mWaiting.empty() && mWaiting.back().kind == kind)
            mWaiting.pop_back();
        mWaiting.push_back({kind, result, text});
    }
    mChanged.notify_one();
}

void Outlet::run() {
    std::unique_lock lock(mMutex);
    for (;;) {
        mChanged.wait(lock, [this] { return mClosed || !mWaiting.empty(); });
        if (mClosed)
            return;
        Notification notification = std::move(mWaiting.front());
        mWaiting.pop_front();
        lock.unlock();
        deliver(std::move(notification));
        lock.lock();
        mChanged.wait_for(lock, mGap, [this] { return mClosed; });
    }
}

void Outlet::deliver(Notification notification) {
    const std::lock_guard lock(mDelivery);
    // A copy, because the function may set another one.
    if (const Function function = mFunction)
        handle::guarded([&] { function(notification); });
}

} // namespace importer
