// SPDX-License-Identifier: MIT
#include <future>
#include <optional>
#include <vector>

#include "qnsmedia/Error.h"
#include "qnsmedia/Player.h"
#include "tests/daemon/support/DaemonTest.h"

using namespace std::chrono_literals;
using qnsmedia::Player;
using qnsmedia::PlayerNotification;
using qnsmedia::PlayerState;

namespace {

/** The library and the daemon, with an engine that the test plays. */
class LibraryAndDaemon : public ScriptedDaemonTest {
protected:
    void SetUp() override {
        ScriptedDaemonTest::SetUp();
        if (HasFatalFailure())
            return;
        mConnection.emplace();
        mPlayer.emplace(*mConnection);
    }

    void TearDown() override {
        mPlayer.reset();
        mConnection.reset();
        ScriptedDaemonTest::TearDown();
    }

    /** The status answers after what was sent before it, so the notify object is there. */
    void awaitRegistration() { (void)mPlayer->pause().get(); }

    std::optional<qnsmedia::Connection> mConnection;
    std::optional<Player> mPlayer;
};

TEST_F(LibraryAndDaemon, ControlTheEngine) {
    EXPECT_EQ(mPlayer->clientId(), 1);
    mPlayer->open("/a ü.mp4").get();
    mEngine.expectCall(R"(player open "/a \x{fc}.mp4" 2)");
    mPlayer->play().get();
    mEngine.expectCall("player play");
    mPlayer->pause().get();
    mEngine.expectCall("player pause");
    mPlayer->seek(-5s, qnsmedia::SeekMode::relative).get();
    mEngine.expectCall("player seek -5000000000 2");
    mPlayer->repeat(1s, 2s).get();
    mEngine.expectCall("player repeat true 1000000000 2000000000");
    mPlayer->noRepeat().get();
    mEngine.expectCall("player repeat false 0 -1");
    mPlayer->close().get();
    mEngine.expectCall("player close");
}

TEST_F(LibraryAndDaemon, OpenAMediumAndTellItsStatus) {
    EXPECT_EQ(mPlayer->status().get().state, PlayerState::notReady);
    auto media = mPlayer->openMedia("/film");
    mEngine.expectCall("player open \"/film\" 2");
    mEngine.notify({1, 0, L"/film", 1, 2, 3, 1, 0, 5});
    EXPECT_EQ(media.get().audioStreams, 2);
    auto status = mPlayer->status();
    mEngine.expectCall("player status", "return 3 7 9");
    EXPECT_EQ(status.get().position.count(), 7);
}

TEST_F(LibraryAndDaemon, TellWhyAMediumCannotBeOpened) {
    auto media = mPlayer->openMedia("/film");
    mEngine.expectCall("player open \"/film\" 2");
    mEngine.notify({1, 4, L"damaged", 0, 0, 0, 0, 0, 0});
    EXPECT_THROW(media.get(), qnsmedia::MediaError);
}

TEST_F(LibraryAndDaemon, RefuseAnEmptyName) {
    EXPECT_THROW(mPlayer->openMedia("").get(), qnsmedia::Refused);
    mEngine.expectCall("player close");
}

TEST_F(LibraryAndDaemon, TellBothPlayersOfAProcess) {
    Player other(*mConnection);
    EXPECT_EQ(other.clientId(), 2);
    std::promise<void> first;
    std::promise<void> second;
    mPlayer->onNotification([&](const PlayerNotification&) { first.set_value(); });
    other.onNotification([&](const PlayerNotification&) { second.set_value(); });
    awaitRegistration();
    mEngine.expectCall("player pause");
    (void)other.status().get();
    mEngine.notify({3, 0, L"", 0, 0, 0, 0, 0, 5});
    first.get_future().get();
    second.get_future().get();
}

TEST_F(LibraryAndDaemon, ServeSeveralProcesses) {
    qnsmedia::Connection connection;
    EXPECT_EQ(connection.identity(), 1001);
    Player other(connection);
    EXPECT_EQ(other.clientId(), 2);
    other.play().get();
    mEngine.expectCall("player play");
}

TEST_F(LibraryAndDaemon, AnswerManyRequestsOfManyThreads) {
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i)
        threads.emplace_back([this] {
            for (int count = 0; count < 25; ++count)
                EXPECT_EQ(mPlayer->status().get().state, PlayerState::notReady);
        });
    for (std::thread& thread : threads)
        thread.join();
}

TEST_F(LibraryAndDaemon, NoticeThatTheDaemonWasKilled) {
    std::promise<void> lost;
    mConnection->onLost([&] { lost.set_value(); });
    mpDaemon->signal(SIGKILL);
    lost.get_future().get();
    EXPECT_THROW(mPlayer->play().get(), qnsmedia::ConnectionLost);
    EXPECT_EQ(mpDaemon->waitForExit(), 128 + SIGKILL);
}

TEST_F(LibraryAndDaemon, PowerTheDaemonOff) {
    mPlayer->powerOff().get();
    mEngine.expectCall("player destroy");
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
}

} // namespace
