// SPDX-License-Identifier: MIT
#include "tests/engine/TestPlayer.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <thread>

#include "LibMediaPlayer/InterfaceFactory.h"

using namespace LibMediaPlayer;

TestPlayer::TestPlayer() : mpPlayer(InterfaceFactory::createPlayer(nullptr, 15)) {
    mpPlayer->setNotify([this](Notification& notification) {
        const std::lock_guard lock(mMutex);
        mNotifications.push_back(notification);
        ++mCount;
        mArrived.notify_all();
    });
}

TestPlayer::~TestPlayer() {
    mpPlayer.reset();
}

template<typename Call>
void TestPlayer::timed(Call&& call) {
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_EQ(call(), kOk);
    const std::chrono::duration<double, std::milli> time = std::chrono::steady_clock::now() - begin;
    mCallTimes.push_back(time.count());
}

/** What has come of another medium. */
void TestPlayer::forget() {
    const std::lock_guard lock(mMutex);
    mNotifications.clear();
}

TestPlayer::Notification TestPlayer::open(const std::filesystem::path& path, int format) {
    forget();
    timed([&] { return mpPlayer->open(path.wstring(), format); });
    return await(kNotifyOpened);
}

TestPlayer::Notification TestPlayer::openText(const std::wstring& text) {
    forget();
    timed([&] { return mpPlayer->open(text, kDisplay60Hz); });
    return await(kNotifyOpened);
}

void TestPlayer::play() {
    timed([&] { return mpPlayer->play(); });
    awaitState(kPlaying);
}

void TestPlayer::pause() {
    timed([&] { return mpPlayer->pause(); });
    awaitState(kPaused);
}

TestPlayer::Notification TestPlayer::seek(Seconds position, int mode) {
    timed([&] { return mpPlayer->seek(toNanoseconds(position), mode); });
    return await(kNotifySeekDone);
}

TestPlayer::Status TestPlayer::status() const {
    long position = -1;
    long duration = -1;
    const int state = mpPlayer->status(position, duration);
    return {static_cast<PlayerState>(state), std::chrono::nanoseconds(position),
            std::chrono::nanoseconds(duration)};
}

template<typename Predicate>
TestPlayer::Notification TestPlayer::awaitMatching(Predicate&& matches, const std::string& what) {
    const auto deadline = std::chrono::steady_clock::now() + kPatience;
    std::unique_lock lock(mMutex);
    while (true) {
        while (!mNotifications.empty()) {
            const Notification notification = std::move(mNotifications.front());
            mNotifications.pop_front();
            if (matches(notification))
                return notification;
        }
        if (mArrived.wait_until(lock, deadline) == std::cv_status::timeout) {
            ADD_FAILURE() << "never notified of " << what;
            Notification none;
            none.result = kTimedOut;
            return none;
        }
    }
}

TestPlayer::Notification TestPlayer::await(int type) {
    return awaitMatching([&](const Notification& told) { return told.type == type; },
                         "type " + std::to_string(type));
}

TestPlayer::Notification TestPlayer::awaitState(PlayerState state) {
    return awaitMatching(
        [&](const Notification& told) { return told.type == kNotifyState && told.param1 == state; },
        "state " + std::to_string(state));
}

void TestPlayer::awaitPosition(Seconds position) const {
    const auto deadline = std::chrono::steady_clock::now() + kPatience;
    while (status().position < position) {
        ASSERT_LT(std::chrono::steady_clock::now(), deadline);
        // There is no event for a position; look now and then, and leave the processor alone.
        std::this_thread::sleep_for(std::chrono::milliseconds(2));
    }
}

std::size_t TestPlayer::notifiedCount() const {
    const std::lock_guard lock(mMutex);
    return mCount;
}

std::size_t TestPlayer::pendingCount(int type) const {
    const std::lock_guard lock(mMutex);
    return static_cast<std::size_t>(
        std::count_if(mNotifications.begin(), mNotifications.end(),
                      [&](const Notification& told) { return told.type == type; }));
}

double TestPlayer::medianCallTime() const {
    std::vector<double> times = mCallTimes;
    std::sort(times.begin(), times.end());
    return times.empty() ? 0 : times[times.size() / 2];
}
