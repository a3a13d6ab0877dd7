// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>

#include "tests/daemon/support/Life.h"

/** A client of all three services that does one thing after the other, and waits for its end. */
class MediaClient {
public:
    /** Connects and registers. */
    explicit MediaClient(long identity);

    /** Opens the film and starts it. The result of the open, as the engine notifies it. */
    std::int64_t play(const std::string& film);

    /** The result of an import, as the engine notifies it. */
    std::int64_t import(const std::string& file, const std::string& folder = "");

    /** What the engine answers to an open, or to the description if the open went well. */
    std::int64_t describe(const std::string& film);

    /** What the engine answers to that, or to a picture. */
    std::int64_t draw(const std::string& film, const std::string& picture);

private:
    /** The next packet with this object and method; others before it are passed over. */
    wire::Bytes awaitPayload(const wire::Packet& like);

    /** The result of the next notification of that kind. */
    std::int64_t awaitResult(const WireService& service, std::int64_t kind);

    std::int64_t open(const std::string& film);

    Life mLife;
    wire::Bytes mPlayer;
    wire::Bytes mImporter;
    wire::Bytes mDiscoverer;
};
