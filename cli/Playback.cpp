// SPDX-License-Identifier: MIT
#include "cli/Playback.h"

#include <utility>

#include "cli/ExitCode.h"
#include "cli/HumanTime.h"
#include "cli/MediaPath.h"
#include "cli/Output.h"
#include "cli/StateName.h"
#include "qnsmedia/Error.h"

using namespace std::chrono_literals;
using qnsmedia::NotificationKind;
using qnsmedia::PlayerState;

namespace {

/** How often the position is asked for. */
constexpr auto kTerminalTick = 100ms;
constexpr auto kPlainTick = 500ms;

/** Another client that asks at the same time may have got the answer. */
constexpr auto kAskAgain = 1s;

/**
 * False once another client has closed the medium or opens another one; also for a moment after
 * the daemon has told that it is open.
 */
bool hasMedium(PlayerState state) {
    return state != PlayerState::closed && state != PlayerState::notReady &&
           state != PlayerState::unknown;
}

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

} // namespace

Playback::Playback(const qnsmedia::Connection::Options& options, const std::string& file)
    : mFile(file), mPath(mediaPath(file)), mConnection(options), mPlayer(mConnection) {
    mPlayer.onNotification([this](const qnsmedia::PlayerNotification& notification) {
        mLoop.post([this, notification] { notified(notification); });
    });
    mConnection.onLost([this] {
        mLoop.post([this] {
            mError = std::make_exception_ptr(qnsmedia::ConnectionLost("the daemon has ended"));
        });
    });
}

int Playback::run() {
    mLoop.catchSignals();
    mTerminal.emplace();
    mPlayer.openMedia(mPath, [this](std::exception_ptr error, qnsmedia::MediaInfo media) {
        mLoop.post([this, error, media] { opened(error, media); });
    });
    try {
        follow();
    } catch (const qnsmedia::ConnectionLost&) {
        throw;
    } catch (...) {
        end(End::failed);
        close();
        throw;
    }
    if (mEnd != End::takenOver)
        close();
    if (mEnd != End::signal)
        throwError();
    return tellEnd();
}

void Playback::follow() {
    const bool interactive = mTerminal->interactive();
    while (mEnd == End::none) {
        if (mIsOpen)
            askStatus();
        if (mLoop.wait(tick(), mTerminal->input()))
            handleKey(mTerminal->readKey());
        throwError();
        checkSignal();
    }
    if (interactive)
        show("\n");
}

/** A second signal ends the wait. */
void Playback::close() {
    mPlayer.close(then(&Playback::closeAnswered));
    while (!mIsClosed && mLoop.takeSignal() == 0)
        mLoop.wait(kPlainTick);
}

int Playback::tellEnd() const {
    switch (mEnd) {
    case End::signal:
        return exitCodeOfSignal(mSignal);
    case End::failed:
        show("failed: " + mFailure + "\n");
        return kFailed;
    case End::takenOver:
        show("ended by another client\n");
        return kFailed;
    case End::quit:
        show("stopped\n");
        return kDone;
    case End::reached:
    case End::none:
        show("end\n");
    }
    return kDone;
}

void Playback::opened(std::exception_ptr error, const qnsmedia::MediaInfo& media) {
    mError = error;
    if (error || mEnd != End::none)
        return;
    show(mFile + ": " + std::to_string(media.videoStreams) + " video, " +
         std::to_string(media.audioStreams) + " audio, " + std::to_string(media.textStreams) +
         " text, " + humanTime(media.duration) + (media.live ? ", live\n" : "\n"));
    mIsOpen = true;
    mPlayer.play(then(&Playback::playAnswered));
}

void Playback::notified(const qnsmedia::PlayerNotification& notification) {
    if (!mIsOpen)
        return;
    switch (notification.kind) {
    case NotificationKind::end:
        return end(End::reached);
    case NotificationKind::failure:
        mFailure = notification.text;
        return end(End::failed);
    case NotificationKind::opened:
        if (notification.text != mPath)
            end(End::takenOver);
        return;
    default:
        return;
    }
}

void Playback::checkSignal() {
    const int number = mLoop.takeSignal();
    if (number == 0)
        return;
    mSignal = number;
    end(End::signal);
}

void Playback::throwError() {
    if (mError)
        std::rethrow_exception(mError);
}

/** The first reason counts. */
void Playback::end(End reason) {
    if (mEnd == End::none)
        mEnd = reason;
}

std::chrono::milliseconds Playback::tick() const {
    return mTerminal->interactive() ? kTerminalTick : kPlainTick;
}

void Playback::askStatus() {
    const auto now = Clock::now();
    if (now < mNextStatus)
        return;
    mNextStatus = now + kAskAgain;
    mPlayer.status([this](std::exception_ptr error, qnsmedia::PlayerStatus status) {
        mLoop.post([this, error, status] { gotStatus(error, status); });
    });
}

/** One answer serves all requests that wait: none within the deadline means that none comes. */
void Playback::gotStatus(std::exception_ptr error, const qnsmedia::PlayerStatus& status) {
    mNextStatus = Clock::now() + tick();
    if (error) {
        mError = error;
        return;
    }
    if (mEnd != End::none)
        return;
    mStatus = status;
    if (hasMedium(status.state))
        showStatus();
    else if (mShowsStatus)
        end(End::takenOver);
}

void Playback::showStatus() {
    mShowsStatus = true;
    const std::string line = std::string(stateName(mStatus.state)) + "  " +
                             humanTime(mStatus.position) + " / " + humanTime(mStatus.duration);
    if (mTerminal->interactive())
        return show('\r' + line + (mLooping ? "  A-B" : mLoopStart ? "  A-" : "") + "\033[K");
    const long second = std::chrono::duration_cast<std::chrono::seconds>(mStatus.position).count();
    if (std::exchange(mShownSecond, second) != second)
        show(line + '\n');
}

void Playback::handleKey(Key key) {
    if (key == Key::quit)
        return end(End::quit);
    if (!mIsOpen)
        return;
    switch (key) {
    case Key::pause:
        return togglePause();
    case Key::back:
        return seekBy(-5s);
    case Key::forward:
        return seekBy(5s);
    case Key::backFar:
        return seekBy(-30s);
    case Key::forwardFar:
        return seekBy(30s);
    case Key::loopStart:
        return pressLoopStart();
    case Key::loopEnd:
        return pressLoopEnd();
    case Key::quit:
    case Key::none:
        return;
    }
}

void Playback::togglePause() {
    if (mStatus.state == PlayerState::playing)
        mPlayer.pause(then(&Playback::keyAnswered));
    else
        mPlayer.play(then(&Playback::keyAnswered));
}

void Playback::seekBy(qnsmedia::Nanoseconds distance) {
    mPlayer.seek(distance, qnsmedia::SeekMode::relative, then(&Playback::keyAnswered));
}

void Playback::pressLoopStart() {
    if (!endLoop())
        mLoopStart = mStatus.position;
}

void Playback::pressLoopEnd() {
    if (endLoop() || !mLoopStart || mStatus.position <= *mLoopStart)
        return;
    mLooping = true;
    mPlayer.repeat(*mLoopStart, mStatus.position, then(&Playback::keyAnswered));
}

bool Playback::endLoop() {
    if (!std::exchange(mLooping, false))
        return false;
    mLoopStart.reset();
    mPlayer.noRepeat(then(&Playback::keyAnswered));
    return true;
}

qnsmedia::Player::Callback Playback::then(void (Playback::*told)(std::exception_ptr error)) {
    return [this, told](std::exception_ptr error) {
        mLoop.post([this, told, error] { (this->*told)(error); });
    };
}

void Playback::playAnswered(std::exception_ptr error) {
    if (error)
        mError = error;
}

/** What cannot be done now is left undone: the medium plays on. */
void Playback::keyAnswered(std::exception_ptr error) {
    mNextStatus = {};
    if (error && !isA<qnsmedia::Refused>(error))
        mError = error;
}

void Playback::closeAnswered(std::exception_ptr error) {
    mIsClosed = true;
    if (error && !isA<qnsmedia::ConnectionLost>(error))
        mError = error;
}
