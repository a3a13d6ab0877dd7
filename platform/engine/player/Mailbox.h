// SPDX-License-Identifier: MIT
#pragma once

#include <condition_variable>
#include <deque>
#include <mutex>
#include <optional>
#include <utility>

#include "player/Time.h"

namespace engine {

/** What any thread hands to one thread, in order. An empty one costs its reader nothing. */
template<typename Item>
class Mailbox {
public:
    template<typename Content>
    void post(Content&& content) {
        {
            const std::lock_guard lock(mMutex);
            mItems.emplace_back(std::forward<Content>(content));
        }
        mArrived.notify_one();
    }

    /** The next item; nothing when none has come by the deadline. */
    std::optional<Item> take(TimePoint deadline) {
        std::unique_lock lock(mMutex);
        const auto arrived = [this] { return !mItems.empty(); };
        if (deadline == kNever)
            mArrived.wait(lock, arrived);
        else if (!mArrived.wait_until(lock, deadline, arrived))
            return std::nullopt;
        Item item = std::move(mItems.front());
        mItems.pop_front();
        return item;
    }

    /** All that has not been taken. */
    std::deque<Item> drain() {
        const std::lock_guard lock(mMutex);
        return std::exchange(mItems, {});
    }

private:
    std::mutex mMutex; ///< guards mItems
    std::condition_variable mArrived;
    std::deque<Item> mItems;
};

} // namespace engine
