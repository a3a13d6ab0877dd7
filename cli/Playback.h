// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <exception>
#include <functional>
#include <optional>
#include <string>

#include "cli/EventLoop.h"
#include "cli/Terminal.h"
#include "qnsmedia/Player.h"

/**
 * Plays one medium to its end, showing where it is and obeying keys. All of it runs on the
 * thread that made it; what the library tells on its own thread is handed over.
 */
class Playback {
public:
    Playback(const qnsmedia::Connection::Options& options, const std::string& file);

    /** Returns an exit code, with the medium closed; throws qnsmedia::Error and OutputFailed. */
    int run();

private:
    using Clock = std::chrono::steady_clock;

    /** What ends a playback. */
    enum class End { none, reached, failed, quit, signal, takenOver };

    void follow();
    void close();
    [[nodiscard]] int tellEnd() const;

    void opened(std::exception_ptr error, const qnsmedia::MediaInfo& media);
    void notified(const qnsmedia::PlayerNotification& notification);
    void checkSignal();
    void throwError();
    void end(End reason);

    [[nodiscard]] std::chrono::milliseconds tick() const;
    void askStatus();
    void gotStatus(std::exception_ptr error, const qnsmedia::PlayerStatus& status);
    void showStatus();

    void handleKey(Key key);
    void togglePause();
    void seekBy(qnsmedia::Nanoseconds distance);
    void pressLoopStart();
    void pressLoopEnd();
    bool endLoop();

    /** Hands what becomes of a request over to `told`, on this object's thread. */
    qnsmedia::Player::Callback then(void (Playback::*told)(std::exception_ptr error));
    void playAnswered(std::exception_ptr error);
    void keyAnswered(std::exception_ptr error);
    void closeAnswered(std::exception_ptr error);

    const std::string mFile;
    const std::string mPath;
    EventLoop mLoop;
    std::optional<Terminal> mTerminal;

    End mEnd = End::none;
    int mSignal = 0;
    std::string mFailure; ///< the engine's words
    std::exception_ptr mError;
    bool mIsOpen = false;
    bool mIsClosed = false;

    qnsmedia::PlayerStatus mStatus;
    Clock::time_point mNextStatus; ///< when to ask for it
    bool mShowsStatus = false;     ///< since the first status of the open medium
    long mShownSecond = -1;

    std::optional<qnsmedia::Nanoseconds> mLoopStart;
    bool mLooping = false;

    qnsmedia::Connection mConnection;
    qnsmedia::Player mPlayer; ///< last: what it tells uses the others
};
