// SPDX-License-Identifier: MIT
#include "player/MediaPlayerService.h"

#include <future>
#include <string>
#include <thread>

#include "player/MediaPlayerController.h"
#include "tests/player/PlayerFixture.h"
#include "tests/support/OutputCapture.h"

using testing::Each;
using testing::SizeIs;

namespace {

constexpr int kThreads = 8;
constexpr int kRounds = 50;

/** A notification all of whose fields tell the same number. */
LibMediaPlayer::MediaPlayerNotify uniform(int number) {
    const auto wide = static_cast<unsigned long>(number);
    return {number, number, std::to_wstring(number), number, number, number, wide, wide, number};
}

Bytes uniformBytes(int number) {
    const auto wide = static_cast<uint64_t>(number);
    const Bytes small{static_cast<uint8_t>(number)};
    return small + int32(number) + text(std::to_string(number)) + small + small + small +
           uint64(wide) + uint64(wide) + int64(number);
}

class PlayerThreads : public PlayerFixture {
protected:
    /** Several engine threads notify at once, until all have done their rounds. */
    void notifyFromManyThreads() {
        std::vector<std::thread> threads;
        for (int thread = 0; thread < kThreads; ++thread)
            threads.emplace_back([this, thread] {
                for (int round = 0; round < kRounds; ++round)
                    notify(uniform(1 + thread));
            });
        for (auto& thread : threads)
            thread.join();
    }
};

MATCHER(IsOneNotificationWhole, "") {
    return arg.bytes == uniformBytes(arg.bytes.at(0));
}

} // namespace

TEST_F(PlayerThreads, NotificationsOfSeveralThreadsAreNeverMixed) {
    registerNotify(201, 1);
    registerNotify(202, 2);
    OutputCapture output;
    notifyFromManyThreads();
    output.text();
    const auto sent = mSender.take();
    EXPECT_THAT(sent, SizeIs(2 * kThreads * kRounds));
    EXPECT_THAT(sent, Each(IsOneNotificationWhole()));
    for (std::size_t i = 0; i + 1 < sent.size(); i += 2) {
        EXPECT_EQ(sent[i].objectId, 201) << "the fan-out of one ends before the next begins";
        EXPECT_EQ(sent[i].bytes, sent[i + 1].bytes);
    }
}

TEST_F(PlayerThreads, RequestsAndNotificationsAndTheMainThreadDoNotDisturbEachOther) {
    registerNotify(201, 1);
    OutputCapture output;
    auto requests = std::async(std::launch::async, [this] {
        for (int round = 0; round < kRounds; ++round) {
            request(kOpen, int32(1) + text("/" + std::to_string(round)));
            request(kSeek, int32(1) + int32(0) + int64(round) + boolean(false));
            request(kSetRepeat, int32(1) + boolean(true) + int64(round) + int64(-1));
            request(kSetFormat, int32(round % 2));
            request(kGetStatus, int32(1));
            request(kUnregisterNotify, int32(1));
            registerNotify(201, 1);
        }
    });
    auto notifications = std::async(std::launch::async, [this] { notifyFromManyThreads(); });
    const auto done = [](const auto& future) {
        return future.wait_for(std::chrono::seconds(0)) == std::future_status::ready;
    };
    while (!done(requests) || !done(notifications))
        runQueued();
    runQueued();
    output.text();
    EXPECT_THAT(answersTo(kPlay, int32(1)), SizeIs(testing::Ge(1U)));
}

TEST_F(PlayerThreads, NotificationsArePassedOnUntilThePlayerHasEnded) {
    registerNotify(201, 1);
    mSender.take();
    OutputCapture output;
    mpEngine->atDestruction = [this] { notifyFromManyThreads(); };
    mAdapter.reset();
    output.text();
    EXPECT_THAT(mSender.take(), SizeIs(kThreads * kRounds));
}

TEST_F(PlayerThreads, EveryParameterMayBeSetWhileASlotReadsIt) {
    engineFactory().next = new Player;
    MediaPlayerController controller;
    const auto together = [](auto set, auto read) {
        std::promise<void> started;
        std::thread writer([&] {
            started.set_value();
            for (int value = 0; value < 20 * kRounds; ++value)
                set(value);
        });
        started.get_future().wait();
        for (int i = 0; i < 20 * kRounds; ++i)
            read();
        writer.join();
    };
    OutputCapture output;
    together([&](int value) { controller.setFileName(std::to_wstring(value)); },
             [&] { controller.open(); });
    together([&](int value) { controller.setFormat(value); }, [&] { controller.open(); });
    together(
        [&](int value) {
            controller.setSeekParam({1, value, value, false});
        },
        [&] { controller.seek(); });
    together(
        [&](int value) {
            controller.setRepeatParam({1, true, value, value});
        },
        [&] { controller.setRepeat(); });
    together([&](int value) { controller.setStatusClientID(value); },
             [&] { static_cast<void>(controller.statusAnswer()); });
}
