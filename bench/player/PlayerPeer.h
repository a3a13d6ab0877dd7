// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <memory>
#include <string>
#include <vector>

namespace bench {

using Milliseconds = std::chrono::duration<double, std::milli>;
using Position = std::chrono::nanoseconds;

/**
 * A player in this process, without devices. Every operation waits until the player says that it
 * is done, throws std::runtime_error when that does not come, and returns how long it took.
 */
class PlayerPeer {
public:
    virtual ~PlayerPeer() = default;

    /** Until the first picture or sound could be put out; paused. */
    virtual Milliseconds open(const std::string& path) = 0;

    /** While paused, until the picture or sound there could be put out. */
    virtual Milliseconds seek(Position position, bool isExact) = 0;

    virtual Milliseconds close() = 0;

    /** Plays from `start` to `end` again and again: how long each round took. */
    virtual std::vector<Milliseconds> loop(Position start, Position end, int rounds) = 0;
};

std::unique_ptr<PlayerPeer> makeEnginePeer();
std::unique_ptr<PlayerPeer> makeMpvPeer();

} // namespace bench
