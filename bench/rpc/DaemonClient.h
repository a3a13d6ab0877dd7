// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

#include "bench/rpc/RpcClient.h"

namespace bench {

/** A registered client of the daemon's player. */
class DaemonClient {
public:
    /** Connects and registers under `identity`, 1000 to 1007. */
    explicit DaemonClient(long identity);

    [[nodiscard]] bool ready() const { return mClientId > 0; }
    [[nodiscard]] RpcClient& rpc() { return mClient; }

    /** Asks for the player's status. */
    [[nodiscard]] const Packet& statusRequest() const { return mStatusRequest; }

    /** Asks the player to open a file, which the bench's engine answers with a notification. */
    [[nodiscard]] const Packet& openRequest() const { return mOpenRequest; }

    /**
     * Opens a file, so that from then on status requests go on to the main thread and the
     * engine; before, the worker answers them.
     */
    bool openFile();

    /** One more object of this client, `object`, is told of what the player does. No answer. */
    bool listen(int object);

    /** When the engine was called for this status reply, in CLOCK_MONOTONIC nanoseconds. */
    static int64_t engineCallTime(const Packet& reply);

    /** Whether `packet` tells of a file's opening, and of nothing else. */
    static bool isOpenNotification(const Packet& packet);

    /** When the engine told this notification of an opening, in the same clock. */
    static int64_t notifyTime(const Packet& notification);

private:
    const long mIdentity;
    RpcClient mClient;
    int mClientId = 0;
    Packet mStatusRequest{};
    Packet mOpenRequest{};
};

} // namespace bench
