// SPDX-License-Identifier: MIT
#include "mpris/PlayerControls.h"

#include <utility>

#include "mpris/FileUri.h"
#include "mpris/InvalidArgument.h"
#include "mpris/MetadataMap.h"

using qnsmedia::Nanoseconds;

namespace mpris {
namespace {

/** What the daemon opens. A file's URI is resolved here, so that its tags can be read too. */
std::string mediumOf(const std::string& uri) {
    if (isFileUri(uri)) {
        if (auto path = filePath(uri))
            return *path;
    } else if (isUri(uri) || uri.substr(0, 1) == "/") {
        return uri;
    }
    throw InvalidArgument("not a URI of a medium: " + uri);
}

} // namespace

PlayerControls::PlayerControls(qnsmedia::Player& player, PlayerModel& model,
                               const Handover& handover, std::function<void()> changed)
    : mPlayer(player), mModel(model), mHandover(handover), mChanged(std::move(changed)) {}

void PlayerControls::play(Reply reply) {
    if (mModel.isOpen())
        mPlayer.play(tell(std::move(reply)));
    else if (const std::string& path = mModel.track().path; !path.empty())
        openAndPlay(path, std::move(reply));
    else
        reply(nullptr);
}

void PlayerControls::pause(Reply reply) {
    if (!mModel.isOpen())
        return reply(nullptr);
    mPlayer.pause(tell(std::move(reply)));
}

void PlayerControls::playPause(Reply reply) {
    if (mModel.view().playback == PlaybackStatus::playing)
        pause(std::move(reply));
    else
        play(std::move(reply));
}

void PlayerControls::stop(Reply reply) {
    if (!mModel.isOpen())
        return reply(nullptr);
    mPlayer.close(tell([this, reply = std::move(reply)](std::exception_ptr error) {
        stopped(error);
        reply(error);
    }));
}

void PlayerControls::seek(Nanoseconds distance, Reply reply) {
    if (!mModel.view().canSeek)
        return reply(nullptr);
    mPlayer.seek(distance, qnsmedia::SeekMode::relative, tell(std::move(reply)));
}

void PlayerControls::setPosition(const std::string& trackId, Nanoseconds position, Reply reply) {
    const Track& track = mModel.track();
    const bool isInside = position >= Nanoseconds::zero() &&
                          (position <= track.duration || track.duration == Nanoseconds::zero());
    if (!mModel.view().canSeek || trackId != mpris::trackId(track.number) || !isInside)
        return reply(nullptr);
    mPlayer.seek(position, qnsmedia::SeekMode::accurate, tell(std::move(reply)));
}

void PlayerControls::openUri(const std::string& uri, Reply reply) {
    try {
        openAndPlay(mediumOf(uri), reply);
    } catch (const InvalidArgument&) {
        reply(std::current_exception());
    }
}

void PlayerControls::setLoop(bool loops, Reply reply) {
    if (!mModel.isOpen())
        return reply(nullptr);
    const auto answered = [this, loops, reply = std::move(reply)](std::exception_ptr error) {
        if (!error) {
            mModel.setLoop(loops && mModel.isOpen());
            mChanged();
        }
        reply(error);
    };
    if (loops)
        mPlayer.repeat(Nanoseconds::zero(), Nanoseconds(-1), tell(answered));
    else
        mPlayer.noRepeat(tell(answered));
}

void PlayerControls::openAndPlay(const std::string& path, Reply reply) {
    const auto opened = [this, reply = std::move(reply)](std::exception_ptr error) {
        if (error)
            reply(error);
        else
            mPlayer.play(tell(reply));
    };
    mPlayer.openMedia(path, [told = tell(opened)](std::exception_ptr error,
                                                  const qnsmedia::MediaInfo&) { told(error); });
}

void PlayerControls::stopped(std::exception_ptr error) {
    if (error)
        return;
    mModel.stopped();
    mChanged();
}

qnsmedia::Player::Callback PlayerControls::tell(Reply reply) const {
    return mHandover.to<std::exception_ptr>(std::move(reply));
}

} // namespace mpris
