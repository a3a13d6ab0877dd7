// SPDX-License-Identifier: MIT
#include "mpris/RootInterface.h"

#include <sdbus-c++/sdbus-c++.h>

#include "mpris/MimeTypes.h"

namespace mpris {
namespace {

constexpr const char* kInterface = "org.mpris.MediaPlayer2";

template<typename Value>
void addConstant(sdbus::IObject& object, const char* name, Value value) {
    object.registerProperty(name)
        .onInterface(kInterface)
        .withGetter([value] { return value; })
        .withUpdateBehavior(sdbus::Flags::CONST_PROPERTY_VALUE);
}

} // namespace

RootInterface::RootInterface(sdbus::IObject& object) : mObject(object) {
    // The daemon serves others too, and has no window of its own to raise.
    for (const char* const absent : {"Raise", "Quit"})
        object.registerMethod(absent).onInterface(kInterface).implementedAs([] {});
    addConstant(object, "CanRaise", false);
    addConstant(object, "CanQuit", false);
    addConstant(object, "HasTrackList", false);
    addConstant(object, "Identity", std::string("QNSMediaService"));
    addConstant(object, "SupportedUriSchemes", std::vector<std::string>{"file", "http", "https"});
    object.registerProperty("SupportedMimeTypes").onInterface(kInterface).withGetter([this] {
        return mMimeTypes;
    });
}

void RootInterface::setExtensions(const std::vector<std::string>& extensions) {
    mMimeTypes = mimeTypesOf(extensions);
    mObject.emitPropertiesChangedSignal(kInterface, {"SupportedMimeTypes"});
}

} // namespace mpris
