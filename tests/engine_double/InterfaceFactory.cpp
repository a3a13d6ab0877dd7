// SPDX-License-Identifier: MIT
#include "LibMediaPlayer/InterfaceFactory.h"

#include <cstdlib>
#include <memory>
#include <string>

#include "tests/engine_double/ScriptedDiscoverer.h"
#include "tests/engine_double/ScriptedPlayer.h"

namespace LibMediaPlayer {

namespace {

/** A connection to the script, or a closed channel when there is none. */
script::LineChannel connectToScript() {
    const char* const path = std::getenv("QNS_ENGINE_DOUBLE");
    return path ? script::LineChannel::connectTo(path) : script::LineChannel();
}

/** Asks the script whether there is to be a player. */
bool allowed(script::LineChannel& calls, const void* window, unsigned int flags) {
    if (!calls.isOpen())
        return true;
    calls.send(std::string("player create ") + (window ? "window " : "null ") +
               std::to_string(flags));
    return calls.receive() != "null";
}

} // namespace

IMediaPlayer* InterfaceFactory::createPlayer(void* window, unsigned int flags) {
    script::LineChannel calls = connectToScript();
    script::LineChannel orders = connectToScript();
    if (!allowed(calls, window, flags))
        return nullptr;
    return std::make_unique<ScriptedPlayer>(std::move(calls), std::move(orders)).release();
}

IMediaDiscoverer* InterfaceFactory::createDiscoverer() {
    return ScriptedDiscoverer::create().release();
}

IMediaImporter* InterfaceFactory::createImporter() {
    return nullptr;
}

} // namespace LibMediaPlayer
