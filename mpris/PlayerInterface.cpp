// SPDX-License-Identifier: MIT
#include "mpris/PlayerInterface.h"

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <sdbus-c++/sdbus-c++.h>
#include <string>
#include <utility>
#include <vector>

#include "mpris/MetadataMap.h"

using qnsmedia::Nanoseconds;

namespace mpris {
namespace {

constexpr const char* kInterface = "org.mpris.MediaPlayer2.Player";
constexpr const char* kInvalidArgs = "org.freedesktop.DBus.Error.InvalidArgs";

/** The bus counts microseconds. */
std::int64_t busTime(Nanoseconds time) {
    return std::chrono::duration_cast<std::chrono::microseconds>(time).count();
}

/** A time that is too long for us is longer than any medium. */
Nanoseconds ourTime(std::int64_t microseconds) {
    constexpr std::int64_t kMost =
        std::chrono::duration_cast<std::chrono::microseconds>(Nanoseconds::max()).count();
    return std::chrono::microseconds(std::clamp(microseconds, -kMost, kMost));
}

std::string nameOf(PlaybackStatus status) {
    switch (status) {
    case PlaybackStatus::playing:
        return "Playing";
    case PlaybackStatus::paused:
        return "Paused";
    case PlaybackStatus::stopped:
        break;
    }
    return "Stopped";
}

bool loopOf(const std::string& name) {
    if (name != "None" && name != "Track")
        throw sdbus::Error(kInvalidArgs, "the loop is None or Track");
    return name == "Track";
}

struct Watched {
    const char* property;
    bool (*differs)(const View& one, const View& other);
};

template<auto field>
bool differs(const View& one, const View& other) {
    return !(one.*field == other.*field);
}

constexpr Watched kWatched[] = {
    {"PlaybackStatus", differs<&View::playback>}, {"LoopStatus", differs<&View::loops>},
    {"CanPlay", differs<&View::canPlay>},         {"CanPause", differs<&View::canPause>},
    {"CanSeek", differs<&View::canSeek>},         {"Metadata", differs<&View::track>},
};

void ignore(std::exception_ptr) {}

} // namespace

PlayerInterface::PlayerInterface(sdbus::IObject& object, PlayerControls& controls,
                                 Position position)
    : mObject(object), mControls(controls), mPosition(std::move(position)) {
    addMethods();
    addSeeking();
    addState();
    addAbilities();
    addLoop();
    addRate();
}

void PlayerInterface::show(const View& view) {
    std::vector<std::string> changed;
    for (const Watched& watched : kWatched)
        if (watched.differs(mView, view))
            changed.emplace_back(watched.property);
    mView = view;
    if (!changed.empty())
        mObject.emitPropertiesChangedSignal(kInterface, changed);
}

void PlayerInterface::tellJump(Nanoseconds position) {
    mObject.emitSignal("Seeked").onInterface(kInterface).withArguments(busTime(position));
}

void PlayerInterface::addMethods() {
    struct Method {
        const char* name;
        void (PlayerControls::*call)(Reply);
    };
    constexpr Method kMethods[] = {
        {"Play", &PlayerControls::play},
        {"Pause", &PlayerControls::pause},
        {"PlayPause", &PlayerControls::playPause},
        {"Stop", &PlayerControls::stop},
    };
    for (const Method& method : kMethods)
        mObject.registerMethod(method.name)
            .onInterface(kInterface)
            .implementedAs([this, call = method.call](sdbus::Result<>&& result) {
                (mControls.*call)(mReplies.add(std::move(result)));
            });
    for (const char* const absent : {"Next", "Previous"})
        mObject.registerMethod(absent).onInterface(kInterface).implementedAs([] {});
    mObject.registerMethod("OpenUri")
        .onInterface(kInterface)
        .withInputParamNames("Uri")
        .implementedAs([this](sdbus::Result<>&& result, const std::string& uri) {
            mControls.openUri(uri, mReplies.add(std::move(result)));
        });
}

void PlayerInterface::addSeeking() {
    mObject.registerMethod("Seek")
        .onInterface(kInterface)
        .withInputParamNames("Offset")
        .implementedAs([this](sdbus::Result<>&& result, std::int64_t offset) {
            mControls.seek(ourTime(offset), mReplies.add(std::move(result)));
        });
    mObject.registerMethod("SetPosition")
        .onInterface(kInterface)
        .withInputParamNames("TrackId", "Position")
        .implementedAs([this](sdbus::Result<>&& result, const sdbus::ObjectPath& track,
                              std::int64_t position) {
            mControls.setPosition(track, ourTime(position), mReplies.add(std::move(result)));
        });
    mObject.registerSignal("Seeked")
        .onInterface(kInterface)
        .withParameters<std::int64_t>("Position");
    mObject.registerProperty("Position")
        .onInterface(kInterface)
        .withGetter([this] { return busTime(mPosition()); })
        .withUpdateBehavior(sdbus::Flags::EMITS_NO_SIGNAL);
}

void PlayerInterface::addState() {
    addProperty("PlaybackStatus", [this] { return nameOf(mView.playback); });
    addProperty("Metadata", [this] { return metadataOf(mView.track); });
}

void PlayerInterface::addAbilities() {
    addProperty("CanPlay", [this] { return mView.canPlay; });
    addProperty("CanPause", [this] { return mView.canPause; });
    addProperty("CanSeek", [this] { return mView.canSeek; });
    addConstant("CanGoNext", [] { return false; });
    addConstant("CanGoPrevious", [] { return false; });
    addConstant("CanControl", [] { return true; });
}

void PlayerInterface::addLoop() {
    mObject.registerProperty("LoopStatus")
        .onInterface(kInterface)
        .withGetter([this] { return std::string(mView.loops ? "Track" : "None"); })
        .withSetter([this](const std::string& name) { mControls.setLoop(loopOf(name), ignore); });
}

/** There is one rate; setting it to nothing is another way to pause. */
void PlayerInterface::addRate() {
    addConstant("MinimumRate", [] { return 1.0; });
    addConstant("MaximumRate", [] { return 1.0; });
    addConstant("Volume", [] { return 1.0; });
    mObject.registerProperty("Rate")
        .onInterface(kInterface)
        .withGetter([] { return 1.0; })
        .withSetter([this](double rate) {
            if (rate == 0.0)
                mControls.pause(ignore);
        });
}

template<typename Get>
void PlayerInterface::addConstant(const char* name, Get get) {
    mObject.registerProperty(name)
        .onInterface(kInterface)
        .withGetter(get)
        .withUpdateBehavior(sdbus::Flags::CONST_PROPERTY_VALUE);
}

template<typename Get>
void PlayerInterface::addProperty(const char* name, Get get) {
    mObject.registerProperty(name).onInterface(kInterface).withGetter(get);
}

} // namespace mpris
