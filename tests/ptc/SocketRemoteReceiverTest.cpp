// SPDX-License-Identifier: MIT
#include "ptc/SocketRemoteReceiver.h"

#include "ptc/LoopbackSocket.h"
#include "tests/ptc/Eventually.h"
#include "tests/ptc/FailingCalls.h"
#include "tests/ptc/Gate.h"
#include "tests/ptc/Inbox.h"
#include "tests/ptc/Peer.h"
#include "tests/ptc/ProcessState.h"
#include "tests/ptc/TestAdapter.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <fcntl.h>
#include <filesystem>
#include <limits>
#include <memory>
#include <mutex>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <random>
#include <stdexcept>
#include <string>
#include <sys/socket.h>
#include <thread>
#include <vector>

using std::chrono::steady_clock;
using namespace std::chrono_literals;

namespace {

constexpr int kPort = 1008;
constexpr long kReceiverId = 8;

/** The lines that a server reports. */
class LineLog {
public:
    void add(std::string_view line) {
        const std::lock_guard<std::mutex> lock(mMutex);
        mLines.emplace_back(line);
    }
    std::vector<std::string> lines() {
        const std::lock_guard<std::mutex> lock(mMutex);
        return mLines;
    }

private:
    std::mutex mMutex; ///< guards `mLines`
    std::vector<std::string> mLines;
};

/** A running server, and the receiver behind it. */
class SocketServer : public testing::Test {
protected:
    SocketServer() {
        mServer->addReceiver(mpInbox);
        EXPECT_TRUE(mServer->initialize(kPort));
    }

    std::vector<std::string> lines() { return mLog.lines(); }

    LineLog mLog;
    Inbox* mpInbox = new Inbox(kReceiverId); ///< owned by the server
    std::unique_ptr<SocketRemoteReceiver> mServer = std::make_unique<SocketRemoteReceiver>(
        0, [log = &mLog](std::string_view line) { log->add(line); });
};

/** Writes single bytes, and reads nothing, until the server's reader has stopped reading. */
void writeUntilReaderIsStuck(const Peer& peer) {
    const char byte = 0;
    pollfd writable{peer.socket(), POLLOUT, 0};
    while (::poll(&writable, 1, 300) == 1 &&
           ::send(peer.socket(), &byte, 1, MSG_NOSIGNAL | MSG_DONTWAIT) == 1) {
    }
}

/** This process's listening socket, or -1. */
int listeningSocket() {
    for (const auto& entry : std::filesystem::directory_iterator("/proc/self/fd")) {
        const int descriptor = std::stoi(entry.path().filename());
        int listens = 0;
        socklen_t length = sizeof(listens);
        if (getsockopt(descriptor, SOL_SOCKET, SO_ACCEPTCONN, &listens, &length) == 0 && listens)
            return descriptor;
    }
    return -1;
}

int optionOf(int socket, int option) {
    int value = -1;
    socklen_t length = sizeof(value);
    EXPECT_EQ(getsockopt(socket, SOL_SOCKET, option, &value, &length), 0);
    return value;
}

/** The lines that a server reports that cannot start. */
std::vector<std::string> linesOfAFailedStart() {
    LineLog log;
    SocketRemoteReceiver server(0, [&log](std::string_view line) { log.add(line); });
    EXPECT_FALSE(server.initialize(kPort));
    EXPECT_EQ(listeningSocket(), -1);
    return log.lines();
}

/** How long the call took. */
template<typename Call>
steady_clock::duration timeOf(Call&& call) {
    const auto start = steady_clock::now();
    call();
    return steady_clock::now() - start;
}

} // namespace

TEST_F(SocketServer, AcknowledgesAPacketOnceAndDeliversIt) {
    auto peer = connectedPeer(kPort);
    ASSERT_TRUE(peer.writeAcknowledged(packetBytes(kReceiverId, 4, "payload")));
    const auto messages = mpInbox->waitFor(1);
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_EQ(messages[0].objectId, 62);
    EXPECT_EQ(messages[0].methodId, 4);
    EXPECT_EQ(messages[0].payload, "payload");
    EXPECT_FALSE(messages[0].isCallback);
    EXPECT_TRUE(messages[0].isRemote);
}

TEST_F(SocketServer, APacketInTwoPiecesIsAcknowledgedTwiceAndDeliveredOnce) {
    auto peer = connectedPeer(kPort);
    const auto bytes = packetBytes(kReceiverId, 4, "payload");
    ASSERT_TRUE(peer.writeAcknowledged(bytes.substr(0, 10240)));
    ASSERT_TRUE(peer.writeAcknowledged(bytes.substr(10240)));
    peer.endWriting();
    EXPECT_EQ(peer.readAll(), "");
    EXPECT_EQ(mpInbox->waitFor(1).size(), 1u);
}

TEST_F(SocketServer, SmallPiecesAreNotHeldUp) {
    constexpr int kPieces = 4000;
    constexpr auto kDelayedAnswer = 40ms;
    auto peer = connectedPeer(kPort);
    const auto bytes = packetBytes(kReceiverId, 4, "payload");
    const auto time = timeOf([&] {
        for (std::size_t piece = 0; piece < kPieces; ++piece)
            ASSERT_TRUE(peer.writeAcknowledged(bytes.substr(piece, 1)));
    });
    ASSERT_TRUE(peer.writeAcknowledged(bytes.substr(kPieces)));
    EXPECT_EQ(mpInbox->waitFor(1).at(0).payload, "payload");
    EXPECT_LT(time, kPieces * kDelayedAnswer / 4);
}

TEST_F(SocketServer, AcknowledgementsInARowAreNotHeldUp) {
    constexpr int kRounds = 200;
    constexpr auto kDelayedAnswer = 40ms;
    auto peer = connectedPeer(kPort);
    const auto bytes = packetBytes(kReceiverId, 4, "payload");
    const auto time = timeOf([&] {
        for (int round = 0; round < kRounds; ++round) {
            ASSERT_TRUE(peer.write(bytes + bytes + bytes));
            for (int packet = 0; packet < 3; ++packet)
                ASSERT_TRUE(peer.isAcknowledged());
        }
    });
    EXPECT_LT(time, kRounds * kDelayedAnswer / 4);
}

TEST_F(SocketServer, SetsItsConnectionsUp) {
    auto peer = connectedPeer(kPort);
    ASSERT_TRUE(peer.writeAcknowledged("x"));
    const int accepted = mServer->getLastClientSocket();
    ASSERT_GE(accepted, 0);
    int noDelay = 0;
    int bufferSize = 0;
    socklen_t length = sizeof(int);
    ASSERT_EQ(getsockopt(accepted, IPPROTO_TCP, TCP_NODELAY, &noDelay, &length), 0);
    ASSERT_EQ(getsockopt(accepted, SOL_SOCKET, SO_RCVBUF, &bufferSize, &length), 0);
    EXPECT_NE(noDelay, 0);
    EXPECT_EQ(bufferSize, 2 * 122880) << "the kernel doubles what is asked for";
    EXPECT_TRUE(fcntl(accepted, F_GETFD) & FD_CLOEXEC);
    EXPECT_FALSE(fcntl(accepted, F_GETFL) & O_NONBLOCK);
}

TEST_F(SocketServer, ListensOnLoopbackAloneWithRoomForTenClients) {
    const int socket = listeningSocket();
    ASSERT_GE(socket, 0);
    sockaddr_in address{};
    socklen_t length = sizeof(address);
    ASSERT_EQ(getsockname(socket, reinterpret_cast<sockaddr*>(&address), &length), 0);
    EXPECT_EQ(address.sin_addr.s_addr, htonl(INADDR_LOOPBACK));
    EXPECT_EQ(address.sin_port, htons(kPort));
    EXPECT_EQ(optionOf(socket, SO_TYPE), SOCK_STREAM);
    EXPECT_EQ(optionOf(socket, SO_PROTOCOL), IPPROTO_TCP);
    EXPECT_EQ(optionOf(socket, SO_REUSEADDR), 1);
    EXPECT_EQ(optionOf(socket, SO_RCVBUF), 2 * 122880) << "the kernel doubles what is asked for";
    tcp_info info{};
    length = sizeof(info);
    ASSERT_EQ(getsockopt(socket, IPPROTO_TCP, TCP_INFO, &info, &length), 0);
    EXPECT_EQ(info.tcpi_sacked, 10u) << "where the kernel tells a listening socket's backlog";
    EXPECT_TRUE(fcntl(socket, F_GETFD) & FD_CLOEXEC);
}

TEST_F(SocketServer, DeliversTheLargestPayload) {
    std::string payload(PTC::kMaxPayloadSize, 'a');
    payload.front() = 'f';
    payload.back() = 'b';
    auto peer = connectedPeer(kPort);
    ASSERT_TRUE(peer.write(packetBytes(kReceiverId, 4, payload)));
    EXPECT_EQ(mpInbox->waitFor(1).at(0).payload, payload);
}

TEST_F(SocketServer, CountsOnlyTheBytesThatItCouldAcknowledge) {
    auto peer = connectedPeer(kPort);
    const auto bytes = packetBytes(kReceiverId, 4, "payload");
    ASSERT_TRUE(peer.writeAcknowledged(bytes.substr(0, 100)));
    for (const std::size_t lost : {1, 5000, 20000}) {
        failing_calls::failAcknowledgements(1);
        ASSERT_TRUE(peer.write(std::string(lost, 'x')));
        ASSERT_TRUE(eventually([] { return failing_calls::acknowledgementsToFail() == 0; }));
    }
    ASSERT_TRUE(peer.writeAcknowledged(bytes.substr(100)));
    const auto messages = mpInbox->waitFor(1);
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_EQ(messages[0].payload, "payload");
}

TEST_F(SocketServer, IgnoresPacketsOfWrongSizeButAcknowledgesThem) {
    auto peer = connectedPeer(kPort);
    for (const long size : {0L, -1L, PTC::kMaxPayloadSize + 1, 1L << 32, (1L << 32) + 7,
                            std::numeric_limits<long>::min(), std::numeric_limits<long>::max()})
        ASSERT_TRUE(peer.writeAcknowledged(packetBytes(kReceiverId, 4, "wrong", size)));
    ASSERT_TRUE(peer.writeAcknowledged(packetBytes(kReceiverId, 5, "right")));
    const auto messages = mpInbox->waitFor(1);
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_EQ(messages[0].payload, "right");
}

TEST_F(SocketServer, DropsPacketsForUnknownReceiversButAcknowledgesThem) {
    auto peer = connectedPeer(kPort);
    for (const long receiver : {3L, 0L, -8L, (1L << 32) + kReceiverId})
        ASSERT_TRUE(peer.writeAcknowledged(packetBytes(receiver, 4, "stray")));
    ASSERT_TRUE(peer.writeAcknowledged(packetBytes(kReceiverId, 5, "right")));
    const auto messages = mpInbox->waitFor(1);
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_EQ(messages[0].payload, "right");
    EXPECT_TRUE(lines().empty());
}

TEST_F(SocketServer, ReadsAFlagFromItsFirstByteAlone) {
    auto bytes = packetBytes(kReceiverId, 4, "x");
    bytes[32] = '\x80';
    bytes[48] = '\0';
    std::fill(bytes.begin() + 33, bytes.begin() + 40, '\xFF');
    std::fill(bytes.begin() + 49, bytes.begin() + 56, '\xFF');
    auto peer = connectedPeer(kPort);
    ASSERT_TRUE(peer.writeAcknowledged(bytes));
    const auto message = mpInbox->waitFor(1).at(0);
    EXPECT_TRUE(message.isCallback);
    EXPECT_FALSE(message.isRemote);
}

TEST_F(SocketServer, KeepsTheOrderOfAConnection) {
    auto peer = connectedPeer(kPort);
    for (long method = 0; method < 200; ++method)
        ASSERT_TRUE(peer.write(packetBytes(kReceiverId, method, "x")));
    const auto messages = mpInbox->waitFor(200);
    ASSERT_EQ(messages.size(), 200u);
    for (long method = 0; method < 200; ++method)
        EXPECT_EQ(messages[static_cast<std::size_t>(method)].methodId, method);
}

TEST_F(SocketServer, ForgetsHalfAPacketWithItsConnection) {
    {
        auto peer = connectedPeer(kPort);
        ASSERT_TRUE(peer.writeAcknowledged(packetBytes(kReceiverId, 4, "half").substr(0, 15000)));
    }
    auto peer = connectedPeer(kPort);
    ASSERT_TRUE(peer.writeAcknowledged(packetBytes(kReceiverId, 5, "whole")));
    const auto messages = mpInbox->waitFor(1);
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_EQ(messages[0].payload, "whole");
}

TEST_F(SocketServer, SurvivesRandomPackets) {
    std::mt19937_64 random(11);
    auto peer = connectedPeer(kPort);
    for (int round = 0; round < 300; ++round) {
        std::string bytes(PTC::kPacketSize, '\0');
        std::generate(bytes.begin(), bytes.end(),
                      [&random] { return static_cast<char>(random()); });
        if (round % 2 == 0)
            bytes.replace(0, 8, packetBytes(kReceiverId, 0, "").substr(0, 8));
        if (round % 4 == 0)
            std::fill(bytes.begin() + 42, bytes.begin() + 48, '\0');
        ASSERT_TRUE(peer.writeAcknowledged(bytes));
    }
    auto another = connectedPeer(kPort);
    ASSERT_TRUE(another.writeAcknowledged(packetBytes(kReceiverId, -77, "still there")));
    EXPECT_TRUE(eventually([this] {
        const auto messages = mpInbox->waitFor(1);
        return messages.back().payload == "still there";
    }));
}

TEST_F(SocketServer, ServesClientsThatComeTogetherOneAfterTheOther) {
    const auto start = steady_clock::now();
    auto first = connectedPeer(kPort);
    auto second = connectedPeer(kPort);
    ASSERT_TRUE(second.write(packetBytes(kReceiverId, 2, "second")));
    ASSERT_TRUE(first.writeAcknowledged(packetBytes(kReceiverId, 1, "first")));
    ASSERT_TRUE(second.isAcknowledged());
    EXPECT_GE(steady_clock::now() - start, 500ms);
    const auto messages = mpInbox->waitFor(2);
    ASSERT_EQ(messages.size(), 2u);
    EXPECT_EQ(messages[0].payload, "first");
    EXPECT_EQ(messages[1].payload, "second");
}

TEST_F(SocketServer, ReleasesTheResourcesOfClientsThatHaveLeft) {
    const auto descriptors = descriptorCount();
    const auto threads = threadCount();
    {
        std::vector<Peer> peers;
        for (int client = 0; client < 3; ++client) {
            peers.push_back(connectedPeer(kPort));
            ASSERT_TRUE(peers.back().writeAcknowledged("x"));
        }
        EXPECT_EQ(descriptorCount(), descriptors + 6);
        EXPECT_EQ(threadCount(), threads + 3);
    }
    EXPECT_TRUE(eventually([&] { return descriptorCount() == descriptors; }));
    EXPECT_TRUE(eventually([&] { return threadCount() == threads; }));
    auto late = connectedPeer(kPort);
    EXPECT_TRUE(late.writeAcknowledged(packetBytes(kReceiverId, 4, "x")));
}

TEST_F(SocketServer, ClosesTheConnectionOfAClientThatHasEndedWriting) {
    auto peer = connectedPeer(kPort);
    ASSERT_TRUE(peer.writeAcknowledged("x"));
    peer.endWriting();
    EXPECT_TRUE(peer.isClosedByOther());
}

TEST_F(SocketServer, OutlivesMoreClientsThanItHasDescriptors) {
    const DescriptorLimit limit(5);
    for (int client = 0; client < 12; ++client) {
        Peer peer;
        ASSERT_GE(peer.socket(), 0);
        ASSERT_TRUE(peer.connectTo(kPort));
        ASSERT_TRUE(peer.writeAcknowledged("x"));
    }
    EXPECT_TRUE(lines().empty());
}

TEST_F(SocketServer, WaitsWithoutSpinningUntilADescriptorIsFree) {
    Peer waiting;
    Peer leaving;
    ASSERT_TRUE(leaving.connectTo(kPort));
    ASSERT_TRUE(leaving.writeAcknowledged("x"));
    {
        const DescriptorLimit limit(0);
        const auto start = steady_clock::now();
        ASSERT_TRUE(waiting.connectTo(kPort));
        ASSERT_TRUE(waiting.write("x"));
        ASSERT_TRUE(eventually([log = &mLog] { return log->lines().size() >= 3; }));
        EXPECT_GE(steady_clock::now() - start, 1000ms) << "one attempt in 500 ms";
        leaving = Peer(-1);
        EXPECT_TRUE(waiting.isAcknowledged());
    }
    for (const auto& line : lines())
        EXPECT_EQ(line, "[Error]bad client!");
    EXPECT_LT(lines().size(), 20u);
}

TEST(SocketRemoteReceiver, KeepsTheConnectionOfACallThatThrows) {
    Gate done;
    auto* const receiver = new PTC::Receiver(kReceiverId);
    receiver->addAdapter(new TestAdapter(62, [&done](PTC::Event& event) {
        if (event.methodId == 1)
            throw std::runtime_error("a call that failed");
        done.open();
    }));
    SocketRemoteReceiver server(0);
    server.addReceiver(receiver);
    ASSERT_TRUE(server.initialize(kPort));
    auto peer = connectedPeer(kPort);
    ASSERT_TRUE(peer.writeAcknowledged(packetBytes(kReceiverId, 1, "x")));
    ASSERT_TRUE(peer.writeAcknowledged(packetBytes(kReceiverId, 2, "x")));
    EXPECT_TRUE(done.wait());
}

TEST_F(SocketServer, GoesOnAfterSignalHandlersHaveRunOnItsThreads) {
    auto peer = connectedPeer(kPort);
    for (std::size_t round = 1; round <= 100; ++round) {
        interruptOtherThreads();
        ASSERT_TRUE(peer.write(packetBytes(kReceiverId, 4, "x")));
        ASSERT_EQ(mpInbox->waitFor(round).size(), round);
    }
    auto late = connectedPeer(kPort);
    EXPECT_TRUE(late.writeAcknowledged(packetBytes(kReceiverId, 4, "x")));
    EXPECT_TRUE(lines().empty());
}

TEST_F(SocketServer, RefusesAPortThatIsTaken) {
    std::vector<std::string> printed;
    SocketRemoteReceiver second(0,
                                [&printed](std::string_view line) { printed.emplace_back(line); });
    EXPECT_FALSE(second.initialize(kPort));
    EXPECT_EQ(printed, std::vector<std::string>{"[Error]Socket Server create failed!"});
    EXPECT_EQ(second.getIdentity(), kPort);
    EXPECT_EQ(second.getLastClientSocket(), -1);
}

TEST_F(SocketServer, PrintsItsErrorsToStandardOutput) {
    testing::internal::CaptureStdout();
    const bool started = SocketRemoteReceiver(0).initialize(kPort);
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "[Error]Socket Server create failed!\n");
    EXPECT_FALSE(started);
}

TEST_F(SocketServer, KeepsTheFirstStart) {
    EXPECT_FALSE(mServer->initialize(1007));
    EXPECT_EQ(mServer->getIdentity(), kPort);
    auto peer = connectedPeer(kPort);
    EXPECT_TRUE(peer.writeAcknowledged("x"));
}

TEST_F(SocketServer, FreesItsPortAtTheEnd) {
    auto peer = connectedPeer(kPort);
    ASSERT_TRUE(peer.writeAcknowledged("x"));
    mServer.reset();
    EXPECT_TRUE(peer.isClosedByOther());
    EXPECT_TRUE(SocketRemoteReceiver(0, [](std::string_view) {}).initialize(kPort));
}

TEST_F(SocketServer, DoesNotWaitForThePauseAtTheEnd) {
    auto quickest = steady_clock::duration::max();
    for (int round = 0; round < 5; ++round) {
        mServer = std::make_unique<SocketRemoteReceiver>(0);
        ASSERT_TRUE(mServer->initialize(kPort));
        auto peer = connectedPeer(kPort);
        ASSERT_TRUE(peer.writeAcknowledged("x"));
        quickest = std::min(quickest, timeOf([this] { mServer.reset(); }));
    }
    EXPECT_LT(quickest, 250ms);
}

TEST_F(SocketServer, EndsWhileDataIsInFlight) {
    const auto bytes = packetBytes(kReceiverId, 4, "payload");
    std::vector<Peer> peers;
    for (int client = 0; client < 2; ++client) {
        peers.push_back(connectedPeer(kPort));
        ASSERT_TRUE(peers.back().writeAcknowledged(bytes));
    }
    std::vector<std::thread> writers;
    for (Peer& peer : peers)
        writers.emplace_back([&peer, &bytes] {
            while (peer.write(bytes)) {
            }
        });
    EXPECT_GE(mpInbox->waitFor(20).size(), 20u);
    mServer.reset();
    for (auto& writer : writers)
        writer.join();
}

TEST_F(SocketServer, EndsWhileAReaderWaitsForRoomForItsAcknowledgement) {
    Peer stuck;
    ASSERT_EQ(PTC::setSocketOption(stuck.socket(), SOL_SOCKET, SO_RCVBUF, 1), 0);
    ASSERT_TRUE(stuck.connectTo(kPort));
    ASSERT_TRUE(stuck.writeAcknowledged("x"));
    PTC::setSocketOption(mServer->getLastClientSocket(), SOL_SOCKET, SO_SNDBUF, 1);
    writeUntilReaderIsStuck(stuck);
    auto other = connectedPeer(kPort);
    EXPECT_TRUE(other.writeAcknowledged(packetBytes(kReceiverId, 4, "x")))
        << "a stuck client holds up nobody else";
    mServer.reset();
}

TEST(SocketRemoteReceiver, SaysWhichStepOfItsStartFailed) {
    using Lines = std::vector<std::string>;
    {
        const failing_calls::FailingOption failing(SO_REUSEADDR);
        EXPECT_EQ(linesOfAFailedStart(), Lines{"[Error]Socket Server reuse address failed!"});
    }
    {
        const failing_calls::FailingOption failing(SO_RCVBUF);
        EXPECT_EQ(linesOfAFailedStart(), Lines{"[Error]Socket Server set Rec buffer failed!"});
    }
    {
        const failing_calls::FailingListen failing;
        EXPECT_EQ(linesOfAFailedStart(), Lines{"[Error]create socket server listenner failed!"});
    }
    const DescriptorLimit limit(0);
    LineLog log;
    SocketRemoteReceiver server(0, [&log](std::string_view line) { log.add(line); });
    EXPECT_FALSE(server.initialize(kPort));
    EXPECT_EQ(log.lines(), Lines{"[Error]Socket Server create failed!"});
}

TEST(SocketRemoteReceiver, MayBeStartedAgainAfterAStartThatFailed) {
    SocketRemoteReceiver server(0, [](std::string_view) {});
    {
        const failing_calls::FailingListen failing;
        EXPECT_FALSE(server.initialize(kPort));
    }
    EXPECT_TRUE(server.initialize(kPort));
    EXPECT_TRUE(connectedPeer(kPort).writeAcknowledged("x"));
}

TEST(SocketRemoteReceiver, NeedNotBeStarted) {
    SocketRemoteReceiver server(0, [](std::string_view) {});
    server.run();
    EXPECT_EQ(server.getId(), 0);
    EXPECT_EQ(server.getIdentity(), -1);
    EXPECT_EQ(server.getLastClientSocket(), -1);
}

TEST(SocketRemoteReceiver, KnowsAFailedRead) {
    const SocketRemoteReceiver server(0);
    EXPECT_TRUE(server.isRecvDataFailed(-1));
    EXPECT_TRUE(server.isRecvDataFailed(0));
    EXPECT_FALSE(server.isRecvDataFailed(1));
    EXPECT_FALSE(server.isRecvDataFailed(20480));
}

TEST(SocketRemoteReceiver, TellsWhetherAnAcknowledgementWasSent) {
    SocketRemoteReceiver server(0);
    int ends[2];
    ASSERT_EQ(socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, ends), 0);
    Peer near(ends[0]);
    {
        Peer far(ends[1]);
        EXPECT_TRUE(server.sendACK(near.socket()));
        EXPECT_TRUE(far.isAcknowledged());
    }
    EXPECT_FALSE(server.sendACK(near.socket()));
    EXPECT_FALSE(server.sendACK(-1));
}

TEST(SocketRemoteReceiver, SurvivesAReportThatThrows) {
    SocketRemoteReceiver first(0, [](std::string_view) {});
    ASSERT_TRUE(first.initialize(kPort));
    SocketRemoteReceiver second(0, [](std::string_view) { throw std::runtime_error("full"); });
    EXPECT_FALSE(second.initialize(kPort));
}
