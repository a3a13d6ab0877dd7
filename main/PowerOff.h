// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <boost/thread/condition_variable.hpp>
#include <boost/thread/mutex.hpp>

/**
 * Lets one thread wait until another announces power-off. One announcement wakes one waiter; an
 * announcement between a waiter's look at the flag and its wait is lost.
 */
class PowerOff {
public:
    virtual ~PowerOff() = default;

    /** The process's instance, made at the first call, never deleted; null when that fails. */
    static PowerOff* getInstance();

    /**
     * Blocks until power-off is announced; at once when it has been. Any wake-up counts as one.
     * False when the waiting thread was interrupted.
     */
    bool waitPowerOff();

    /** Announces power-off. */
    void toPowerOff();

    void cleanUp();

private:
    boost::mutex mMutex; ///< guards the wait, not the flag
    boost::condition_variable mCondition;
    std::atomic<bool> mbPowerOff{false};

    static std::atomic<PowerOff*> mpPowerOff;
    static boost::mutex mInstanceMutex;
};
