// SPDX-License-Identifier: MIT
#include "ptc/SocketRemoteSender.h"

#include "ptc/Event.h"
#include "ptc/LTReceiver.h"
#include "ptc/LoopbackSocket.h"
#include "ptc/SocketRemoteReceiver.h"
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
#include <cstring>
#include <fcntl.h>
#include <future>
#include <limits>
#include <map>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <string>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <thread>
#include <vector>

using std::chrono::steady_clock;
using namespace std::chrono_literals;

namespace {

constexpr int kPort = 1002;
constexpr int kServicePort = 1008;
constexpr long kModule = 3;

/** The block stays with the caller, as a proxy's does. */
void send(SocketRemoteSender& sender, long method, std::string payload) {
    sender.send(
        new PTC::Event(7, method, payload.data(), static_cast<long>(payload.size()), true, true));
}

PTC::EventPacket headerOf(const std::string& packet) {
    PTC::EventPacket header{};
    std::memcpy(&header, packet.data(), sizeof(header));
    return header;
}

std::string payloadOf(const std::string& packet) {
    return packet.substr(sizeof(PTC::EventPacket), static_cast<std::size_t>(headerOf(packet).size));
}

/** Bytes that have arrived and not been read. */
int unreadBytes(int socket) {
    int count = 0;
    ioctl(socket, FIONREAD, &count);
    return count;
}

/** Whether a thread that sends must wait. */
bool isFull(int socket) {
    pollfd source{socket, POLLOUT, 0};
    return ::poll(&source, 1, 0) == 0;
}

template<typename Call>
steady_clock::duration timeOf(Call&& call) {
    const auto start = steady_clock::now();
    call();
    return steady_clock::now() - start;
}

class SocketSender : public testing::Test {
protected:
    SocketSender() {
        EXPECT_TRUE(mSender.initialize(kPort));
        mPeer = mClient.accept();
    }

    BareServer mClient{kPort};
    SocketRemoteSender mSender{kModule};
    Peer mPeer{-1};
};

/** A peer that accepts, but whose small buffers soon take no more. */
class DeafPeer : public testing::Test {
protected:
    DeafPeer() { EXPECT_TRUE(mSender.initialize(kPort)); }

    /** How long each send took, up to and including the one that waited in vain. */
    steady_clock::duration sendUntilGivenUp() {
        steady_clock::duration last{};
        const std::string payload(1000, 'x');
        while (last < 1s) {
            last = timeOf([&] { send(mSender, 1, payload); });
            ++mSent;
        }
        return last;
    }

    int mSent = 0;
    BareServer mClient{kPort, 10, 1};
    SocketRemoteSender mSender{kModule};
};

} // namespace

TEST_F(SocketSender, WritesOnePacketForAnEvent) {
    char block[] = "payload";
    mSender.send(new PTC::Event(-7, 4, block, 7, true, false));
    const auto bytes = mPeer.read(PTC::kPacketSize);
    ASSERT_EQ(bytes.size(), PTC::kPacketSize);
    const auto header = headerOf(bytes);
    EXPECT_EQ(header.receiverId, kModule);
    EXPECT_EQ(header.objectId, -7);
    EXPECT_EQ(header.methodId, 4);
    EXPECT_EQ(header.data, block);
    EXPECT_EQ(header.isCallback, 0);
    EXPECT_EQ(header.size, 7);
    EXPECT_EQ(header.isRemote, 1);
    EXPECT_EQ(bytes.substr(33, 7) + bytes.substr(49, 7), std::string(14, '\0'));
    EXPECT_EQ(payloadOf(bytes), "payload");
    EXPECT_EQ(bytes.find_first_not_of('\0', 56 + 7), std::string::npos);
}

TEST_F(SocketSender, FillsEveryPacketUpWithZeros) {
    const std::size_t sizes[] = {PTC::kMaxPayloadSize, 100, 5000, 0, 1, PTC::kMaxPayloadSize};
    for (const std::size_t size : sizes) {
        send(mSender, 1, std::string(size, 'x'));
        const auto bytes = mPeer.read(PTC::kPacketSize);
        ASSERT_EQ(bytes.size(), PTC::kPacketSize);
        EXPECT_EQ(payloadOf(bytes), std::string(size, 'x'));
        EXPECT_EQ(bytes.find_first_not_of('\0', 56 + size), std::string::npos);
    }
}

TEST_F(SocketSender, CarriesBothFlagsEachInItsPlace) {
    char block = 'x';
    for (const bool isCallback : {false, true})
        for (const bool isRemote : {false, true}) {
            mSender.send(new PTC::Event(7, 1, &block, 1, isRemote, isCallback));
            const auto header = headerOf(mPeer.read(PTC::kPacketSize));
            EXPECT_EQ(header.isCallback, isCallback ? 1 : 0);
            EXPECT_EQ(header.isRemote, isRemote ? 1 : 0);
        }
}

TEST_F(SocketSender, RefusesWhatDoesNotFitAPacket) {
    std::string block(PTC::kPacketSize, 'x');
    for (const long size : {-1L, PTC::kMaxPayloadSize + 1, std::numeric_limits<long>::min(),
                            std::numeric_limits<long>::max()})
        mSender.send(new PTC::Event(7, 1, block.data(), size, true, true));
    mSender.send(new PTC::Event(7, 1, nullptr, 5, true, true));
    mSender.send(nullptr);
    send(mSender, 2, "right");
    const auto bytes = mPeer.read(PTC::kPacketSize);
    EXPECT_EQ(headerOf(bytes).methodId, 2);
    EXPECT_EQ(payloadOf(bytes), "right");
}

TEST_F(SocketSender, ReadsAllAcknowledgementsThatHaveArrived) {
    constexpr int kStale = 30000;
    for (int round = 0; round < 3; ++round) {
        ASSERT_TRUE(mPeer.write(std::string(kStale, 'O')));
        ASSERT_TRUE(eventually([this] { return unreadBytes(mSender.socket()) == kStale; }));
        send(mSender, 1, "x");
        EXPECT_EQ(unreadBytes(mSender.socket()), 0);
    }
}

TEST_F(SocketSender, DoesNotWaitForAcknowledgements) {
    for (long method = 0; method < 5; ++method)
        send(mSender, method, "x");
    for (long method = 0; method < 5; ++method)
        EXPECT_EQ(headerOf(mPeer.read(PTC::kPacketSize)).methodId, method);
}

TEST_F(SocketSender, SendsOnToAPeerThatHasEndedWriting) {
    mPeer.endWriting();
    for (long method = 0; method < 50; ++method) {
        send(mSender, method, "x");
        EXPECT_EQ(headerOf(mPeer.read(PTC::kPacketSize)).methodId, method);
    }
}

// The default action of the signal would end the test.
TEST_F(SocketSender, RaisesNoSignalWhenItsPeerHasGone) {
    mPeer = Peer(-1);
    for (int packet = 0; packet < 10; ++packet)
        send(mSender, 1, "x");
    EXPECT_TRUE(eventually([this] {
        send(mSender, 1, "x");
        char byte;
        return ::recv(mSender.socket(), &byte, 1, MSG_DONTWAIT) == 0;
    })) << "the lost connection is shut down, for those who watch the socket";
}

TEST_F(SocketSender, LosesNothingThatWasSentBeforeItsEnd) {
    auto sender = std::make_unique<SocketRemoteSender>(kModule);
    ASSERT_TRUE(sender->initialize(kPort));
    auto peer = mClient.accept();
    ASSERT_TRUE(peer.write("OK"));
    ASSERT_TRUE(eventually([&] { return unreadBytes(sender->socket()) == 2; }));
    send(*sender, 1, "first");
    ASSERT_TRUE(peer.write("OK"));
    ASSERT_TRUE(eventually([&] { return unreadBytes(sender->socket()) == 2; }));
    sender.reset();
    EXPECT_EQ(payloadOf(peer.read(PTC::kPacketSize)), "first");
    char byte;
    EXPECT_EQ(::recv(peer.socket(), &byte, 1, 0), 0) << "an end in order, and no reset";
}

TEST_F(SocketSender, KnowsWhetherItsPeerHasEnded) {
    send(mSender, 1, "unread");
    ASSERT_TRUE(mPeer.write("OK"));
    EXPECT_FALSE(mSender.hasEnded());
    mPeer = Peer(-1);
    EXPECT_TRUE(eventually([this] { return mSender.hasEnded(); }));
    EXPECT_FALSE(SocketRemoteSender(kModule).hasEnded()) << "it has not begun";
}

TEST_F(SocketSender, GivenUpSendsNothingAndIsAtItsEnd) {
    send(mSender, 1, "before");
    mSender.giveUp();
    EXPECT_TRUE(mSender.hasEnded());
    send(mSender, 2, "after");
    const auto bytes = mPeer.readAll();
    ASSERT_EQ(bytes.size(), PTC::kPacketSize);
    EXPECT_EQ(payloadOf(bytes), "before");
}

TEST_F(SocketSender, SetsItsConnectionUp) {
    int noDelay = 0;
    int bufferSize = 0;
    socklen_t length = sizeof(int);
    const int socket = mSender.socket();
    ASSERT_EQ(getsockopt(socket, IPPROTO_TCP, TCP_NODELAY, &noDelay, &length), 0);
    ASSERT_EQ(getsockopt(socket, SOL_SOCKET, SO_RCVBUF, &bufferSize, &length), 0);
    EXPECT_NE(noDelay, 0);
    EXPECT_EQ(bufferSize, 2 * 122880) << "the kernel doubles what is asked for";
    int reuse = 0;
    ASSERT_EQ(getsockopt(socket, SOL_SOCKET, SO_REUSEADDR, &reuse, &length), 0);
    EXPECT_EQ(reuse, 1);
    EXPECT_TRUE(fcntl(socket, F_GETFD) & FD_CLOEXEC);
}

TEST_F(SocketSender, SendsThroughSignalHandlers) {
    std::atomic<bool> stop{false};
    std::thread interrupter([&stop] {
        while (!stop)
            interruptOtherThreads();
    });
    for (long method = 0; method < 300; ++method) {
        send(mSender, method, "x");
        EXPECT_EQ(headerOf(mPeer.read(PTC::kPacketSize)).methodId, method);
    }
    stop = true;
    interrupter.join();
}

TEST_F(DeafPeer, IsGivenUpAfterTwoSeconds) {
    const auto waited = sendUntilGivenUp();
    EXPECT_GE(waited, 1900ms);
    EXPECT_LT(waited, 10s);
    EXPECT_LT(timeOf([this] {
                  for (int packet = 0; packet < 1000; ++packet)
                      send(mSender, 1, "x");
              }),
              1s);
}

TEST_F(DeafPeer, IsAtItsEndOnceGivenUp) {
    EXPECT_FALSE(mSender.hasEnded());
    sendUntilGivenUp();
    EXPECT_TRUE(mSender.hasEnded());
}

TEST_F(DeafPeer, GivenUpInTheMiddleOfAPacketFreesTheThreadThatSendsIt) {
    auto sending = std::async(std::launch::async, [this] {
        while (!mSender.hasEnded())
            send(mSender, 1, "x");
    });
    EXPECT_TRUE(eventually([this] { return isFull(mSender.socket()); }));
    EXPECT_LT(timeOf([&] {
                  mSender.giveUp();
                  sending.wait();
              }),
              1s);
}

TEST_F(DeafPeer, GetsNothingAfterThePacketThatWasCutShort) {
    sendUntilGivenUp();
    auto peer = mClient.accept();
    const auto bytes = peer.readAll();
    EXPECT_TRUE(peer.isClosedByOther());
    EXPECT_LT(bytes.size(), static_cast<std::size_t>(mSent) * PTC::kPacketSize);
    for (std::size_t at = 0; at + PTC::kPacketSize <= bytes.size(); at += PTC::kPacketSize)
        EXPECT_EQ(payloadOf(bytes.substr(at, PTC::kPacketSize)), std::string(1000, 'x'));
}

TEST_F(DeafPeer, IsServedWhenItReadsOnlyOnceItsAcknowledgementsAreTaken) {
    constexpr long kPackets = 5;
    auto peer = mClient.accept();
    for (const int socket : {mSender.socket(), peer.socket()})
        ASSERT_EQ(PTC::setSocketOption(socket, SOL_SOCKET, SO_SNDBUF, 1), 0);
    auto sending = std::async(std::launch::async, [this] {
        for (long method = 0; method < kPackets; ++method)
            send(mSender, method, std::string(PTC::kMaxPayloadSize, 'x'));
    });
    ASSERT_TRUE(peer.write(std::string(2000000, 'O')));
    for (long method = 0; method < kPackets; ++method)
        EXPECT_EQ(headerOf(peer.read(PTC::kPacketSize)).methodId, method);
}

TEST_F(DeafPeer, HoldsNobodyElseUp) {
    BareServer other(1003);
    SocketRemoteSender healthy(4);
    ASSERT_TRUE(healthy.initialize(1003));
    auto peer = other.accept();
    auto blocked = std::async(std::launch::async, [this] { sendUntilGivenUp(); });
    long method = 0;
    while (blocked.wait_for(0s) != std::future_status::ready) {
        EXPECT_LT(timeOf([&] { send(healthy, method, "x"); }), 1500ms);
        ASSERT_EQ(headerOf(peer.read(PTC::kPacketSize)).methodId, method++);
    }
    EXPECT_GT(method, 100);
}

TEST_F(DeafPeer, HoldsThreadsUpOnlyOnce) {
    std::vector<std::thread> threads;
    const auto time = timeOf([&] {
        for (int thread = 0; thread < 8; ++thread)
            threads.emplace_back([this] {
                for (int packet = 0; packet < 500; ++packet)
                    send(mSender, 1, "x");
            });
        for (auto& thread : threads)
            thread.join();
    });
    EXPECT_GE(time, 1900ms);
    EXPECT_LT(time, 10s);
}

TEST(SocketRemoteSender, FailsWithoutAWordWhenNobodyListens) {
    testing::internal::CaptureStdout();
    SocketRemoteSender sender(kModule);
    EXPECT_FALSE(sender.initialize(kPort));
    EXPECT_NE(sender.connectServer(), 0);
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
    EXPECT_EQ(sender.getIdentity(), kPort);
    EXPECT_EQ(sender.socket(), -1);
    send(sender, 1, "x");
}

TEST(SocketRemoteSender, DoesNotWaitForEverForAServerThatAcceptsNobody) {
    const BareServer full(kPort, 0);
    auto first = connectedPeer(kPort);
    SocketRemoteSender sender(kModule);
    bool connected = true;
    const auto time = timeOf([&] {
        for (int attempt = 0; attempt < 3 && connected; ++attempt)
            connected = SocketRemoteSender(kModule).initialize(kPort);
    });
    EXPECT_FALSE(connected);
    EXPECT_GE(time, 1900ms);
    EXPECT_LT(time, 20s);
}

TEST(SocketRemoteSender, PrintsThatThereIsNoSocketLeft) {
    SocketRemoteSender sender(kModule);
    testing::internal::CaptureStdout();
    {
        const DescriptorLimit limit(0);
        EXPECT_FALSE(sender.initialize(kPort));
    }
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "[Error]Socket Server create failed!\n");
}

TEST(SocketRemoteSender, PrintsWhichOptionFailedAndClosesItsSocket) {
    const BareServer client(kPort);
    const auto descriptors = descriptorCount();
    const auto outputOfAFailedStart = [] {
        SocketRemoteSender sender(kModule);
        testing::internal::CaptureStdout();
        EXPECT_FALSE(sender.initialize(kPort));
        EXPECT_EQ(sender.socket(), -1);
        return testing::internal::GetCapturedStdout();
    };
    {
        const failing_calls::FailingOption failing(SO_REUSEADDR);
        EXPECT_EQ(outputOfAFailedStart(), "[Error]Socket client reuse address failed!\n");
    }
    {
        const failing_calls::FailingOption failing(SO_RCVBUF);
        EXPECT_EQ(outputOfAFailedStart(), "[Error]Socket client set send buffer failed!\n");
    }
    EXPECT_EQ(descriptorCount(), descriptors);
}

TEST(Transport, CarriesEventsToAnObjectInAnotherProcess) {
    Gate done;
    std::string payload;
    auto* const receiver = new LTReceiver(8);
    receiver->addAdapter(new TestAdapter(7, [](PTC::Event&) { FAIL() << "not a request"; }));
    receiver->addCBAdapter(new TestAdapter(7, [&](PTC::Event& event) {
        payload.assign(event.data, static_cast<std::size_t>(event.size));
        done.open();
    }));
    SocketRemoteReceiver server(0);
    server.addReceiver(receiver);
    ASSERT_TRUE(server.initialize(kServicePort));
    SocketRemoteSender sender(8);
    ASSERT_TRUE(sender.initialize(kServicePort));
    send(sender, 1, "payload");
    ASSERT_TRUE(done.wait());
    EXPECT_EQ(payload, "payload");
}

TEST(Transport, KeepsThePacketsOfEightThreadsWholeAndInOrder) {
    constexpr std::size_t kThreads = 8;
    constexpr std::size_t kPackets = 250;
    auto* const inbox = new Inbox(8);
    SocketRemoteReceiver server(0);
    server.addReceiver(inbox);
    ASSERT_TRUE(server.initialize(kServicePort));
    SocketRemoteSender sender(8);
    ASSERT_TRUE(sender.initialize(kServicePort));
    std::vector<std::thread> threads;
    for (std::size_t thread = 0; thread < kThreads; ++thread)
        threads.emplace_back([&sender, thread] {
            for (std::size_t packet = 0; packet < kPackets; ++packet)
                send(sender, static_cast<long>(thread),
                     std::to_string(packet) +
                         std::string(1 + packet * 79, static_cast<char>('a' + thread)));
        });
    for (auto& thread : threads)
        thread.join();
    const auto messages = inbox->waitFor(kThreads * kPackets);
    ASSERT_EQ(messages.size(), kThreads * kPackets);
    std::map<long, std::size_t> next;
    for (const auto& message : messages) {
        const std::size_t packet = next[message.methodId]++;
        EXPECT_EQ(message.payload,
                  std::to_string(packet) +
                      std::string(1 + packet * 79, static_cast<char>('a' + message.methodId)));
    }
}

TEST(Transport, EndsWithClientsAndCallsUnderWay) {
    auto* const receiver = new LTReceiver(8);
    std::atomic<int> calls{0};
    receiver->addAdapter(new TestAdapter(62, [&calls](PTC::Event&) { ++calls; }));
    auto server = std::make_unique<SocketRemoteReceiver>(0);
    server->addReceiver(receiver);
    ASSERT_TRUE(server->initialize(kServicePort));
    std::vector<std::unique_ptr<SocketRemoteSender>> senders;
    std::vector<std::thread> threads;
    std::atomic<bool> stop{false};
    for (int client = 0; client < 3; ++client) {
        senders.push_back(std::make_unique<SocketRemoteSender>(8));
        ASSERT_TRUE(senders.back()->initialize(kServicePort));
    }
    for (auto& sender : senders)
        threads.emplace_back([&sender, &stop] {
            std::string payload = "payload";
            while (!stop)
                sender->send(new PTC::Event(62, 1, payload.data(), 7, true, false));
        });
    EXPECT_TRUE(eventually([&calls] { return calls > 100; }));
    server.reset();
    stop = true;
    for (auto& thread : threads)
        thread.join();
}
