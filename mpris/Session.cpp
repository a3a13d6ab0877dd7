// SPDX-License-Identifier: MIT
#include "mpris/Session.h"

#include <sdbus-c++/Error.h>
#include <stdexcept>
#include <utility>

using namespace std::chrono_literals;

namespace mpris {
namespace {

constexpr const char* kBusName = "org.mpris.MediaPlayer2.qnsmedia";
constexpr const char* kNameTaken = "org.freedesktop.DBus.Error.FileExists";
constexpr const char* kObjectPath = "/org/mpris/MediaPlayer2";

/** How soon it is noticed that another client has closed the medium. */
constexpr auto kStatusTick = 1s;

} // namespace

Session::Session(EventLoop& loop, sdbus::IConnection& bus, const Options& options)
    : mBus(bus),
      mHandover(loop),
      mConnection(options.connection),
      mPlayer(mConnection),
      mControls(mPlayer, mModel, mHandover, [this] { show(); }),
      mpObject(sdbus::createObject(bus, kObjectPath)),
      mRoot(*mpObject),
      mInterface(*mpObject, mControls, [this] { return mModel.position(Clock::now()); }),
      mReader(mConnection, mHandover, options.pictures, listener()) {
    mPlayer.onNotification(mHandover.to<qnsmedia::PlayerNotification>(
        [this](const auto& notification) { notified(notification); }));
    mConnection.onLost(mHandover.to([] {})); // only ends the loop's wait
    askStatus();
    mpObject->finishRegistration();
    takeName();
}

Session::~Session() {
    try {
        mBus.releaseName(kBusName);
    } catch (const sdbus::Error&) {
        // Who has lost the bus has no name there.
    }
}

std::chrono::milliseconds Session::tick() {
    if (!mModel.isOpen())
        return kStatusTick;
    const auto now = Clock::now();
    if (now >= mNextStatus)
        askStatus();
    return std::chrono::ceil<std::chrono::milliseconds>(mNextStatus - now);
}

void Session::takeName() {
    try {
        mBus.requestName(kBusName);
    } catch (const sdbus::Error& error) {
        if (error.getName() != kNameTaken)
            throw;
        throw std::runtime_error("another process shows the player on the bus");
    }
}

TrackReader::Listener Session::listener() {
    return {[this](int track, TrackReader::Tags tags) {
                mModel.setTags(track, std::move(tags));
                show();
            },
            [this](int track, const std::string& path) {
                mModel.setPicture(track, path);
                show();
            },
            [this](const auto& extensions) { mRoot.setExtensions(extensions); }};
}

void Session::notified(const qnsmedia::PlayerNotification& notification) {
    const auto now = Clock::now();
    // For a moment the daemon does not know yet what it has just told.
    if (notification.kind == qnsmedia::NotificationKind::opened)
        mNextStatus = now + kStatusTick;
    jumped(mModel.take(notification, now));
}

/** An answer may go to another client that asks at the same time: the next will come. */
void Session::askStatus() {
    mNextStatus = Clock::now() + kStatusTick;
    mPlayer.status(mHandover.to<std::exception_ptr, qnsmedia::PlayerStatus>(
        [this, epoch = mModel.epoch()](const auto& error, const auto& status) {
            if (!error)
                jumped(mModel.take(status, epoch, Clock::now()));
        }));
}

void Session::jumped(std::optional<qnsmedia::Nanoseconds> position) {
    show();
    if (position)
        mInterface.tellJump(*position);
}

void Session::show() {
    mInterface.show(mModel.view());
    const Track& track = mModel.track();
    if (track.number != 0 && std::exchange(mReadTrack, track.number) != track.number)
        mReader.read(track);
}

} // namespace mpris
