// SPDX-License-Identifier: MIT
#include "ptc/SocketRemoteReceiver.h"

#include "base/StandardOutput.h"
#include "ptc/Barrier.h"
#include "ptc/LoopbackSocket.h"
#include "ptc/SemaphoreWait.h"

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <new>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>
#include <utility>

using std::chrono::milliseconds;
using std::chrono::steady_clock;

namespace {

constexpr milliseconds kAcceptPause{500};
constexpr milliseconds kForever{-1};
constexpr int kBacklog = 10;

constexpr const char* kCreateFailed = "[Error]Socket Server create failed!";

ssize_t receiveSome(int socket, char* destination, std::size_t length) {
    ssize_t received;
    do
        received = ::recv(socket, destination, length, 0);
    while (received < 0 && errno == EINTR);
    return received;
}

/** Trying again at once would only burn time until something is released. */
bool isOutOfResources(int error) {
    return error == EMFILE || error == ENFILE || error == ENOBUFS || error == ENOMEM;
}

/** A packet's header and the copy of its payload, unless an event has taken that over. */
struct ReceivedPacket {
    explicit ReceivedPacket(const char* buffer) {
        std::memcpy(&header, buffer, sizeof(header));
        header.data = nullptr;
    }
    ~ReceivedPacket() { delete[] header.data; }
    ReceivedPacket(const ReceivedPacket&) = delete;
    ReceivedPacket& operator=(const ReceivedPacket&) = delete;

    PTC::EventPacket header;
};

} // namespace

SocketRemoteReceiver::SocketRemoteReceiver(long id) : SocketRemoteReceiver(id, qns::printLine) {}

SocketRemoteReceiver::SocketRemoteReceiver(long id, ErrorReporter report)
    : RemoteReceiver(id), mReport(std::move(report)) {}

SocketRemoteReceiver::~SocketRemoteReceiver() {
    mStopping = true;
    stopListener();
    stopReaders();
    // Here, not in the base: calls that are under way may still ask this object something.
    deleteReceivers();
}

bool SocketRemoteReceiver::initialize(long identity) {
    if (listenerThread.joinable())
        return false;
    RemoteReceiver::initialize(identity);
    const char* const failure = openServerSocket();
    const bool started = !failure && PTC::barrier([this] {
        listenerThread = boost::thread([this] { waitClientLink(); });
    });
    if (!started) {
        report(failure ? failure : kCreateFailed);
        serverSocket.reset();
    }
    return started;
}

void SocketRemoteReceiver::run() {}

int SocketRemoteReceiver::getLastClientSocket() const {
    return lastClientSocket;
}

bool SocketRemoteReceiver::isRecvDataFailed(int result) const {
    return result == -1 || result == 0;
}

bool SocketRemoteReceiver::sendACK(int socket) {
    ssize_t sent;
    do
        sent = ::send(socket, PTC::kAcknowledgement, sizeof(PTC::kAcknowledgement), MSG_NOSIGNAL);
    while (sent < 0 && errno == EINTR);
    return sent != -1 && sent != 0;
}

/** Null, or the line that tells what failed. */
const char* SocketRemoteReceiver::openServerSocket() {
    mWakeUp.reset(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK));
    serverSocket.reset(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, IPPROTO_TCP));
    const int server = serverSocket.get();
    if (!mWakeUp || !serverSocket)
        return kCreateFailed;
    if (PTC::setSocketOption(server, SOL_SOCKET, SO_REUSEADDR, 1) < 0)
        return "[Error]Socket Server reuse address failed!";
    if (PTC::setSocketOption(server, SOL_SOCKET, SO_RCVBUF, PTC::kReceiveBufferSize) < 0)
        return "[Error]Socket Server set Rec buffer failed!";
    const sockaddr_in address = PTC::loopbackAddress(getIdentity());
    if (::bind(server, reinterpret_cast<const sockaddr*>(&address), sizeof(address)) < 0)
        return kCreateFailed;
    if (::listen(server, kBacklog) < 0)
        return "[Error]create socket server listenner failed!";
    return nullptr;
}

void SocketRemoteReceiver::stopListener() {
    if (!listenerThread.joinable())
        return;
    ::shutdown(serverSocket.get(), SHUT_RDWR);
    wakeListener();
    listenerThread.join();
}

void SocketRemoteReceiver::stopReaders() {
    for (const Connection& connection : mConnections)
        ::shutdown(connection.socket.get(), SHUT_RDWR);
    for (Connection& connection : mConnections)
        connection.reader.join();
    mConnections.clear();
}

int SocketRemoteReceiver::waitClientLink() {
    const bool stopped = PTC::barrier([this] {
        while (!mStopping)
            acceptNext();
    });
    return stopped ? 0 : -1;
}

void SocketRemoteReceiver::acceptNext() {
    waitForWork(true, kForever);
    if (mStopping)
        return;
    const int client = ::accept4(serverSocket.get(), nullptr, nullptr, SOCK_CLOEXEC);
    if (client < 0)
        return handleFailedAccept(errno);
    PTC::disableDelay(client);
    addClientThread(client);
    pause(kAcceptPause);
}

void SocketRemoteReceiver::handleFailedAccept(int error) {
    const bool nobodyThere = error == EAGAIN || error == EINTR;
    if (nobodyThere || mStopping)
        return;
    report("[Error]bad client!");
    if (isOutOfResources(error))
        waitForWork(false, kAcceptPause);
}

void SocketRemoteReceiver::pause(milliseconds time) {
    const auto end = steady_clock::now() + time;
    for (auto left = time; left.count() > 0 && !mStopping;
         left = std::chrono::ceil<milliseconds>(end - steady_clock::now()))
        waitForWork(false, left);
}

/** Returns after a while, on a wake-up, or, where asked for, when a client waits. */
void SocketRemoteReceiver::waitForWork(bool alsoForClients, milliseconds time) {
    pollfd sources[] = {{mWakeUp.get(), POLLIN, 0}, {serverSocket.get(), POLLIN, 0}};
    ::poll(sources, alsoForClients ? 2 : 1, static_cast<int>(time.count()));
    // Reset before looking, so that what comes later wakes again.
    eventfd_t wakeUps;
    ::eventfd_read(mWakeUp.get(), &wakeUps);
    releaseEndedConnections();
}

void SocketRemoteReceiver::releaseEndedConnections() {
    for (auto connection = mConnections.begin(); connection != mConnections.end();) {
        if (!connection->ended) {
            ++connection;
            continue;
        }
        connection->reader.join();
        connection = mConnections.erase(connection);
    }
}

int SocketRemoteReceiver::addClientThread(int socket) {
    qns::UniqueFd accepted(socket);
    std::list<Connection> added;
    const bool started = PTC::barrier([&] {
        Connection& connection = added.emplace_back();
        connection.socket = std::move(accepted);
        lastClientSocket = socket;
        connection.reader = boost::thread([this, &connection] { readUntilEnd(connection); });
    });
    if (!started)
        return -1;
    mConnections.splice(mConnections.end(), added);
    // The pause after an accept leaves a reader time to take its socket, but does not prove it.
    PTC::waitThroughSignals(mSocketTaken);
    return 0;
}

void SocketRemoteReceiver::readUntilEnd(Connection& connection) {
    PTC::barrier([this] { ThreadMain(); });
    connection.ended = true;
    wakeListener();
}

int SocketRemoteReceiver::ThreadMain() {
    const int socket = lastClientSocket;
    mSocketTaken.post();
    const std::unique_ptr<char[]> buffer(new (std::nothrow) char[PTC::kPacketSize]());
    if (!buffer)
        return -1;
    while (readPacket(socket, buffer.get()))
        executePacket(buffer.get());
    return 0;
}

/** False when the connection has ended or the server stops. */
bool SocketRemoteReceiver::readPacket(int socket, char* buffer) {
    std::size_t got = 0;
    while (got < PTC::kPacketSize) {
        const auto received = receiveSome(socket, buffer + got, PTC::kPacketSize - got);
        if (isRecvDataFailed(static_cast<int>(received)) || mStopping)
            return false;
        if (sendACK(socket))
            got += static_cast<std::size_t>(received);
    }
    return true;
}

void SocketRemoteReceiver::executePacket(const char* buffer) {
    PTC::barrier([this, buffer] {
        ReceivedPacket packet(buffer);
        const long size = packet.header.size;
        if (size <= 0 || size > PTC::kMaxPayloadSize)
            return;
        packet.header.data = new char[static_cast<std::size_t>(size)];
        std::memcpy(packet.header.data, buffer + PTC::kPacketHeaderSize,
                    static_cast<std::size_t>(size));
        handleEventPacket(&packet.header);
    });
}

void SocketRemoteReceiver::wakeListener() {
    ::eventfd_write(mWakeUp.get(), 1);
}

void SocketRemoteReceiver::report(std::string_view line) {
    PTC::barrier([this, line] { mReport(line); });
}
