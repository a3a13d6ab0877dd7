// SPDX-License-Identifier: MIT
#include <atomic>
#include <fstream>
#include <future>
#include <optional>
#include <thread>

#include "qnsmedia/Discoverer.h"
#include "qnsmedia/Error.h"
#include "qnsmedia/Importer.h"
#include "qnsmedia/Player.h"
#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/SampleMedia.h"
#include "tests/support/TestFolder.h"

using namespace std::chrono_literals;
using qnsmedia::Connection;
using qnsmedia::Discoverer;

namespace {

/** The real daemon and engine, whose workers do what some files say. */
class HostileMedia : public DaemonTest {
protected:
    void SetUp() override {
        DaemonOptions options;
        options.environment["QNS_HV_DATA"] = mFolder.path("data");
        options.environment["QNS_MEDIA_WORKER"] = QNS_HOSTILE_WORKER;
        start(options);
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
        mConnection.emplace();
    }

    void TearDown() override {
        mConnection.reset();
        DaemonTest::TearDown();
    }

    std::string hostile(const std::string& order) {
        const std::string path = mFolder.path(order);
        std::ofstream(path) << "hostile: " << order;
        return path;
    }

    TestFolder mFolder;
    std::optional<Connection> mConnection;
};

/** A client of its own that plays, and asks for as long as it lives. */
class Bystander {
public:
    Bystander() : mPlayer(mConnection) {
        mPlayer.openMedia(sample::film()).get();
        mPlayer.repeat(1s, 2s).get();
        mPlayer.play().get();
        while (!isPlaying()) {
        }
        mThread = std::thread([this] { ask(); });
    }
    ~Bystander() {
        mEnd = true;
        mThread.join();
        mPlayer.close().get();
        EXPECT_GT(mAnswers, 0);
        EXPECT_EQ(mOthers, 0) << "of " << mAnswers;
    }
    Bystander(const Bystander&) = delete;
    Bystander& operator=(const Bystander&) = delete;

private:
    void ask() {
        while (!mEnd) {
            ++mAnswers;
            mOthers += isPlaying() ? 0 : 1;
        }
    }

    bool isPlaying() { return mPlayer.status().get().state == qnsmedia::PlayerState::playing; }

    Connection mConnection;
    qnsmedia::Player mPlayer;
    std::atomic<bool> mEnd{false};
    int mAnswers = 0;
    int mOthers = 0; ///< that do not say that it plays
    std::thread mThread;
};

template<typename Future>
int resultOf(Future future) {
    try {
        future.get();
        return 0;
    } catch (const qnsmedia::MediaError& error) {
        return error.result();
    }
}

/** What the importer tells of a file in the end. */
int importResult(qnsmedia::Importer& importer, const std::string& path) {
    std::promise<int> told;
    std::atomic<bool> isTold{false};
    importer.onNotification([&](const qnsmedia::ImportNotification& notification) {
        const bool isEnd = notification.kind == qnsmedia::ImportNotificationKind::finished;
        if (isEnd && !isTold.exchange(true))
            told.set_value(notification.result);
    });
    importer.importFile(path).get();
    const int result = told.get_future().get();
    importer.onNotification({});
    return result;
}

constexpr int kDamaged = 4;
constexpr int kTimedOut = 7;
constexpr int kInternal = 9;

} // namespace

TEST_F(HostileMedia, CostsWhoAsksForItNothingButTheAnswer) {
    const Bystander bystander;
    Discoverer discoverer(*mConnection);
    EXPECT_EQ(resultOf(discoverer.open(hostile("crash"))), kDamaged);
    EXPECT_EQ(resultOf(discoverer.open(hostile("hang"))), kTimedOut);
    EXPECT_EQ(resultOf(discoverer.open(hostile("lie"))), kInternal);
    discoverer.open(sample::film()).get();
    EXPECT_EQ(discoverer.metadata().get().video.front().width, 320);
    EXPECT_TRUE(mSyslog.waitForLine("Media worker was killed by signal"));
    EXPECT_TRUE(mSyslog.waitForLine("Media worker took too long, reading " + hostile("hang")));
}

TEST_F(HostileMedia, IsNotPlayed) {
    qnsmedia::Player player(*mConnection);
    EXPECT_EQ(resultOf(player.openMedia(hostile("crash"))), kDamaged);
    EXPECT_EQ(resultOf(player.openMedia(hostile("hang"))), kTimedOut);
    player.openMedia(sample::film()).get();
    player.close().get();
}

TEST_F(HostileMedia, IsNotImportedAndTheOthersAre) {
    const Bystander bystander;
    qnsmedia::Importer importer(*mConnection);
    EXPECT_EQ(importResult(importer, hostile("crash")), kDamaged);
    EXPECT_EQ(importResult(importer, hostile("hang")), kTimedOut);
    EXPECT_EQ(importResult(importer, sample::film()), 0);
}
