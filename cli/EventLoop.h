// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <functional>
#include <mutex>
#include <poll.h>
#include <vector>

/**
 * Where a command waits for everything at once: tasks that other threads hand over, signals, and
 * input. One a process, because of the signals. post() may be called by any thread; the rest is
 * for the thread that made it.
 */
class EventLoop {
public:
    using Task = std::function<void()>;

    EventLoop();
    ~EventLoop();
    EventLoop(const EventLoop&) = delete;
    EventLoop& operator=(const EventLoop&) = delete;

    /** Has `task` run in wait(). */
    void post(Task task);

    /** From now on SIGINT, SIGTERM and SIGHUP end a wait instead of the process. */
    void catchSignals();

    /** The signal that came last, once; else 0. */
    [[nodiscard]] int takeSignal();

    /**
     * Waits for at most that long until there is something to do, and runs the tasks. Returns
     * whether the descriptor `input`, if it is not -1, has something to read or has ended, or
     * is ready for the other `events` of poll(2) that are given.
     */
    bool wait(std::chrono::milliseconds time, int input = -1, short events = POLLIN);

private:
    std::vector<Task> takeTasks();

    int mWakeUp;
    bool mCatchesSignals = false;
    std::mutex mMutex; ///< guards mTasks
    std::vector<Task> mTasks;
};
