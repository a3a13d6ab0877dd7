// SPDX-License-Identifier: MIT
#include "main/PowerOff.h"

#include <boost/thread/thread.hpp>
#include <future>
#include <gtest/gtest.h>
#include <thread>
#include <vector>

#include "main/SystemManager.h"

namespace {

/** Announces until the waiter has ended: an announcement before its wait is lost by design. */
template<typename Future>
void announceUntilDone(PowerOff& powerOff, Future& done) {
    while (done.wait_for(std::chrono::milliseconds(1)) != std::future_status::ready)
        powerOff.toPowerOff();
}

TEST(PowerOff, AnnouncedBeforeTheWaitEndsItAtOnce) {
    PowerOff powerOff;
    powerOff.toPowerOff();
    EXPECT_TRUE(powerOff.waitPowerOff());
}

TEST(PowerOff, AnAnnouncementEndsAWait) {
    PowerOff powerOff;
    auto waiter = std::async(std::launch::async, [&] { return powerOff.waitPowerOff(); });
    announceUntilDone(powerOff, waiter);
    EXPECT_TRUE(waiter.get());
}

TEST(PowerOff, AnInterruptedWaiterGetsFalse) {
    PowerOff powerOff;
    std::promise<bool> result;
    boost::thread waiter([&] { result.set_value(powerOff.waitPowerOff()); });
    waiter.interrupt();
    EXPECT_FALSE(result.get_future().get());
    waiter.join();
}

TEST(PowerOff, ConcurrentFirstCallsGetTheSameInstance) {
    std::vector<PowerOff*> instances(8);
    std::vector<std::thread> threads;
    for (PowerOff*& instance : instances)
        threads.emplace_back([&instance] { instance = PowerOff::getInstance(); });
    for (std::thread& thread : threads)
        thread.join();
    ASSERT_NE(instances[0], nullptr);
    for (PowerOff* instance : instances)
        EXPECT_EQ(instance, instances[0]);
}

TEST(SystemManager, WaitsForTheProcessesPowerOff) {
    SystemManager manager;
    EXPECT_EQ(manager.systemInitialize(), 0);
    auto waiter = std::async(std::launch::async, [&] { return manager.waitPowerOff(); });
    announceUntilDone(*PowerOff::getInstance(), waiter);
    EXPECT_EQ(waiter.get(), 0);
    EXPECT_EQ(manager.systemUnInitialize(), 0);
}

} // namespace
