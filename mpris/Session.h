// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <memory>
#include <optional>
#include <sdbus-c++/IConnection.h>
#include <sdbus-c++/IObject.h>

#include "cli/EventLoop.h"
#include "mpris/Handover.h"
#include "mpris/Options.h"
#include "mpris/PlayerControls.h"
#include "mpris/PlayerInterface.h"
#include "mpris/PlayerModel.h"
#include "mpris/RootInterface.h"
#include "mpris/TrackReader.h"
#include "qnsmedia/Connection.h"
#include "qnsmedia/Player.h"

namespace mpris {

/**
 * One daemon's player on the bus, under its name, for as long as this object lives. Made, used
 * and destroyed on the loop's thread, which also serves the bus; both outlive it.
 */
class Session {
public:
    /** Throws qnsmedia::Error, sdbus::Error, std::runtime_error when another has the name. */
    Session(EventLoop& loop, sdbus::IConnection& bus, const Options& options);
    ~Session();
    Session(const Session&) = delete;
    Session& operator=(const Session&) = delete;

    /** Whether the daemon has gone. */
    [[nodiscard]] bool lost() const { return !mConnection.alive(); }

    /** Asks the daemon how it is when it is time to; returns how long until it is the next time. */
    std::chrono::milliseconds tick();

private:
    using Clock = PlayerModel::Clock;

    void takeName();
    TrackReader::Listener listener();
    void notified(const qnsmedia::PlayerNotification& notification);
    void askStatus();
    void jumped(std::optional<qnsmedia::Nanoseconds> position);
    void show();

    sdbus::IConnection& mBus;
    Handover mHandover;
    qnsmedia::Connection mConnection;
    PlayerModel mModel;
    Clock::time_point mNextStatus; ///< when to ask for it
    int mReadTrack = 0;            ///< the last one that the reader was given

    qnsmedia::Player mPlayer;
    PlayerControls mControls;
    const std::unique_ptr<sdbus::IObject> mpObject;
    RootInterface mRoot;
    PlayerInterface mInterface;
    TrackReader mReader;
};

} // namespace mpris
