// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <mutex>

#include "LibMediaPlayer/IMediaPlayer.h"

namespace engine {

/**
 * Where notifications leave the engine: one after another, and only those of the present session.
 * Any thread may call it.
 */
class Outlet {
public:
    using Notification = LibMediaPlayer::MediaPlayerNotify;
    using Function = std::function<void(Notification&)>;

    void setFunction(Function function);

    /** Begins a session: nothing of an earlier one is delivered from now on. */
    std::uint64_t beginSession() { return ++mSession; }

    /** Nothing more of that session is delivered. */
    void endSession(std::uint64_t session) {
        mSession.compare_exchange_strong(session, session + 1);
    }

    [[nodiscard]] bool isCurrent(std::uint64_t session) const { return mSession == session; }

    /** Waits for a notification that is being delivered, unless by this thread. */
    void drain();

    void deliver(std::uint64_t session, Notification notification);

private:
    void call(Notification& notification) const;

    /** Held while a notification is delivered; the function may come back and close. */
    std::recursive_mutex mDelivery;
    Function mFunction; ///< guarded by mDelivery
    std::atomic<std::uint64_t> mSession{0};
};

} // namespace engine
