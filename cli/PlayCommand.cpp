// SPDX-License-Identifier: MIT
#include <atomic>
#include <csignal>
#include <cstdio>
#include <filesystem>
#include <optional>
#include <poll.h>
#include <sys/eventfd.h>
#include <unistd.h>
#include <utility>

#include "cli/Commands.h"
#include "cli/ExitCode.h"
#include "cli/HumanTime.h"
#include "cli/StateName.h"
#include "cli/Terminal.h"
#include "qnsmedia/Error.h"
#include "qnsmedia/Player.h"

using namespace std::chrono_literals;
using qnsmedia::NotificationKind;
using qnsmedia::PlayerState;

namespace {

/** Wakes the loop: an event of the player, or Ctrl-C. Written by a signal handler. */
int gWakeUp = -1;
std::atomic<bool> gInterrupted{false};

void wakeUp() {
    ::eventfd_write(gWakeUp, 1);
}

void onInterrupt(int) {
    gInterrupted = true;
    wakeUp();
}

std::string absolutePath(const std::string& file) {
    if (file.find("://") != std::string::npos)
        return file;
    return std::filesystem::absolute(file).lexically_normal().string();
}

/** Plays one medium to its end, showing where it is and obeying keys. */
class Playback {
public:
    Playback(qnsmedia::Connection& connection, const std::string& file);
    int run();

private:
    void notified(const qnsmedia::PlayerNotification& notification);
    void waitForEvent(std::chrono::milliseconds time) const;
    void showStatus();
    void handleKey(Key key);
    void togglePause();
    void setLoopStart();
    void setLoopEnd();

    Terminal mTerminal;
    qnsmedia::Connection& mConnection;
    std::string mFile;
    qnsmedia::PlayerStatus mStatus;
    std::optional<qnsmedia::Nanoseconds> mLoopStart;
    bool mLooping = false;
    bool mQuit = false;
    long mShownSecond = -1;
    std::atomic<bool> mEnded{false};
    std::atomic<bool> mFailed{false};
    qnsmedia::Player mPlayer; ///< last: its notifications use the others
};

Playback::Playback(qnsmedia::Connection& connection, const std::string& file)
    : mConnection(connection), mFile(file), mPlayer(connection) {
    mPlayer.onNotification([this](const auto& notification) { notified(notification); });
    connection.onLost(wakeUp);
}

void Playback::notified(const qnsmedia::PlayerNotification& notification) {
    if (notification.kind == NotificationKind::end)
        mEnded = true;
    if (notification.kind == NotificationKind::failure)
        mFailed = true;
    wakeUp();
}

int Playback::run() {
    const qnsmedia::MediaInfo media = mPlayer.openMedia(absolutePath(mFile)).get();
    std::printf("%s: %d video, %d audio, %d text, %s%s\n", mFile.c_str(), media.videoStreams,
                media.audioStreams, media.textStreams, humanTime(media.duration).c_str(),
                media.live ? ", live" : "");
    mPlayer.play().get();
    while (!mEnded && !mFailed && !mQuit && !gInterrupted && mConnection.alive()) {
        showStatus();
        waitForEvent(mTerminal.interactive() ? 100ms : 500ms);
        handleKey(mTerminal.readKey());
    }
    if (mTerminal.interactive())
        std::puts("");
    if (!mConnection.alive())
        throw qnsmedia::ConnectionLost("the daemon has ended");
    mPlayer.close().get();
    if (gInterrupted)
        return kInterrupted;
    std::puts(mEnded ? "end" : mFailed ? "failed" : "stopped");
    return mFailed ? kRefused : kDone;
}

/** Keys are waited for too, where there is a terminal. */
void Playback::waitForEvent(std::chrono::milliseconds time) const {
    pollfd watched[] = {{gWakeUp, POLLIN, 0},
                        {mTerminal.interactive() ? STDIN_FILENO : -1, POLLIN, 0}};
    ::poll(watched, 2, static_cast<int>(time.count()));
    eventfd_t count = 0;
    ::eventfd_read(gWakeUp, &count);
}

void Playback::showStatus() {
    std::future<qnsmedia::PlayerStatus> answer = mPlayer.status();
    if (answer.wait_for(1s) != std::future_status::ready)
        return; // another client may have got this answer; the next one will come
    mStatus = answer.get();
    const std::string line = std::string(stateName(mStatus.state)) + "  " +
                             humanTime(mStatus.position) + " / " + humanTime(mStatus.duration);
    if (mTerminal.interactive()) {
        std::printf("\r%s%s\033[K", line.c_str(), mLooping ? "  A-B" : mLoopStart ? "  A-" : "");
        std::fflush(stdout);
        return;
    }
    const long second = std::chrono::duration_cast<std::chrono::seconds>(mStatus.position).count();
    if (std::exchange(mShownSecond, second) != second) {
        std::puts(line.c_str());
        std::fflush(stdout);
    }
}

void Playback::handleKey(Key key) {
    switch (key) {
    case Key::none:
        return;
    case Key::pause:
        return togglePause();
    case Key::back:
        return mPlayer.seek(-5s, qnsmedia::SeekMode::relative).get();
    case Key::forward:
        return mPlayer.seek(5s, qnsmedia::SeekMode::relative).get();
    case Key::backFar:
        return mPlayer.seek(-30s, qnsmedia::SeekMode::relative).get();
    case Key::forwardFar:
        return mPlayer.seek(30s, qnsmedia::SeekMode::relative).get();
    case Key::loopStart:
        return setLoopStart();
    case Key::loopEnd:
        return setLoopEnd();
    case Key::quit:
        mQuit = true;
    }
}

void Playback::togglePause() {
    if (mStatus.state == PlayerState::playing)
        mPlayer.pause().get();
    else
        mPlayer.play().get();
}

/** The first press marks A; a press while looping ends the loop. */
void Playback::setLoopStart() {
    if (std::exchange(mLooping, false)) {
        mLoopStart.reset();
        mPlayer.noRepeat().get();
        return;
    }
    mLoopStart = mStatus.position;
}

void Playback::setLoopEnd() {
    if (!mLoopStart || mStatus.position <= *mLoopStart)
        return;
    mPlayer.repeat(*mLoopStart, mStatus.position).get();
    mLooping = true;
}

} // namespace

int playCommand(const qnsmedia::Connection::Options& options, const std::string& file) {
    gWakeUp = ::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK);
    struct sigaction action {};
    action.sa_handler = onInterrupt;
    ::sigaction(SIGINT, &action, nullptr);
    ::sigaction(SIGTERM, &action, nullptr);
    qnsmedia::Connection connection(options);
    return Playback(connection, file).run();
}
