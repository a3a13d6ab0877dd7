// SPDX-License-Identifier: MIT
#pragma once

#include <condition_variable>
#include <functional>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "tests/engine_double/LineChannel.h"
#include "tests/engine_double/ScriptText.h"

namespace script {

/** Lets several threads pass at the same moment. */
class Gate {
public:
    void pass() {
        std::unique_lock lock(mMutex);
        mOpened.wait(lock, [this] { return mOpen; });
    }
    void open() {
        const std::lock_guard lock(mMutex);
        mOpen = true;
        mOpened.notify_all();
    }

private:
    std::mutex mMutex;
    std::condition_variable mOpened;
    bool mOpen = false;
};

/**
 * Takes a script's orders to notify, as long as it lives, on a thread of its own: a line that
 * `Read` understands keeps a notification; `deliver` delivers those that are kept, all at once,
 * each on a thread of its own, and answers `delivered` when all have come back.
 */
template<typename Notification>
class ScriptedNotifications {
public:
    using Function = std::function<void(Notification&)>;
    using Read = std::optional<Notification> (*)(const std::vector<std::wstring>& words);

    ScriptedNotifications(LineChannel orders, Read read) : mOrders(std::move(orders)), mRead(read) {
        if (mOrders.isOpen())
            mThread = std::thread(&ScriptedNotifications::takeOrders, this);
    }
    ~ScriptedNotifications() {
        mOrders.shutDown();
        if (mThread.joinable())
            mThread.join();
    }
    ScriptedNotifications(const ScriptedNotifications&) = delete;
    ScriptedNotifications& operator=(const ScriptedNotifications&) = delete;

    /** Who is told from now on. Any thread. */
    void setFunction(Function function) {
        const std::lock_guard lock(mMutex);
        mFunction = std::move(function);
    }

private:
    void takeOrders() {
        std::vector<Notification> kept;
        while (const auto line = mOrders.receive()) {
            if (auto notification = mRead(words(*line))) {
                kept.push_back(*std::move(notification));
            } else if (*line == "deliver") {
                deliver(std::exchange(kept, {}));
                mOrders.send("delivered");
            }
        }
    }

    void deliver(std::vector<Notification> notifications) {
        Gate gate;
        std::vector<std::thread> threads;
        for (auto& notification : notifications)
            threads.emplace_back([&] {
                gate.pass();
                deliverOne(notification);
            });
        gate.open();
        for (auto& thread : threads)
            thread.join();
    }

    void deliverOne(Notification& notification) {
        std::unique_lock lock(mMutex);
        const Function function = mFunction;
        lock.unlock();
        if (function)
            function(notification);
    }

    LineChannel mOrders;
    const Read mRead;
    std::mutex mMutex; ///< guards mFunction
    Function mFunction;
    std::thread mThread;
};

} // namespace script
