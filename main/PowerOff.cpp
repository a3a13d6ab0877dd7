// SPDX-License-Identifier: MIT
#include "main/PowerOff.h"

std::atomic<PowerOff*> PowerOff::mpPowerOff{nullptr};
boost::mutex PowerOff::mInstanceMutex;

PowerOff* PowerOff::getInstance() {
    if (PowerOff* instance = mpPowerOff.load(std::memory_order_acquire))
        return instance;
    try {
        const boost::mutex::scoped_lock lock(mInstanceMutex);
        if (mpPowerOff.load(std::memory_order_relaxed) == nullptr)
            mpPowerOff.store(new PowerOff, std::memory_order_release);
    } catch (...) {
        return nullptr;
    }
    return mpPowerOff.load(std::memory_order_relaxed);
}

bool PowerOff::waitPowerOff() {
    if (mbPowerOff)
        return true;
    try {
        boost::mutex::scoped_lock lock(mMutex);
        mCondition.wait(lock); // once: see the header
    } catch (...) {            // an interruption is thrown, and is no std::exception
        return false;
    }
    return true;
}

void PowerOff::toPowerOff() {
    mbPowerOff = true;
    mCondition.notify_one();
}

void PowerOff::cleanUp() {}
