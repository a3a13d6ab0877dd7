// SPDX-License-Identifier: MIT
#include <chrono>
#include <cstdlib>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/ItemReader.h"
#include "tests/daemon/support/Patience.h"
#include "tests/daemon/support/SampleMedia.h"

using namespace std::chrono_literals;

namespace {

constexpr std::int64_t kSecond = 1'000'000'000;

/** Status codes. */
enum : std::int32_t { kClosed = 0, kPaused = 1, kNotReady = 2, kPlaying = 3, kEnded = 4 };

/** The result of an open that took too long. */
constexpr std::int64_t kTimedOut = 7;

/** Notification types. */
enum : std::int64_t { kOpened = 1, kEnd = 3, kLoop = 5, kSeekDone = 7 };

struct PlayerEvent {
    std::int64_t type = 0;
    std::int64_t result = 0;
    std::string text;
    std::int64_t video = 0;
    std::int64_t audio = 0;
    std::int64_t subtitles = 0;
    std::int64_t flags = 0;
    std::int64_t unused = 0;
    std::int64_t value = 0;
};

PlayerEvent decodeEvent(const wire::Bytes& payload) {
    ItemReader items(payload);
    PlayerEvent event;
    event.type = items.integer();
    event.result = items.integer();
    event.text = items.text();
    for (auto* field :
         {&event.video, &event.audio, &event.subtitles, &event.flags, &event.unused, &event.value})
        *field = items.integer();
    return event;
}

/** The daemon with the engine that plays. */
class Playback : public DaemonTest {
protected:
    void SetUp() override {
        start(DaemonOptions{});
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
        mClient.registerCallBack();
        mClient.registerNotify();
    }

    /** The next notification of that type; others before it are passed over. */
    std::optional<PlayerEvent> waitForEvent(std::int64_t type) {
        const auto deadline = patience::deadline();
        while (patience::Clock::now() < deadline) {
            const auto packet = mClient.receive();
            if (!packet)
                return std::nullopt;
            if (packet->object != mClient.notifyObject())
                continue;
            const auto event = decodeEvent(packet->payload);
            if (event.type == type)
                return event;
        }
        return std::nullopt;
    }

    PlayerStatus status() {
        mClient.request(request::kGetPlayerStatus);
        for (;;) {
            const auto packet = mClient.receive();
            if (!packet || packet->method == callback::kGetPlayerStatus)
                return decodeStatus(packet);
        }
    }

    /** Asks until the status fulfils the condition; the last one asked for. */
    PlayerStatus waitForStatus(const std::function<bool(const PlayerStatus&)>& condition) {
        const auto deadline = patience::deadline();
        auto seen = status();
        while (!condition(seen) && patience::Clock::now() < deadline)
            seen = status();
        EXPECT_TRUE(condition(seen)) << "code " << seen.code << " at " << seen.value1;
        return seen;
    }

    PlayerEvent open(const std::string& name) {
        const auto start = patience::Clock::now();
        mClient.open(name);
        const auto event = waitForEvent(kOpened);
        EXPECT_TRUE(event) << name;
        EXPECT_LT(patience::Clock::now() - start, patience::stretched(5s)) << name;
        // The daemon answers from the engine's status once it has told all clients of the open.
        if (event && event->result == 0)
            waitForStatus(isReady);
        return event.value_or(PlayerEvent{});
    }

    /** The daemon gives an open five seconds, which are too few on a machine that is too busy. */
    PlayerEvent openFilm() {
        const auto deadline = patience::deadline();
        auto event = open(sample::film());
        while (event.result == kTimedOut && patience::Clock::now() < deadline)
            event = open(sample::film());
        EXPECT_EQ(event.result, 0) << event.text;
        return event;
    }

    static bool isReady(const PlayerStatus& status) { return status.code != kNotReady; }

    static bool isPlaying(const PlayerStatus& status) { return status.code == kPlaying; }

    PlayerClient mClient{1000};
};

TEST_F(Playback, OpeningAFilmTellsItsStreamsAndItsDuration) {
    const auto event = openFilm();
    EXPECT_EQ(event.text, sample::film());
    EXPECT_EQ(event.video, 1);
    EXPECT_EQ(event.audio, 1);
    EXPECT_EQ(event.subtitles, 0);
    EXPECT_EQ(event.flags, 1) << "seekable, not live";
    EXPECT_NEAR(static_cast<double>(event.value), 10e9, 0.1e9);
    const auto opened = status();
    EXPECT_EQ(opened.code, kPaused);
    EXPECT_EQ(opened.value1, 0);
    EXPECT_EQ(opened.value2, event.value);
}

TEST_F(Playback, MovesInRealTimeUntilItIsPaused) {
    openFilm();
    mClient.request(request::kPlay);
    const auto first = waitForStatus(isPlaying);
    const auto start = patience::Clock::now();
    const auto second = waitForStatus(
        [&](const PlayerStatus& now) { return now.value1 >= first.value1 + 2 * kSecond; });
    const std::chrono::duration<double> elapsed = patience::Clock::now() - start;
    EXPECT_GT(elapsed.count(), 1.5);
    EXPECT_EQ(second.code, kPlaying);
    mClient.request(request::kPause);
    const auto paused = waitForStatus([](const PlayerStatus& now) { return now.code == kPaused; });
    EXPECT_EQ(status().value1, paused.value1);
    EXPECT_EQ(status().value1, paused.value1);
}

TEST_F(Playback, SeeksAccurately) {
    openFilm();
    for (const std::int64_t position : {7 * kSecond + kSecond / 2, 2 * kSecond + kSecond / 5}) {
        mClient.seek(position, 0);
        const auto done = waitForEvent(kSeekDone);
        ASSERT_TRUE(done);
        EXPECT_EQ(done->result, 0);
        EXPECT_NEAR(static_cast<double>(status().value1), static_cast<double>(position), 0.05e9);
    }
}

TEST_F(Playback, SeeksRelativeToWhereItIs) {
    openFilm();
    mClient.seek(4 * kSecond, 0);
    ASSERT_TRUE(waitForEvent(kSeekDone));
    mClient.seek(-kSecond, 2);
    ASSERT_TRUE(waitForEvent(kSeekDone));
    EXPECT_NEAR(static_cast<double>(status().value1), 3e9, 0.1e9);
}

TEST_F(Playback, LoopsBetweenTwoPoints) {
    openFilm();
    mClient.setRepeat(true, 3 * kSecond, 4 * kSecond);
    mClient.seek(3 * kSecond, 0);
    ASSERT_TRUE(waitForEvent(kSeekDone));
    mClient.request(request::kPlay);
    for (int i = 0; i < 2; ++i) {
        const auto looped = waitForEvent(kLoop);
        ASSERT_TRUE(looped);
        EXPECT_NEAR(static_cast<double>(looped->value), 3e9, 0.05e9);
        const auto now = status().value1;
        EXPECT_GE(now, 3 * kSecond - kSecond / 10);
        EXPECT_LE(now, 4 * kSecond + kSecond / 10);
    }
}

TEST_F(Playback, TellsTheEnd) {
    open(sample::shortSound());
    mClient.request(request::kPlay);
    const auto end = waitForEvent(kEnd);
    ASSERT_TRUE(end);
    EXPECT_NEAR(static_cast<double>(end->value), 1e9, 0.1e9);
    waitForStatus([](const PlayerStatus& now) { return now.code == kEnded; });
}

TEST_F(Playback, IsOverWithTheClose) {
    openFilm();
    mClient.request(request::kPlay);
    waitForStatus(isPlaying);
    mClient.request(request::kClosePlayer);
    // A notification that was on its way makes the daemon ask the engine all the same.
    EXPECT_THAT(status().code, testing::AnyOf(kNotReady, kClosed));
}

TEST_F(Playback, OfNamesWithForeignCharactersWorks) {
    const auto event = open(sample::filmWithUnicodeName());
    EXPECT_EQ(event.result, 0);
    EXPECT_EQ(event.text, sample::filmWithUnicodeName());
}

TEST_F(Playback, OfWhatCannotBePlayedIsRefusedWithAReasonAndTheNextFilmPlays) {
    const std::vector<std::string> names{
        "/nothing/here.mp4", sample::truncatedFilm(), sample::noise(), sample::text(), "/tmp",
        "/dev/null",         "http://127.0.0.1:1/",   "unknown:thing"};
    for (const auto& name : names) {
        SCOPED_TRACE(name);
        const auto refused = open(name);
        EXPECT_NE(refused.result, 0);
        EXPECT_NE(refused.text, "");
        openFilm();
    }
}

TEST_F(Playback, InitializeShowsThePictureAndLeavesThePlayerClosed) {
    mClient.request(request::kInitializePlayer);
    const auto opened = waitForEvent(kOpened);
    ASSERT_TRUE(opened);
    EXPECT_EQ(opened->result, 0) << opened->text;
    EXPECT_THAT(opened->text, testing::EndsWith("/share/mediaplayer/images/black.jpg"));
    openFilm();
}

TEST_F(Playback, EndsWithTheDaemonWhilePlaying) {
    openFilm();
    mClient.request(request::kPlay);
    waitForStatus(isPlaying);
    mClient.request(request::kPowerOffMediaPlayer);
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
}

TEST_F(Playback, EndsBySignalWhilePlaying) {
    openFilm();
    mClient.request(request::kPlay);
    waitForStatus(isPlaying);
    const auto start = patience::Clock::now();
    EXPECT_EQ(mpDaemon->terminate(), 0);
    EXPECT_LT(patience::Clock::now() - start, patience::stretched(1s));
}

} // namespace
