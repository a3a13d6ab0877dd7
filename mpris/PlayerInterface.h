// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <sdbus-c++/IObject.h>

#include "mpris/PendingReplies.h"
#include "mpris/PlayerControls.h"
#include "mpris/PlayerModel.h"

namespace mpris {

/** The interface of the bus that controls playback. For the bus's thread. */
class PlayerInterface {
public:
    using Position = std::function<qnsmedia::Nanoseconds()>;

    /** Registers it with `object`, whose registration the caller finishes. */
    PlayerInterface(sdbus::IObject& object, PlayerControls& controls, Position position);

    /** Tells the bus what differs from what was shown before. */
    void show(const View& view);

    /** Tells the bus that playback goes on from there. */
    void tellJump(qnsmedia::Nanoseconds position);

private:
    void addMethods();
    void addSeeking();
    void addState();
    void addAbilities();
    void addLoop();
    void addRate();

    template<typename Get>
    void addConstant(const char* name, Get get);
    template<typename Get>
    void addProperty(const char* name, Get get);

    sdbus::IObject& mObject;
    PlayerControls& mControls;
    const Position mPosition;
    PendingReplies mReplies;
    View mView;
};

} // namespace mpris
