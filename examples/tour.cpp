// SPDX-License-Identifier: MIT
// Shows what a client can do: every step of playing a file through the daemon, in plain words.
// usage: qnsmedia-tour FILE
#include <algorithm>
#include <condition_variable>
#include <cstdio>
#include <deque>
#include <filesystem>
#include <mutex>
#include <string>
#include <unistd.h>

#include "cli/HumanTime.h"
#include "qnsmedia/Error.h"
#include "qnsmedia/Player.h"

using namespace std::chrono_literals;
using qnsmedia::Nanoseconds;
using qnsmedia::NotificationKind;
using qnsmedia::PlayerNotification;

namespace {

/** Notifications, for one thread that waits for them. */
class Events {
public:
    void add(const PlayerNotification& notification) {
        const std::lock_guard lock(mMutex);
        mWaiting.push_back(notification);
        mArrived.notify_one();
    }

    /** Whether one of this kind comes in time; those before it are dropped. */
    bool waitFor(NotificationKind kind, std::chrono::milliseconds time) {
        std::unique_lock lock(mMutex);
        const auto deadline = std::chrono::steady_clock::now() + time;
        for (;;) {
            while (!mWaiting.empty()) {
                const PlayerNotification next = mWaiting.front();
                mWaiting.pop_front();
                if (next.kind == NotificationKind::failure)
                    throw qnsmedia::MediaError(next.result, next.text);
                if (next.kind == kind)
                    return true;
            }
            if (mArrived.wait_until(lock, deadline) == std::cv_status::timeout)
                return false;
        }
    }

    void clear() {
        const std::lock_guard lock(mMutex);
        mWaiting.clear();
    }

private:
    std::mutex mMutex;
    std::condition_variable mArrived;
    std::deque<PlayerNotification> mWaiting;
};

class Tour {
public:
    explicit Tour(const std::string& file) : mFile(file), mPlayer(mConnection) {
        mPlayer.onNotification([this](const auto& notification) { mEvents.add(notification); });
    }

    void run();

private:
    void open();
    void showPositions(int count);
    void pauseAndResume();
    void seekTo(Nanoseconds position);
    void loop();
    void playToTheEnd();
    void powerOff();
    void require(bool happened, const char* what);

    std::string mFile;
    Events mEvents;
    bool mEnded = false; ///< before all steps were shown
    qnsmedia::MediaInfo mMedia;
    qnsmedia::Connection mConnection;
    qnsmedia::Player mPlayer;
};

void Tour::require(bool happened, const char* what) {
    if (!happened)
        throw qnsmedia::TimedOut(std::string("did not happen in time: ") + what);
}

void Tour::run() {
    std::printf("Client: registered with identity %d, got client id %d\n", mConnection.identity(),
                mPlayer.clientId());
    open();
    mPlayer.play().get();
    std::puts("Playing");
    showPositions(5);
    if (!mEnded)
        pauseAndResume();
    if (mMedia.seekable && mMedia.duration >= 2s) {
        seekTo(mMedia.duration / 2);
        loop();
        seekTo(mMedia.duration - std::min<Nanoseconds>(mMedia.duration / 4, 1500ms));
        playToTheEnd();
    } else if (mMedia.duration > 0s) {
        std::puts("Too short or not seekable: no seek, no loop");
        playToTheEnd();
    } else {
        std::puts("No duration (a still picture or a live source): no seek, no loop, no end");
    }
    powerOff();
}

void Tour::open() {
    const std::string path = std::filesystem::absolute(mFile).lexically_normal().string();
    mMedia = mPlayer.openMedia(path).get();
    std::printf("Opened %s: %d video, %d audio, %d text stream(s), duration %s%s\n", path.c_str(),
                mMedia.videoStreams, mMedia.audioStreams, mMedia.textStreams,
                humanTime(mMedia.duration).c_str(), mMedia.seekable ? ", seekable" : "");
}

/** One line that moves on a terminal, one line each elsewhere. */
void Tour::showPositions(int count) {
    const bool terminal = ::isatty(STDOUT_FILENO) != 0;
    for (int i = 0; i < count && !mEnded; ++i) {
        const qnsmedia::PlayerStatus status = mPlayer.status().get();
        std::printf("%s  at %s of %s%s", terminal ? "\r" : "", humanTime(status.position).c_str(),
                    humanTime(mMedia.duration).c_str(), terminal ? "\033[K" : "\n");
        std::fflush(stdout);
        mEnded = mEnded || mEvents.waitFor(NotificationKind::end, 200ms);
    }
    if (terminal)
        std::puts("");
}

void Tour::pauseAndResume() {
    mPlayer.pause().get();
    require(mMedia.duration == 0s || mEvents.waitFor(NotificationKind::state, 5s), "pause");
    std::printf("Paused at %s\n", humanTime(mPlayer.status().get().position).c_str());
    mPlayer.play().get();
    std::puts("Playing again");
}

void Tour::seekTo(Nanoseconds position) {
    mEvents.clear();
    mPlayer.seek(position).get();
    require(mEvents.waitFor(NotificationKind::seekFinished, 10s), "seek");
    std::printf("Sought to %s\n", humanTime(mPlayer.status().get().position).c_str());
}

void Tour::loop() {
    const Nanoseconds start = mMedia.duration / 4;
    const Nanoseconds end = start + std::min<Nanoseconds>(mMedia.duration / 4, 1s);
    mEvents.clear();
    mPlayer.repeat(start, end).get();
    std::printf("Looping from %s to %s\n", humanTime(start).c_str(), humanTime(end).c_str());
    for (int wrap = 1; wrap <= 2; ++wrap) {
        const auto patience = std::chrono::ceil<std::chrono::milliseconds>(mMedia.duration) + 5s;
        require(mEvents.waitFor(NotificationKind::loop, patience), "the loop's wrap");
        std::printf("  went back to A (%d)\n", wrap);
    }
    mPlayer.noRepeat().get();
    std::puts("Loop ended");
}

void Tour::playToTheEnd() {
    std::puts("Playing to the end");
    require(mEnded || mEvents.waitFor(NotificationKind::end, 30s), "the end");
    std::puts("End of file");
    mPlayer.close().get();
    std::puts("Closed");
}

void Tour::powerOff() {
    mPlayer.powerOff().get();
    std::puts("Power-off accepted");
}

} // namespace

int main(int argc, char** argv) {
    if (argc != 2) {
        std::fputs("usage: qnsmedia-tour FILE\n", stderr);
        return 2;
    }
    try {
        Tour(argv[1]).run();
        return 0;
    } catch (const std::exception& error) {
        std::fflush(stdout);
        std::fprintf(stderr, "Failed: %s\n", error.what());
        return 1;
    }
}
