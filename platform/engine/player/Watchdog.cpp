// SPDX-License-Identifier: MIT
#include "player/Watchdog.h"

#include <utility>

namespace engine {

Watchdog::Watchdog(Report report) : mReport(std::move(report)), mThread([this] { run(); }) {}

Watchdog::~Watchdog() {
    {
        const std::lock_guard lock(mMutex);
        mQuit = true;
    }
    mChanged.notify_one();
    mThread.join();
}

void Watchdog::watch(std::shared_ptr<OpenTicket> ticket) {
    bool asleep = false;
    {
        const std::lock_guard lock(mMutex);
        // Otherwise it wakes by itself before the new deadline.
        asleep = mpTicket == nullptr;
        mpTicket = std::move(ticket);
        mDeadline = SteadyClock::now() + kTakingTime;
        mTakingReported = false;
    }
    if (asleep)
        mChanged.notify_one();
}

void Watchdog::run() {
    std::unique_lock lock(mMutex);
    while (!mQuit) {
        if (!mpTicket)
            mChanged.wait(lock);
        else if (const TimePoint deadline = mDeadline; SteadyClock::now() < deadline)
            mChanged.wait_until(lock, deadline);
        else
            look(lock);
    }
}

void Watchdog::look(std::unique_lock<std::mutex>& lock) {
    const std::shared_ptr<OpenTicket> ticket = mpTicket;
    if (ticket->isAnswered() || mTakingReported) {
        mpTicket.reset();
    } else {
        mTakingReported = true;
        mDeadline += kAnswerTime - kTakingTime;
    }
    if (ticket->isAnswered())
        return;
    const Overdue overdue = mpTicket ? Overdue::kTaking : Overdue::kAnswer;
    if (overdue == Overdue::kTaking && ticket->isTaken())
        return;
    lock.unlock();
    mReport(ticket, overdue);
    lock.lock();
}

} // namespace engine
