// SPDX-License-Identifier: MIT
#include "LibMediaPlayer/InterfaceFactory.h"

#include <memory>
#include <string>

#include "tests/engine_double/ScriptedDiscoverer.h"
#include "tests/engine_double/ScriptedImporter.h"
#include "tests/engine_double/ScriptedPlayer.h"

namespace LibMediaPlayer {

namespace {

script::LineChannel connectToScript() {
    return script::LineChannel::connectToNamedBy("QNS_ENGINE_DOUBLE");
}

/** Asks the script whether there is to be a player. */
bool allowed(script::LineChannel& calls, const void* window, unsigned int flags) {
    return calls.ask(std::string("player create ") + (window ? "window " : "null ") +
                     std::to_string(flags)) != "null";
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
    return ScriptedImporter::create().release();
}

} // namespace LibMediaPlayer
