// SPDX-License-Identifier: MIT
#include "importer/ThumbnailThread.h"

#include <utility>

#include "LibMediaPlayer/Result.h"
#include "handle/Barrier.h"

namespace importer {

ThumbnailThread::ThumbnailThread(DrawThumbnail draw, std::function<void()> whenDone)
    : mDraw(std::move(draw)), mWhenDone(std::move(whenDone)), mThread([this] { run(); }) {}

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
    std::unique_lock lock(mMutex);
    mClosed = true;
    mChanged.notify_all();
    mChanged.wait(lock, [this] { return mDone; });
    return std::exchange(mPortion, {});
}

void ThumbnailThread::run() {
    while (Drawn* const drawn = next()) {
        discoverer::Thumbnail failed;
        failed.result = LibMediaPlayer::kInternal;
        auto thumbnail =
            handle::guarded(std::move(failed), [&] { return mDraw(drawn->missing.path); });
        if (thumbnail.result != LibMediaPlayer::kCancelled)
            drawn->thumbnail = std::move(thumbnail);
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
