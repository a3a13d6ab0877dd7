// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <cstddef>
#include <list>
#include <optional>
#include <string_view>

#include "base/UniqueFd.h"
#include "tests/daemon/support/Patience.h"
#include "tests/daemon/support/WireFormat.h"

constexpr long kDaemonPort = 1008;

/** A socket that listens on 127.0.0.1. Fails the test when the port is taken. */
qns::UniqueFd listenOn(long port);

/** A connection to the port on 127.0.0.1 that need not come about; nobody waits for it. */
qns::UniqueFd startConnecting(long port);

/** A connection to the daemon, as soon as it listens. A positive `receiveBuffer` is set before. */
qns::UniqueFd connectToDaemon(int receiveBuffer = 0);

/**
 * A client process's end of the transport: listens on the port that is its identity, connects
 * to the daemon, sends packets in any shape and counts what is acknowledged. For one thread;
 * what the daemon sends is read in receive() only. After it has waited in vain once, it does not
 * wait again: the test has failed and is to end.
 */
class WireClient {
public:
    /** Starts to listen. */
    explicit WireClient(long identity);

    [[nodiscard]] long identity() const { return mIdentity; }

    /** Stops listening and leaves the connections that the daemon made. */
    void stopListening();
    void startListening();

    /** Connects to the daemon, as soon as it listens. A positive `receiveBuffer` is set before. */
    void connect(int receiveBuffer = 0);
    void disconnect();

    /** From now on the daemon may end: what it does not take any more is no failure. Any thread. */
    void expectEnd() { mMayEnd = true; }

    /** Writes all of it; the client must be connected. */
    void sendBytes(std::string_view bytes);
    void send(const wire::Packet& packet) { sendBytes(wire::toBytes(packet)); }

    /**
     * Writes as much of it as the daemon takes; waits at most that long for it to take more.
     * Returns how much was written.
     */
    std::size_t sendSome(std::string_view bytes, std::chrono::milliseconds wait);

    /** Waits until `count` acknowledgements have come on this connection in all. */
    bool waitForAcknowledgements(std::size_t count);
    [[nodiscard]] std::size_t acknowledgements() const { return mAcknowledged / 3; }

    /** True when the daemon closes the connection. */
    bool waitForHangUp();

    /** The next packet for this client; nothing when none comes. */
    std::optional<wire::Packet> receive();

    /** The next packet as it stands in its 20480 bytes; empty when none comes. */
    wire::Bytes receiveBytes();

    /** From now on what the client receives is not acknowledged. */
    void stopAcknowledging() { mAcknowledges = false; }

    /** How often the daemon has connected since startListening(), as far as receive() saw. */
    [[nodiscard]] std::size_t connectionCount() const { return mConnectionCount; }

private:
    struct Incoming {
        qns::UniqueFd socket;
        wire::Bytes received;
        bool ended = false;
    };

    [[nodiscard]] patience::Clock::time_point deadline() const;
    bool readAcknowledgements(patience::Clock::time_point deadline);
    [[nodiscard]] bool isHungUp() const;
    bool waitForInput(patience::Clock::time_point deadline);
    std::optional<wire::Bytes> takePacket();
    void acceptConnection();
    void readFrom(Incoming& incoming) const;

    long mIdentity;
    bool mAcknowledges = true;
    bool mWaitedInVain = false;
    std::atomic<bool> mMayEnd{false};
    bool mBroken = false; ///< the connection to the daemon
    qns::UniqueFd mListener;
    qns::UniqueFd mConnection;
    std::size_t mAcknowledged = 0; ///< bytes
    std::list<Incoming> mIncoming;
    std::size_t mConnectionCount = 0;
};
