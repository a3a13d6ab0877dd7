// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>

#include "mpris/Handover.h"
#include "mpris/PlayerModel.h"
#include "qnsmedia/Player.h"

namespace mpris {

/**
 * What desktops ask for, as requests to the daemon. What makes no sense at the moment is done
 * without an effect, as the buttons of a desktop expect. Each reply is called once, unless the
 * handover goes before. For the loop's thread.
 */
class PlayerControls {
public:
    /** `changed` is called when an answer has changed the model. */
    PlayerControls(qnsmedia::Player& player, PlayerModel& model, const Handover& handover,
                   std::function<void()> changed);

    void play(Reply reply);
    void pause(Reply reply);
    void playPause(Reply reply);

    /** Closes the medium: sound, picture and decoders are free. Playing opens it again. */
    void stop(Reply reply);

    /** By that far. */
    void seek(qnsmedia::Nanoseconds distance, Reply reply);

    /** To a position inside the track, if that is still the one that is there. */
    void setPosition(const std::string& trackId, qnsmedia::Nanoseconds position, Reply reply);

    /** Opens a URI, or an absolute path, and plays it. */
    void openUri(const std::string& uri, Reply reply);

    /** Repeats the open medium as a whole, or ends any loop. */
    void setLoop(bool loops, Reply reply);

private:
    void openAndPlay(const std::string& path, Reply reply);
    void stopped(std::exception_ptr error);
    [[nodiscard]] qnsmedia::Player::Callback tell(Reply reply) const;

    qnsmedia::Player& mPlayer;
    PlayerModel& mModel;
    const Handover& mHandover;
    const std::function<void()> mChanged;
};

} // namespace mpris
