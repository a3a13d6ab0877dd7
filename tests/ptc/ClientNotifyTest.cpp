// SPDX-License-Identifier: MIT
#include "ptc/ClientNotify.h"

#include <gtest/gtest.h>

#include <future>
#include <set>
#include <thread>
#include <vector>

namespace {

class Registry : public ClientNotify {
public:
    using ClientNotify::notifyClients;
    using ClientNotify::use;
};

} // namespace

TEST(ClientNotify, CountsItsIdsFromOneAndNeverReusesThem) {
    Registry registry;
    int callback = 0;
    EXPECT_EQ(registry.registerClient(&callback), 1);
    EXPECT_EQ(registry.registerClient(&callback), 2);
    registry.unregisterClient(1);
    EXPECT_EQ(registry.registerClient(&callback), 3);
    EXPECT_EQ(registry.getNewID(), 4);
    EXPECT_EQ(registry.registerClient(&callback), 5);
    EXPECT_FALSE(registry.isEnableID(4));
}

TEST(ClientNotify, CountsForEachRegistryAlone) {
    Registry one;
    Registry other;
    EXPECT_EQ(one.registerClient(nullptr), 1);
    EXPECT_EQ(other.registerClient(nullptr), 1);
}

TEST(ClientNotify, EnablesExactlyTheRegisteredCallbacks) {
    Registry registry;
    int callback = 0;
    const int id = registry.registerClient(&callback);
    EXPECT_TRUE(registry.isEnableID(id));
    EXPECT_EQ(registry.getCurrentMethod(id), &callback);
    registry.unregisterClient(id);
    EXPECT_FALSE(registry.isEnableID(id));
    EXPECT_EQ(registry.getCurrentMethod(id), nullptr);
}

TEST(ClientNotify, TakesANotifyObjectUnderAnIdThatNobodyHas) {
    Registry registry;
    int notify = 0;
    registry.registerNotifyClient(5, &notify);
    EXPECT_FALSE(registry.isEnableID(5));
    EXPECT_EQ(registry.notifyClients(), (std::map<int, void*>{{5, &notify}}));
}

TEST(ClientNotify, KeepsTheFirstNotifyObjectOfAnId) {
    Registry registry;
    int first = 0;
    int second = 0;
    registry.registerNotifyClient(2, &first);
    registry.registerNotifyClient(2, &second);
    EXPECT_EQ(registry.notifyClients().at(2), &first);
    registry.unregisterNotifyClient(2);
    registry.registerNotifyClient(2, &second);
    EXPECT_EQ(registry.notifyClients().at(2), &second);
}

TEST(ClientNotify, LooksAnUnknownIdUpWithoutCreatingIt) {
    Registry registry;
    EXPECT_EQ(registry.getCurrentMethod(9), nullptr);
    EXPECT_FALSE(registry.isEnableID(9));
    registry.unregisterClient(9);
    registry.unregisterNotifyClient(9);
}

TEST(ClientNotify, KeepsTheNotifyObjectOfAClientThatUnregistersItsCallback) {
    Registry registry;
    int notify = 0;
    const int id = registry.registerClient(nullptr);
    registry.registerNotifyClient(id, &notify);
    registry.unregisterClient(id);
    EXPECT_EQ(registry.notifyClients().count(id), 1u);
    const int other = registry.registerClient(nullptr);
    registry.registerNotifyClient(other, &notify);
    registry.unregisterNotifyClient(other);
    EXPECT_TRUE(registry.isEnableID(other));
}

TEST(ClientNotify, ForgetsAnObjectWhereverItIsRegistered) {
    Registry registry;
    int callback = 0;
    int notify = 0;
    int other = 0;
    const int id = registry.registerClient(&callback);
    const int otherId = registry.registerClient(&other);
    registry.registerNotifyClient(7, &notify);
    registry.forget(&callback);
    EXPECT_FALSE(registry.isEnableID(id));
    EXPECT_EQ(registry.notifyClients().count(7), 1u);
    registry.forget(&notify);
    EXPECT_EQ(registry.notifyClients().count(7), 0u);
    EXPECT_TRUE(registry.isEnableID(otherId));
}

TEST(ClientNotify, ForgetsAnUnknownObjectWithoutHarm) {
    Registry registry;
    int callback = 0;
    int other = 0;
    const int id = registry.registerClient(&callback);
    registry.forget(&other);
    EXPECT_TRUE(registry.isEnableID(id));
    EXPECT_EQ(registry.registerClient(&other), 2);
}

TEST(ClientNotify, IsInUseAsLongAsAnyThreadUsesIt) {
    Registry registry;
    EXPECT_FALSE(registry.isInUse());
    std::promise<void> inUse;
    std::promise<void> enough;
    std::thread user([&] {
        const auto held = registry.use();
        inUse.set_value();
        enough.get_future().wait();
    });
    inUse.get_future().wait();
    EXPECT_TRUE(registry.isInUse());
    std::thread([&registry] { EXPECT_TRUE(registry.use().owns_lock()); }).join();
    EXPECT_TRUE(registry.isInUse());
    enough.set_value();
    user.join();
    EXPECT_FALSE(registry.isInUse());
}

TEST(ClientNotify, GivesIdsToManyThreadsWithoutRepeatingOne) {
    Registry registry;
    std::vector<std::vector<int>> ids(8);
    std::vector<std::thread> threads;
    for (auto& mine : ids)
        threads.emplace_back([&registry, &mine] {
            for (int round = 0; round < 200; ++round) {
                mine.push_back(registry.registerClient(&mine));
                registry.registerNotifyClient(mine.back(), &mine);
                EXPECT_EQ(registry.getCurrentMethod(mine.back()), &mine);
                EXPECT_EQ(registry.notifyClients().count(mine.back()), 1u);
                registry.unregisterNotifyClient(mine.back());
            }
        });
    for (auto& thread : threads)
        thread.join();
    std::set<int> all;
    for (const auto& mine : ids)
        all.insert(mine.begin(), mine.end());
    EXPECT_EQ(all.size(), 8u * 200u);
    EXPECT_EQ(*all.rbegin(), 8 * 200);
}
