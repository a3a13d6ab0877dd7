// SPDX-License-Identifier: MIT
#include "tests/daemon/support/Load.h"

#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "tests/daemon/support/SampleMedia.h"

namespace load {

namespace {

constexpr long kFirstIdentity = 1000;
constexpr long kLastIdentity = 1007;

} // namespace

Load::Load(const std::string& folder, unsigned seed) {
    mBoard.film = sample::film();
    mBoard.sound = sample::shortSound();
    mBoard.folder = folder;
    for (long identity = kFirstIdentity; identity <= kLastIdentity; ++identity)
        mClients.emplace_back(identity, seed + static_cast<unsigned>(identity), mBoard);
}

void Load::begin() {
    for (auto& client : mClients)
        client.registerAll();
    mClients.front().learn();
}

void Load::run(std::chrono::milliseconds time) {
    work(time, [] {});
    if (testing::Test::HasFailure())
        return;
    settle();
    mClients.front().makeIdle();
    settle();
    expectSameNotifications();
    EXPECT_EQ(mBoard.statesOwed, 0);
    EXPECT_EQ(mBoard.importerStatesOwed, 0);
}

void Load::runInto(const std::function<void()>& end, std::chrono::milliseconds time) {
    mBoard.mayEnd = true;
    for (auto& client : mClients)
        client.expectEnd();
    work(time, end);
}

void Load::work(std::chrono::milliseconds time, const std::function<void()>& atItsEnd) {
    mBoard.stop = false;
    std::vector<std::thread> threads;
    for (auto& client : mClients)
        threads.emplace_back(&Client::work, &client);
    std::this_thread::sleep_for(time);
    atItsEnd();
    mBoard.stop = true;
    for (auto& thread : threads)
        thread.join();
}

void Load::settle() {
    for (auto& client : mClients)
        client.settle();
}

void Load::expectSameNotifications() {
    for (auto& client : mClients)
        for (const auto& other : mClients)
            client.catchUp(other);
    const auto& first = mClients.front();
    for (const auto& client : mClients) {
        EXPECT_EQ(client.played().digest(), first.played().digest());
        EXPECT_EQ(client.imported().digest(), first.imported().digest());
    }
}

std::size_t Load::asked() const {
    std::size_t sum = 0;
    for (const auto& client : mClients)
        sum += client.asked();
    return sum;
}

std::size_t Load::told() const {
    const auto& first = mClients.front();
    return first.played().count() + first.imported().count();
}

} // namespace load
