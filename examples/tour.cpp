// SPDX-License-Identifier: MIT
// Shows what a client can do: every step of describing, importing and playing a file through the
// daemon, in plain words.
// usage: qnsmedia-tour FILE [FOLDER]    with FOLDER: writes a picture of the file there
#include <algorithm>
#include <condition_variable>
#include <cstdio>
#include <deque>
#include <functional>
#include <future>
#include <mutex>
#include <string>
#include <unistd.h>

#include "cli/HumanTime.h"
#include "cli/InfoText.h"
#include "cli/MediaPath.h"
#include "qnsmedia/Discoverer.h"
#include "qnsmedia/Error.h"
#include "qnsmedia/Importer.h"
#include "qnsmedia/Player.h"

using namespace std::chrono_literals;
using qnsmedia::Nanoseconds;
using qnsmedia::NotificationKind;
using qnsmedia::PlayerNotification;
using qnsmedia::PlayerState;

namespace {

/** How long a step may take that is done as soon as the engine can. */
constexpr auto kPatience = 10s;

/** Below that there is no time for the steps in the middle. */
constexpr auto kShort = 2s;

/** Nobody wants to hear a long file to its end when it cannot be sought. */
constexpr auto kLong = 60s;

/** Notifications, for one thread that waits for them. */
class Events {
public:
    using Filter = std::function<bool(const PlayerNotification&)>;

    void add(const PlayerNotification& notification) {
        const std::lock_guard lock(mMutex);
        mWaiting.push_back(notification);
        mArrived.notify_one();
    }

    /** Whether one that matches comes in time; those before it are dropped. */
    bool waitFor(const Filter& matches, std::chrono::milliseconds time) {
        std::unique_lock lock(mMutex);
        const auto deadline = std::chrono::steady_clock::now() + time;
        const auto hasCome = [&] { return takeUntil(matches); };
        return mArrived.wait_until(lock, deadline, hasCome);
    }

    /** Forgets all that has come. */
    void clear() {
        const std::lock_guard lock(mMutex);
        mWaiting.clear();
    }

private:
    bool takeUntil(const Filter& matches) {
        while (!mWaiting.empty()) {
            const PlayerNotification next = mWaiting.front();
            mWaiting.pop_front();
            if (next.kind == NotificationKind::failure)
                throw qnsmedia::MediaError(next.result, next.text);
            if (matches(next))
                return true;
        }
        return false;
    }

    std::mutex mMutex; ///< guards mWaiting
    std::condition_variable mArrived;
    std::deque<PlayerNotification> mWaiting;
};

Events::Filter is(NotificationKind kind) {
    return [=](const PlayerNotification& notification) { return notification.kind == kind; };
}

Events::Filter isState(PlayerState state) {
    return [=](const PlayerNotification& notification) {
        return notification.kind == NotificationKind::state &&
               notification.param1 == static_cast<int>(state);
    };
}

void require(bool happened, const char* what) {
    if (!happened)
        throw qnsmedia::TimedOut(std::string("did not happen in time: ") + what);
}

class Tour {
public:
    Tour(const std::string& file, const std::string& folder)
        : mPath(mediaPath(file)), mFolder(folder), mPlayer(mConnection) {
        mPlayer.onNotification([this](const auto& notification) { mEvents.add(notification); });
    }

    void run();

private:
    void discover();
    void drawPicture(qnsmedia::Discoverer& discoverer, Nanoseconds position);
    void importIt();
    void open();
    void play();
    void showPositions(int count);
    void pauseAndResume();
    void seekTo(Nanoseconds position);
    void loop();
    void showEnd();
    void waitForEnd();
    void closeAndPowerOff();
    [[nodiscard]] Nanoseconds position() { return mPlayer.status().get().position; }

    const std::string mPath;
    const std::string mFolder;
    Events mEvents;
    qnsmedia::MediaInfo mMedia;
    qnsmedia::Connection mConnection;
    qnsmedia::Player mPlayer; ///< last: its notifications use mEvents
};

void Tour::run() {
    std::printf("Registered as identity %d, client id %d\n", mConnection.identity(),
                mPlayer.clientId());
    discover();
    importIt();
    open();
    play();
    if (mMedia.duration == 0s) {
        showPositions(5);
        pauseAndResume();
        std::puts("Without a duration there is nothing to seek, to loop or to end: skipped");
    } else if (mMedia.duration < kShort) {
        std::puts("Too short to pause, seek and loop: skipped");
        waitForEnd();
    } else {
        showPositions(5);
        pauseAndResume();
        showEnd();
    }
    closeAndPowerOff();
}

/** What cannot be described may be playable all the same: a stream from the network, say. */
void Tour::discover() {
    qnsmedia::Discoverer discoverer(mConnection);
    try {
        discoverer.open(mPath).get();
        const qnsmedia::Metadata metadata = discoverer.metadata().get();
        std::printf("Described %s\n%s", mPath.c_str(), infoText(metadata).c_str());
        if (!mFolder.empty())
            drawPicture(discoverer, metadata.duration / 2);
    } catch (const qnsmedia::MediaError& error) {
        std::printf("Not described: %s\n", error.what());
    }
}

void Tour::drawPicture(qnsmedia::Discoverer& discoverer, Nanoseconds position) {
    const std::string picture = mediaPath(mFolder + "/picture.jpg");
    try {
        discoverer.makeImage(position, 320, 0, picture).get();
        std::printf("Drew %s, as it is at %s\n", picture.c_str(), humanTime(position).c_str());
    } catch (const qnsmedia::MediaError& error) {
        std::printf("No picture: %s\n", error.what());
    }
}

/** It stays where it is, and the library gets to know it. */
void Tour::importIt() {
    std::promise<qnsmedia::ImportNotification> finished;
    bool isFinished = false;
    qnsmedia::Importer importer(mConnection);
    importer.onNotification([&](const qnsmedia::ImportNotification& notification) {
        if (notification.kind == qnsmedia::ImportNotificationKind::finished && !isFinished) {
            isFinished = true;
            finished.set_value(notification);
        }
    });
    importer.importFile(mPath).get();
    std::future<qnsmedia::ImportNotification> outcome = finished.get_future();
    require(outcome.wait_for(kPatience) == std::future_status::ready, "the import");
    const qnsmedia::ImportNotification told = outcome.get();
    if (told.result == 0)
        std::printf("Imported %s into the media library\n", told.text.c_str());
    else
        std::printf("Not imported: %s\n", qnsmedia::resultText(told.result).c_str());
}

void Tour::open() {
    mMedia = mPlayer.openMedia(mPath).get();
    std::printf("Opened %s\n", mPath.c_str());
    std::printf("  streams: %d video, %d audio, %d text; duration: %s%s%s\n", mMedia.videoStreams,
                mMedia.audioStreams, mMedia.textStreams,
                mMedia.duration > 0s ? humanTime(mMedia.duration).c_str() : "none",
                mMedia.seekable ? "; seekable" : "", mMedia.live ? "; live" : "");
}

void Tour::play() {
    mPlayer.play().get();
    require(mEvents.waitFor(isState(PlayerState::playing), kPatience), "playing");
    std::puts("Playing");
}

/** One line that moves on a terminal, one line each elsewhere. */
void Tour::showPositions(int count) {
    const bool terminal = ::isatty(STDOUT_FILENO) != 0;
    for (int i = 0; i < count; ++i) {
        std::printf("%s  at %s%s", terminal ? "\r" : "", humanTime(position()).c_str(),
                    terminal ? "\033[K" : "\n");
        std::fflush(stdout);
        if (mEvents.waitFor(is(NotificationKind::end), 200ms))
            throw qnsmedia::Error("the end came too early");
    }
    if (terminal)
        std::puts("");
}

void Tour::pauseAndResume() {
    mPlayer.pause().get();
    require(mEvents.waitFor(isState(PlayerState::paused), kPatience), "pausing");
    std::printf("Paused at %s\n", humanTime(position()).c_str());
    mPlayer.play().get();
    require(mEvents.waitFor(isState(PlayerState::playing), kPatience), "playing again");
    std::puts("Playing again");
}

/** Seeks and loops where that can be done, and waits for the end where that does not take long. */
void Tour::showEnd() {
    if (mMedia.seekable) {
        seekTo(mMedia.duration / 2);
        loop();
        seekTo(mMedia.duration - std::min<Nanoseconds>(mMedia.duration / 4, 1500ms));
        waitForEnd();
    } else if (mMedia.duration <= kLong) {
        std::puts("Not seekable: no seek and no loop");
        waitForEnd();
    } else {
        std::puts("Long and not seekable: no seek, no loop, and no wait for its end");
    }
}

void Tour::seekTo(Nanoseconds target) {
    mEvents.clear();
    mPlayer.seek(target).get();
    require(mEvents.waitFor(is(NotificationKind::seekFinished), kPatience), "the seek");
    std::printf("Sought to %s\n", humanTime(position()).c_str());
}

/** A-B: from the middle on, for at most a second. */
void Tour::loop() {
    const Nanoseconds start = mMedia.duration / 2;
    const Nanoseconds end = start + std::min<Nanoseconds>(mMedia.duration / 4, 1s);
    mEvents.clear();
    mPlayer.repeat(start, end).get();
    std::printf("Looping from %s to %s\n", humanTime(start).c_str(), humanTime(end).c_str());
    for (int wrap = 1; wrap <= 2; ++wrap) {
        require(mEvents.waitFor(is(NotificationKind::loop), kPatience), "the loop's return");
        std::printf("  returned to the start (%d)\n", wrap);
    }
    mPlayer.noRepeat().get();
    std::puts("Loop ended");
}

void Tour::waitForEnd() {
    std::puts("Waiting for the end of the file");
    const auto patience = std::chrono::ceil<std::chrono::milliseconds>(
        std::min<Nanoseconds>(mMedia.duration, kLong) + kPatience);
    require(mEvents.waitFor(is(NotificationKind::end), patience), "the end of the file");
    std::puts("End of the file");
}

void Tour::closeAndPowerOff() {
    mPlayer.close().get();
    std::puts("Closed");
    mPlayer.powerOff().get();
    std::puts("Power-off accepted");
}

} // namespace

int main(int argc, char** argv) {
    if (argc < 2 || argc > 3) {
        std::fputs("usage: qnsmedia-tour FILE [FOLDER]\n", stderr);
        return 2;
    }
    try {
        Tour(argv[1], argc > 2 ? argv[2] : "").run();
        return 0;
    } catch (const std::exception& error) {
        std::fflush(stdout);
        std::fprintf(stderr, "Failed: %s\n", error.what());
        return 1;
    }
}
