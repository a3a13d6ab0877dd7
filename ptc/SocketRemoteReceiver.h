// SPDX-License-Identifier: MIT
#pragma once

#include "base/UniqueFd.h"
#include "ptc/EventPacket.h"
#include "ptc/RemoteReceiver.h"

#include <boost/interprocess/sync/interprocess_semaphore.hpp>
#include <boost/thread/thread.hpp>

#include <atomic>
#include <chrono>
#include <functional>
#include <list>
#include <string_view>

/**
 * The server of the transport: listens on 127.0.0.1, acknowledges what it reads, and hands every
 * complete packet to the receiver that the packet names.
 *
 * Threads: one listener, and one reader per connection. A connection's resources are released by
 * the listener as soon as its reader has ended. The destructor stops and joins them all, and
 * deletes the receivers after that; it must not run on one of those threads.
 *
 * initialize() belongs to the thread that owns the server. The operations that say whose they
 * are belong to the server's own threads. The rest may be called by any.
 */
class SocketRemoteReceiver : public PTC::RemoteReceiver {
public:
    using ErrorReporter = std::function<void(std::string_view line)>;

    /** Errors go to standard output. */
    explicit SocketRemoteReceiver(long id);
    /** Errors go to `report`, which several threads may call. */
    SocketRemoteReceiver(long id, ErrorReporter report);
    ~SocketRemoteReceiver() override;

    /**
     * Binds port `identity` and starts listening. Add the receivers before.
     * False when that fails, after one reported line, or when the server runs already.
     */
    bool initialize(long identity) override;
    /** Does nothing: initialize() starts the server. */
    void run() override;

    /** Descriptor of the connection accepted last, -1 at first. */
    [[nodiscard]] int getLastClientSocket() const;
    /** Whether a read with this result, -1 or 0, was the last of its connection. */
    [[nodiscard]] bool isRecvDataFailed(int result) const;
    /** True when the acknowledgement was sent. */
    bool sendACK(int socket);

    /** The listener's loop. 0 when the server stops, -1 when the loop cannot go on. */
    int waitClientLink();
    /** The listener's: starts a reader for `socket`, which it takes over. 0, or -1 on failure. */
    int addClientThread(int socket);

    /** A reader's loop, on the connection accepted last. 0 at its end, -1 without memory. */
    int ThreadMain();

    /**
     * Delivers the event of one complete packet of kPacketSize bytes. A packet without payload,
     * with one larger than fits, or for a receiver that is not there is ignored.
     */
    void executePacket(const char* buffer);

private:
    /** One accepted client. Its descriptor is open until its reader has been joined. */
    struct Connection {
        qns::UniqueFd socket;
        std::atomic<bool> ended{false}; ///< set by the reader as the last thing
        boost::thread reader;
    };

    [[nodiscard]] const char* openServerSocket();
    void stopListener();
    void stopReaders();

    void acceptNext();
    void handleFailedAccept(int error);
    void pause(std::chrono::milliseconds time);
    void waitForWork(bool alsoForClients, std::chrono::milliseconds time);
    void releaseEndedConnections();

    void readUntilEnd(Connection& connection);
    [[nodiscard]] bool readPacket(int socket, char* buffer);
    void wakeListener();
    void report(std::string_view line);

    const ErrorReporter mReport;
    qns::UniqueFd serverSocket;
    qns::UniqueFd mWakeUp; ///< eventfd that wakes the listener: stop, or a reader has ended
    std::atomic<bool> mStopping{false};
    std::atomic<int> lastClientSocket{-1};
    boost::interprocess::interprocess_semaphore mSocketTaken{0}; ///< by the newest reader
    std::list<Connection> mConnections; ///< the listener's; the destructor's once that has ended
    boost::thread listenerThread;
};
