// SPDX-License-Identifier: MIT
#pragma once

#include <sdbus-c++/IObject.h>
#include <string>
#include <vector>

namespace mpris {

/** The interface of the bus that says what the player is. For the bus's thread. */
class RootInterface {
public:
    /** Registers it with `object`, whose registration the caller finishes. */
    explicit RootInterface(sdbus::IObject& object);

    /** Tells the bus of which files the daemon can open, by the endings of their names. */
    void setExtensions(const std::vector<std::string>& extensions);

private:
    sdbus::IObject& mObject;
    std::vector<std::string> mMimeTypes;
};

} // namespace mpris
