// SPDX-License-Identifier: MIT
#pragma once

#include <condition_variable>
#include <functional>
#include <memory>
#include <mutex>
#include <thread>

#include "player/OpenTicket.h"
#include "player/Time.h"

namespace engine {

/**
 * Looks after the latest open() from a thread of its own, because the engine's thread can hang
 * inside a library: an open that nobody has taken up, or answered, in time is reported. Sleeps
 * for good while there is nothing to look after.
 */
class Watchdog {
public:
    enum class Overdue { kTaking, kAnswer };
    using Report = std::function<void(const std::shared_ptr<OpenTicket>&, Overdue)>;

    static constexpr std::chrono::milliseconds kTakingTime{1000};
    static constexpr std::chrono::milliseconds kAnswerTime{4800};

    explicit Watchdog(Report report);
    ~Watchdog();
    Watchdog(const Watchdog&) = delete;
    Watchdog& operator=(const Watchdog&) = delete;

    void watch(std::shared_ptr<OpenTicket> ticket);

private:
    void run();
    void look(std::unique_lock<std::mutex>& lock);

    const Report mReport;
    std::mutex mMutex; ///< guards all below
    std::condition_variable mChanged;
    std::shared_ptr<OpenTicket> mpTicket;
    TimePoint mDeadline = kNever;
    bool mTakingReported = false;
    bool mQuit = false;
    std::thread mThread;
};

} // namespace engine
