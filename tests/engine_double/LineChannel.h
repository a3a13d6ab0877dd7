// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <string_view>

#include "base/UniqueFd.h"

namespace script {

using Clock = std::chrono::steady_clock;

/** One end of a stream socket that carries lines. One thread sends, one receives. */
class LineChannel {
public:
    LineChannel() = default;
    explicit LineChannel(qns::UniqueFd socket) : mSocket(std::move(socket)) {}

    /** A channel to the unix socket at `path`; without a peer when nobody serves it. */
    static LineChannel connectTo(const std::string& path);

    /** The same for the path in an environment variable; closed when there is none. */
    static LineChannel connectToNamedBy(const char* variable);

    [[nodiscard]] bool isOpen() const { return static_cast<bool>(mSocket); }

    /** What cannot be sent any more is dropped. */
    void send(std::string_view line);

    /** The next line without its end; nothing when the peer has gone or the deadline passed. */
    std::optional<std::string> receive(Clock::time_point deadline = Clock::time_point::max());

    /** Sends a line and waits for the next one; empty when there is none, or no peer. */
    std::string ask(std::string_view line);

    /** Ends a receive() that waits, for good. */
    void shutDown();

private:
    bool fill(Clock::time_point deadline);

    qns::UniqueFd mSocket;
    std::string mReceived;
};

/** Waits until the descriptor can be read. False when the deadline has passed. */
bool waitReadable(int fd, Clock::time_point deadline);

} // namespace script
