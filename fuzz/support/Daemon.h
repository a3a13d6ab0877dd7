// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstddef>
#include <mutex>
#include <string>
#include <thread>

#include "base/UniqueFd.h"
#include "ptc/EventPacket.h"

namespace fuzz {

/**
 * What the client library takes for the daemon. It gives clients their ids and answers the status
 * requests of one client, so that one knows what has arrived; all else it leaves unanswered. Needs
 * the daemon's port for itself. Any thread may use it.
 */
class Daemon {
public:
    /** The objects of the clients that registered last. */
    enum ObjectKind { kPlayer, kPlayerNotify, kDiscoverer, kImporter, kImporterNotify, kKinds };

    Daemon();
    ~Daemon();
    Daemon(const Daemon&) = delete;
    Daemon& operator=(const Daemon&) = delete;

    [[nodiscard]] long object(std::size_t kind) const;

    /** Answers a status request of the player client with this id from now on. */
    void answerStatusOf(int clientId);

    /** Sends a packet to the process that connected last. */
    void send(const PTC::EventPacket& header, const std::string& payload);

private:
    void run();
    [[nodiscard]] bool read(int socket); ///< false when the client has gone
    void take(const char* packet);
    void registerObject(std::size_t kind, const PTC::EventPacket& header, const char* payload);
    void giveId(long object);
    void answerStatus(const PTC::EventPacket& header, const char* payload);

    qns::UniqueFd mListener;
    qns::UniqueFd mWakeUp;
    std::string mReceived; ///< the thread's own

    mutable std::recursive_mutex mMutex; ///< guards all below
    qns::UniqueFd mToClient;
    long mIdentity = 0;
    int mLastId = 0;
    int mAnsweredId = 0;
    long mAnsweredObject = 0;
    std::array<long, kKinds> mObjects{};

    std::thread mThread; ///< last: uses all of the above
};

} // namespace fuzz
