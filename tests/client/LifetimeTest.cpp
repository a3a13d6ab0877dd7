// SPDX-License-Identifier: MIT
#include <array>
#include <atomic>
#include <thread>
#include <vector>

#include "tests/client/support/ConnectedPlayer.h"

using qnsmedia::Player;
using qnsmedia::PlayerNotification;

namespace {

class ClientLifetime : public ConnectedPlayer {};

template<typename Failure>
bool isA(const std::exception_ptr& error) {
    try {
        if (error)
            std::rethrow_exception(error);
    } catch (const Failure&) {
        return true;
    } catch (...) {
        return false;
    }
    return false;
}

TEST_F(ClientLifetime, APlayerThatGoesTellsWhatStillWaits) {
    mDaemon.on(request::kPlay, nullptr);
    mDaemon.on(request::kOpenPlayer, nullptr);
    auto future = mPlayer->play();
    auto media = mPlayer->openMedia("/film");
    bool isTold = false;
    mPlayer->play([&](std::exception_ptr error) {
        isTold = true;
        EXPECT_TRUE(isA<qnsmedia::ConnectionLost>(error));
    });
    mPlayer.reset();
    EXPECT_TRUE(isTold);
    EXPECT_THROW(future.get(), qnsmedia::ConnectionLost);
    EXPECT_THROW(media.get(), qnsmedia::ConnectionLost);
}

TEST_F(ClientLifetime, NoHandlerRunsWhenThePlayerHasGone) {
    expectAlive();
    std::atomic<bool> hasGone{false};
    mPlayer->onNotification([&](const PlayerNotification&) { EXPECT_FALSE(hasGone); });
    std::thread noise([this] {
        for (int i = 0; i < 200; ++i)
            mDaemon.notify(notification(3, 0, ""));
    });
    mPlayer.reset();
    hasGone = true;
    noise.join();
    // What a second player hears tells that the daemon's packets have been taken in.
    mPlayer.emplace(*mConnection);
    expectAlive();
}

TEST_F(ClientLifetime, APlayerMayBeDestroyedByItsNotificationHandler) {
    std::promise<void> told;
    mPlayer->onNotification([&](const PlayerNotification&) {
        mPlayer.reset();
        told.set_value();
    });
    mDaemon.notify(notification(1, 0, "/film"));
    EXPECT_TRUE(comes(told.get_future()));
    mPlayer.emplace(*mConnection);
    expectAlive();
}

TEST_F(ClientLifetime, APlayerMayBeDestroyedByACallback) {
    mDaemon.on(request::kPause, nullptr);
    auto waiting = mPlayer->pause();
    std::promise<void> told;
    mPlayer->play([&](std::exception_ptr) {
        mPlayer.reset();
        told.set_value();
    });
    EXPECT_TRUE(comes(told.get_future()));
    EXPECT_THROW(waiting.get(), qnsmedia::ConnectionLost);
    mPlayer.emplace(*mConnection);
    expectAlive();
}

TEST_F(ClientLifetime, APlayerMayBeDestroyedByTheCallbackThatItsOwnEndCalls) {
    mDaemon.on(request::kPlay, nullptr);
    auto other = std::make_unique<Player>(*mConnection);
    mPlayer->play([&](std::exception_ptr) { other.reset(); });
    mPlayer.reset();
    EXPECT_FALSE(other);
}

TEST_F(ClientLifetime, APlayerOfADeadDaemonMayGo) {
    mDaemon.on(request::kPlay, nullptr);
    auto future = mPlayer->play();
    mDaemon.die();
    mPlayer.reset();
    mConnection.reset();
    EXPECT_THROW(future.get(), qnsmedia::ConnectionLost);
}

TEST_F(ClientLifetime, AConnectionWithoutAPlayerMayGoAtAnyTime) {
    for (int i = 0; i < 20; ++i) {
        const qnsmedia::Connection connection;
        EXPECT_TRUE(connection.alive());
    }
}

TEST_F(ClientLifetime, AConnectionHasRoomForManyPlayersAndSaysWhenThereAreTooMany) {
    std::vector<std::unique_ptr<Player>> players;
    const auto makeOne = [&] { players.push_back(std::make_unique<Player>(*mConnection)); };
    for (int i = 0; i < 62; ++i)
        makeOne();
    EXPECT_THROW(makeOne(), qnsmedia::Error);
    players.pop_back();
    EXPECT_NO_THROW(makeOne());
    EXPECT_NO_THROW(players.back()->play().get());
}

TEST_F(ClientLifetime, RequestsFromManyThreadsAllGetTheirAnswers) {
    constexpr int kThreads = 8;
    constexpr int kRequests = 50;
    std::atomic<int> accepted{0};
    std::vector<std::thread> threads;
    for (int i = 0; i < kThreads; ++i)
        threads.emplace_back([&] {
            for (int count = 0; count < kRequests; ++count) {
                mPlayer->play().get();
                mPlayer->seek(std::chrono::seconds(count)).get();
                (void)mPlayer->status().get();
                ++accepted;
            }
        });
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(accepted, kThreads * kRequests);
}

TEST_F(ClientLifetime, PlayersComeAndGoOnManyThreads) {
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i)
        threads.emplace_back([&] {
            for (int count = 0; count < 10; ++count) {
                Player player(*mConnection);
                player.onNotification([](const PlayerNotification&) {});
                player.play([](std::exception_ptr) {});
            }
        });
    for (std::thread& thread : threads)
        thread.join();
    expectAlive();
}

TEST_F(ClientLifetime, ADaemonMayDieWhileManyThreadsAsk) {
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i)
        threads.emplace_back([&] {
            try {
                while (true)
                    mPlayer->play().get();
            } catch (const qnsmedia::ConnectionLost&) {
                return;
            }
        });
    EXPECT_TRUE(mDaemon.waitForRequest(request::kPlay));
    mDaemon.die();
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_FALSE(mConnection->alive());
}

} // namespace
