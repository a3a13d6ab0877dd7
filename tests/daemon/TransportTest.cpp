// SPDX-License-Identifier: MIT
#include <algorithm>
#include <chrono>
#include <climits>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/Patience.h"

using namespace std::chrono_literals;
using wire::Packet;

namespace {

class Transport : public DaemonTest {
protected:
    void SetUp() override {
        DaemonTest::SetUp();
        if (!HasFatalFailure())
            mClient.registerCallBack();
        mBefore = 1;
        EXPECT_TRUE(mClient.waitForAcknowledgements(mBefore));
    }

    /** A request to play, as it is sent. */
    wire::Bytes play() const { return wire::toBytes({8, 62, request::kPlay, false, true, id()}); }
    wire::Bytes id() const { return wire::integer(mClient.id()); }

    void expectPlayed() { mClient.expectReply(callback::kPlay, 0); }

    PlayerClient mClient{1000};
    std::size_t mBefore = 0; ///< acknowledgements of the registration
};

TEST_F(Transport, OnePacketIsAcknowledgedOnce) {
    mClient.sendBytes(play());
    expectPlayed();
    mClient.expectNothingElse();
    EXPECT_TRUE(mClient.waitForAcknowledgements(mBefore + 2));
    EXPECT_EQ(mClient.acknowledgements(), mBefore + 2);
}

TEST_F(Transport, APacketInTwoPiecesIsAcknowledgedTwiceAndDeliveredOnce) {
    const auto packet = play();
    mClient.sendBytes(packet.substr(0, 10240));
    EXPECT_TRUE(mClient.waitForAcknowledgements(mBefore + 1));
    mClient.sendBytes(packet.substr(10240));
    EXPECT_TRUE(mClient.waitForAcknowledgements(mBefore + 2));
    expectPlayed();
    mClient.expectNothingElse();
    EXPECT_TRUE(mClient.waitForAcknowledgements(mBefore + 3));
    EXPECT_EQ(mClient.acknowledgements(), mBefore + 3);
}

TEST_F(Transport, EveryPieceOfManyIsAcknowledged) {
    const auto packet = play();
    std::size_t acknowledged = mBefore;
    for (std::size_t offset = 0; offset < packet.size();) {
        // The header byte by byte, what follows in larger pieces.
        const std::size_t length = offset < 60 ? 1 : 3001;
        mClient.sendBytes(packet.substr(offset, length));
        ASSERT_TRUE(mClient.waitForAcknowledgements(++acknowledged));
        offset += length;
    }
    expectPlayed();
    mClient.expectNothingElse();
}

TEST_F(Transport, APieceIsAcknowledgedWithoutDelay) {
    const auto packet = play();
    std::vector<std::chrono::duration<double>> times;
    for (std::size_t i = 0; i < 40; ++i) {
        const auto start = patience::Clock::now();
        mClient.sendBytes(packet.substr(i, 1));
        ASSERT_TRUE(mClient.waitForAcknowledgements(mBefore + i + 1));
        times.push_back(patience::Clock::now() - start);
    }
    std::sort(times.begin(), times.end());
    EXPECT_LT(times[20], 20ms) << "the median";
}

TEST_F(Transport, ACallIsAnsweredWithoutDelayWhateverWasUnacknowledged) {
    std::vector<std::chrono::duration<double>> times;
    for (int i = 0; i < 40; ++i) {
        const auto start = patience::Clock::now();
        const auto packet = play();
        mClient.sendBytes(packet.substr(0, wire::kHeaderSize));
        mClient.sendBytes(packet.substr(wire::kHeaderSize));
        expectPlayed();
        times.push_back(patience::Clock::now() - start);
    }
    std::sort(times.begin(), times.end());
    EXPECT_LT(times[20], 20ms) << "the median";
}

TEST_F(Transport, TwoPacketsInOneWriteAreDeliveredBoth) {
    const auto pause = wire::toBytes({8, 62, request::kPause, false, true, id()});
    mClient.sendBytes(play() + pause);
    expectPlayed();
    mClient.expectReply(callback::kPause, 0);
    EXPECT_TRUE(mClient.waitForAcknowledgements(mBefore + 2));
}

TEST_F(Transport, PacketsMayBeCutAnywhere) {
    const auto stream = play() + play() + play();
    mClient.sendBytes(stream.substr(0, 30000));
    expectPlayed();
    mClient.sendBytes(stream.substr(30000, 20000));
    expectPlayed();
    mClient.sendBytes(stream.substr(50000));
    expectPlayed();
    mClient.expectNothingElse();
}

TEST_F(Transport, ABufferThatIsUsedAgainShowsNothingOfTheLastPacket) {
    mClient.open(std::string(500, 'a'));
    mClient.expectReply(callback::kOpenPlayer, 0);
    mClient.open("/b");
    mClient.expectReply(callback::kOpenPlayer, 0);
    EXPECT_TRUE(mSyslog.waitForLine("MediaPlayerController::open /b"));
    EXPECT_EQ(mSyslog.messages("MediaPlayerController::open /b").front(),
              "MediaPlayerService 101: MediaPlayerController::open /b");
}

TEST_F(Transport, ASizeThatIsNotOneIsAcknowledgedAndIgnored) {
    const Packet packet{8, 62, request::kPlay, false, true, id()};
    std::size_t acknowledged = mBefore;
    for (const std::int64_t size :
         {0L, -1L, 20425L, 20480L, 65536L, 1L << 31, 1L << 32, (1L << 32) + 1, LONG_MAX,
          LONG_MAX - 56, LONG_MIN, LONG_MIN + 1}) {
        mClient.sendBytes(wire::toBytes(packet, size));
        EXPECT_TRUE(mClient.waitForAcknowledgements(++acknowledged)) << size;
    }
    mClient.expectNothingElse();
}

TEST_F(Transport, TheLargestPayloadIsTaken) {
    mClient.sendBytes(wire::toBytes({8, 62, request::kPlay, false, true, id()}, 20424));
    expectPlayed();
}

TEST_F(Transport, AnUnknownReceiverIsAcknowledgedAndIgnored) {
    std::size_t acknowledged = mBefore;
    for (const std::int64_t receiver :
         {0L, 1L, 3L, 7L, 9L, -8L, (1L << 32) + 8, LONG_MAX, LONG_MIN}) {
        mClient.send({receiver, 62, request::kPlay, false, true, id()});
        EXPECT_TRUE(mClient.waitForAcknowledgements(++acknowledged)) << receiver;
    }
    mClient.expectNothingElse();
}

TEST_F(Transport, AnUnknownObjectIsIgnored) {
    for (const std::int64_t object :
         {0L, 50L, 61L, 63L, 64L, -62L, (1L << 32) + 62, LONG_MAX, LONG_MIN})
        mClient.send({8, object, request::kPlay, false, true, id()});
    mClient.expectNothingElse();
}

TEST_F(Transport, AnUnknownMethodIsIgnored) {
    for (const std::int64_t method : {0L, 15L, 16L, -1L, (1L << 32) + 4, LONG_MAX, LONG_MIN})
        mClient.send({8, 62, method, false, true, id()});
    mClient.expectNothingElse();
}

TEST_F(Transport, ACallbackToAServiceIsIgnored) {
    mClient.send({8, 62, request::kPlay, true, true, id()});
    mClient.expectNothingElse();
}

TEST_F(Transport, MethodsOtherThanTheRegistrationsDoNotLookAtTheRemoteFlag) {
    mClient.send({8, 62, request::kPlay, false, false, id()});
    expectPlayed();
}

TEST_F(Transport, APayloadAddressFromOutsideMeansNothing) {
    auto packet = play();
    std::fill(packet.begin() + 24, packet.begin() + 32, '\xFF');
    mClient.sendBytes(packet);
    expectPlayed();
}

TEST_F(Transport, ReservedBytesAndPaddingMeanNothing) {
    auto packet = play();
    std::fill(packet.begin() + 33, packet.begin() + 40, '\xFF');
    std::fill(packet.begin() + 49, packet.begin() + 56, '\xFF');
    std::fill(packet.begin() + 57, packet.end(), '\xFF');
    mClient.sendBytes(packet);
    expectPlayed();
}

TEST_F(Transport, HalfAPacketLeftOpenHoldsUpNobody) {
    WireClient half(1001);
    half.connect();
    half.sendBytes(play().substr(0, 10000));
    EXPECT_TRUE(half.waitForAcknowledgements(1));
    mClient.callAccepted(request::kPlay, callback::kPlay);
    half.disconnect();
    mClient.callAccepted(request::kPlay, callback::kPlay);
}

TEST_F(Transport, HalfAPacketIsNotDeliveredWhenItsSenderLeaves) {
    WireClient half(1001);
    half.connect();
    half.sendBytes(play().substr(0, 20479));
    EXPECT_TRUE(half.waitForAcknowledgements(1));
    half.disconnect();
    mClient.expectNothingElse();
}

TEST_F(Transport, EightClientsAtOnceEachGetTheirOwnAnswersInOrder) {
    constexpr std::size_t kRequests = 200;
    mClient.stopListening();
    mClient.disconnect();
    std::vector<std::thread> threads;
    for (long identity = 1001; identity <= 1007; ++identity)
        threads.emplace_back([identity] {
            PlayerClient client(identity);
            client.registerCallBack();
            for (std::size_t i = 0; i < kRequests; ++i)
                client.request(i % 2 == 0 ? request::kPlay : request::kPause);
            for (std::size_t i = 0; i < kRequests; ++i)
                client.expectReply(i % 2 == 0 ? callback::kPlay : callback::kPause, 0);
            EXPECT_TRUE(client.waitForAcknowledgements(kRequests + 1));
        });
    for (auto& thread : threads)
        thread.join();
}

TEST_F(Transport, AClientThatTakesNoAnswersIsGivenUpAfterTwoSecondsAndThenHoldsUpNobody) {
    PlayerClient deaf(1001);
    deaf.registerCallBack();
    const auto requestForDeaf = wire::integer(deaf.id());
    // More than the sockets between the daemon and the client hold.
    for (int i = 0; i < 600; ++i)
        mClient.request(request::kPlay, requestForDeaf);
    const auto start = patience::Clock::now();
    mClient.expectNothingElse();
    EXPECT_LT(patience::Clock::now() - start, patience::stretched(4s));

    const auto later = patience::Clock::now();
    for (int i = 0; i < 50; ++i)
        mClient.request(request::kPlay, requestForDeaf);
    mClient.expectNothingElse();
    EXPECT_LT(patience::Clock::now() - later, patience::stretched(1s));
}

TEST_F(Transport, AClientMayNeverAcknowledgeWhatItGets) {
    mClient.stopAcknowledging();
    for (int i = 0; i < 100; ++i)
        mClient.callAccepted(request::kPlay, callback::kPlay);
}

TEST_F(Transport, AClientThatReadsNoAcknowledgementsHoldsUpNobody) {
    PlayerClient careless(1001);
    careless.connect(2304);
    const auto packet = wire::toBytes({9, 62, request::kPlay, false, true, id()});
    for (int i = 0; i < 3000; ++i)
        if (careless.sendSome(packet, 300ms) < packet.size())
            break;
    mClient.callAccepted(request::kPlay, callback::kPlay);
}

} // namespace
