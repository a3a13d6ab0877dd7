// SPDX-License-Identifier: MIT
#include "importer/ThumbnailThread.h"

#include <pthread.h>
#include <sched.h>
#include <sys/syscall.h>
#include <unistd.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "handle/Barrier.h"

namespace importer {

namespace {

void setPolicy(pthread_t thread, int policy) {
    const sched_param parameters{};
    ::pthread_setschedparam(thread, policy, &parameters);
}

/** Of the calling thread; the C library has no function for it. */
void readOnlyWhenDiskIsIdle() {
    constexpr int kOneThread = 1;
    constexpr int kCallingThread = 0;
    constexpr int kIdle = 3 << 13;
    ::syscall(SYS_ioprio_set, kOneThread, kCallingThread, kIdle);
}

} // namespace

ThumbnailThread::ThumbnailThread(DrawThumbnail draw, Haste haste, std::function<void()> whenDone)
    : mDraw(std::move(draw)),
      mHaste(haste),
      mWhenDone(std::move(whenDone)),
      mThread([this] { run(); }) {}

ThumbnailThread::~ThumbnailThread() {
    stop();
    mThread.join();
}

void ThumbnailThread::draw(std::vector<library::MissingThumbnail> portion) {
    {
        const std::lock_guard lock(mMutex);
        mPortion.clear();
        for (library::MissingThumbnail& missing : portion)
            mPortion.push_back({std::move(missing), std::nullopt});
        mBegun = 0;
        mDone = mPortion.empty();
    }
    mChanged.notify_all();
}

std::optional<std::vector<Drawn>> ThumbnailThread::take() {
    const std::lock_guard lock(mMutex);
    if (!mDone)
        return std::nullopt;
    return std::exchange(mPortion, {});
}

std::vector<Drawn> ThumbnailThread::stop() {
    // Whoever waits should not wait for an idle machine, where we have the right to change that.
    if (mHaste == Haste::kWhenIdle)
        setPolicy(mThread.native_handle(), SCHED_OTHER);
    std::unique_lock lock(mMutex);
    mClosed = true;
    mChanged.notify_all();
    mChanged.wait(lock, [this] { return mDone; });
    return std::exchange(mPortion, {});
}

void ThumbnailThread::run() {
    if (mHaste == Haste::kWhenIdle) {
        setPolicy(::pthread_self(), SCHED_IDLE);
        readOnlyWhenDiskIsIdle();
    }
    while (Drawn* const drawn = next()) {
        discoverer::Thumbnail failed;
        failed.result = LibMediaPlayer::kInternal;
        drawn->thumbnail =
            handle::guarded(std::move(failed), [&] { return mDraw(drawn->missing.path); });
    }
}

/** The next one to draw, once there is one; null when there will be none. */
Drawn* ThumbnailThread::next() {
    std::unique_lock lock(mMutex);
    while (!mClosed) {
        if (mBegun < mPortion.size())
            return &mPortion[mBegun++];
        if (!std::exchange(mDone, true)) {
            lock.unlock();
            mWhenDone();
            lock.lock();
            continue;
        }
        mChanged.wait(lock);
    }
    mDone = true;
    mChanged.notify_all();
    return nullptr;
}

} // namespace importer
