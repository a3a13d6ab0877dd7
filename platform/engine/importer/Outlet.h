// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>
#include <string>
#include <thread>

#include "LibMediaPlayer/IMediaImporter.h"

namespace importer {

/**
 * Where notifications leave the importer: one after another, on a thread of its own, because a
 * listener may take its time. One is not sent on the heels of another: a listener that keeps only
 * the last one would miss the one before. Any thread.
 */
class Outlet {
public:
    using Function = std::function<void(LibMediaPlayer::MediaImporterNotify&)>;

    explicit Outlet(std::chrono::microseconds gap);
    /** Drops what has not been sent. */
    ~Outlet();
    Outlet(const Outlet&) = delete;
    Outlet& operator=(const Outlet&) = delete;

    void setFunction(Function function);

    /** All that is told to have finished is sent; of the others, news replace what is older. */
    void tell(LibMediaPlayer::ImporterNotifyKind kind, int result, const std::wstring& text);

private:
    using Notification = LibMediaPlayer::MediaImporterNotify;

    void run();
    void deliver(Notification notification);

    const std::chrono::microseconds mGap;
    std::mutex mMutex; ///< guards the next three
    std::condition_variable mChanged;
    std::deque<Notification> mWaiting;
    bool mClosed = false;
    /** Held while a notification is delivered; the function may come back and set another. */
    std::recursive_mutex mDelivery;
    Function mFunction;  ///< guarded by mDelivery
    std::thread mThread; ///< last, for it uses the others
};

} // namespace importer
