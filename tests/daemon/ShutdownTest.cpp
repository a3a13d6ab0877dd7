// SPDX-License-Identifier: MIT
#include <atomic>
#include <chrono>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/Patience.h"

using namespace std::chrono_literals;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;

namespace {

constexpr int kAborted = 128 + SIGABRT;

class Shutdown : public DaemonTest {
protected:
    void expectQuickEnd(int signal) {
        const auto start = patience::Clock::now();
        mpDaemon->signal(signal);
        EXPECT_EQ(mpDaemon->waitForExit(), 0) << mpDaemon->output().joined();
        EXPECT_LT(patience::Clock::now() - start, patience::stretched(1s));
        EXPECT_THAT(mSyslog.messages("onSystemSingleCaught"),
                    ElementsAre("MediaPlayerService 101: main::onSystemSingleCaught"));
        EXPECT_THAT(mSyslog.lines("quit a.exec"), IsEmpty());
    }
};

TEST_F(Shutdown, ByPowerOffTellsTheClientAndEndsInOrder) {
    PlayerClient client(1000);
    client.registerCallBack();
    client.request(request::kPowerOffMediaPlayer);
    EXPECT_EQ(client.receive(),
              client.callbackPacket(callback::kPowerOffMediaPlayer, wire::hex("00 00 00 00")));
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
    EXPECT_THAT(
        mSyslog.messages("powerOffMediaPlayer()"),
        ElementsAre("MediaPlayerService 900: MediaPlayerService::powerOffMediaPlayer() is called.",
                    "MediaPlayerService 901: MediaPlayerService::powerOffMediaPlayer() : "
                    "QApplication::quit() finished.",
                    "MediaPlayerService 902: MediaPlayerService::powerOffMediaPlayer() : calling "
                    "the callback func.",
                    "MediaPlayerService 903: MediaPlayerService::powerOffMediaPlayer() finished."));
    EXPECT_THAT(mSyslog.messages("quit a.exec"),
                ElementsAre("MediaPlayerService 101: quit a.exec"));
    EXPECT_THAT(mSyslog.lines("onSystemSingleCaught"), IsEmpty());
    EXPECT_THAT(mpDaemon->output().with("MediaServiceMain::"),
                ElementsAre("MediaServiceMain::MediaServiceMain", "MediaServiceMain::initialize",
                            "MediaServiceMain::~MediaServiceMain"));
    EXPECT_TRUE(client.waitForHangUp());
}

TEST_F(Shutdown, ByPowerOffLogsInformationalLines) {
    PlayerClient client(1000);
    client.registerCallBack();
    client.request(request::kPowerOffMediaPlayer);
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
    const auto lines = mSyslog.lines("quit a.exec");
    ASSERT_THAT(lines, SizeIs(1));
    // Local use 0, informational; name and process id of the whole process.
    EXPECT_THAT(lines.front(), testing::StartsWith("<134>"));
    EXPECT_THAT(lines.front(), testing::HasSubstr(" MediaPlayerService[" +
                                                  std::to_string(mpDaemon->pid()) + "]: "));
}

TEST_F(Shutdown, ByPowerOffEndsWithManyClientsConnected) {
    std::vector<std::unique_ptr<PlayerClient>> clients;
    for (long identity = 1000; identity <= 1005; ++identity) {
        clients.push_back(std::make_unique<PlayerClient>(identity));
        clients.back()->registerCallBack();
        clients.back()->registerNotify();
    }
    WireClient half(1006);
    half.connect();
    half.sendBytes("half a packet");
    EXPECT_TRUE(half.waitForAcknowledgements(1));
    WireClient waiting(1007);
    waiting.connect();
    waiting.sendBytes("not accepted yet");
    clients.front()->request(request::kPowerOffMediaPlayer);
    EXPECT_TRUE(clients.front()->receive());
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
}

TEST_F(Shutdown, ByPowerOffEndsWhileAClientReadsNoAcknowledgements) {
    PlayerClient client(1000);
    client.registerCallBack();
    WireClient careless(1001);
    careless.connect(2304);
    const auto packet = wire::toBytes({9, 62, 1, false, true, "x"});
    for (int i = 0; i < 3000; ++i)
        if (careless.sendSome(packet, 300ms) < packet.size())
            break;
    client.request(request::kPowerOffMediaPlayer);
    EXPECT_TRUE(client.receive());
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
}

TEST_F(Shutdown, ByPowerOffComesAfterTheRequestsBeforeIt) {
    PlayerClient client(1000);
    client.registerCallBack();
    for (int i = 0; i < 100; ++i)
        client.request(request::kPlay);
    client.request(request::kPowerOffMediaPlayer);
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
    EXPECT_THAT(mpDaemon->output().with("MediaPlayerService::play"), SizeIs(100));
}

TEST_F(Shutdown, ByPowerOffDuringInitializeWaitsForItsEnd) {
    PlayerClient client(1000);
    client.registerCallBack();
    client.callAccepted(request::kInitializePlayer, callback::kInitializePlayer);
    EXPECT_TRUE(mpDaemon->waitForLine("MediaPlayerController::initialize"));
    client.request(request::kPowerOffMediaPlayer);
    EXPECT_TRUE(client.receive());
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
    EXPECT_THAT(mSyslog.lines("initializePlayer close"), SizeIs(1));
}

TEST_F(Shutdown, ByTerminationIsQuickAndLogsOneLine) {
    expectQuickEnd(SIGTERM);
}

TEST_F(Shutdown, ByInterruptIsQuickAndLogsOneLine) {
    expectQuickEnd(SIGINT);
}

TEST_F(Shutdown, ByTerminationWithAClientConnected) {
    PlayerClient client(1000);
    client.registerCallBack();
    expectQuickEnd(SIGTERM);
    EXPECT_TRUE(client.waitForHangUp());
}

TEST_F(Shutdown, ByTerminationDuringInitializeDoesNotWaitForIt) {
    PlayerClient client(1000);
    client.registerCallBack();
    client.callAccepted(request::kInitializePlayer, callback::kInitializePlayer);
    EXPECT_TRUE(mpDaemon->waitForLine("MediaPlayerController::initialize"));
    expectQuickEnd(SIGTERM);
}

TEST_F(Shutdown, BySeveralSignalsAtOnceIsStillOneLine) {
    for (const int signal : {SIGTERM, SIGINT, SIGTERM, SIGINT})
        mpDaemon->signal(signal);
    expectQuickEnd(SIGTERM);
}

TEST_F(Shutdown, ByTerminationUnderLoad) {
    std::atomic<bool> ended{false};
    std::atomic<int> working{0};
    std::vector<std::thread> threads;
    for (long identity = 1000; identity <= 1007; ++identity)
        threads.emplace_back([&, identity] {
            PlayerClient client(identity);
            client.registerCallBack();
            ++working;
            const auto packet = wire::toBytes(
                {8, 62, request::kGetPlayerStatus, false, true, wire::integer(client.id())});
            while (!ended)
                if (client.sendSome(packet, 10ms) == packet.size())
                    client.receive();
        });
    EXPECT_TRUE(mpDaemon->waitForLine("MediaServiceMain::initialize"));
    const auto deadline = patience::deadline();
    while (working < 8 && patience::Clock::now() < deadline)
        std::this_thread::yield();
    expectQuickEnd(SIGTERM);
    ended = true;
    for (auto& thread : threads)
        thread.join();
}

TEST_F(Shutdown, DoesNotComeFromTheOtherSignals) {
    PlayerClient client(1000);
    client.registerCallBack();
    for (const int signal : {SIGPIPE, SIGUSR1, SIGUSR2, SIGALRM, SIGPWR}) {
        mpDaemon->signal(signal);
        client.callAccepted(request::kPlay, callback::kPlay);
    }
    EXPECT_TRUE(mpDaemon->isRunning());
}

TEST_F(Shutdown, DoesNotComeFromSignalsToAnyThreadNorDoTheyEndConnections) {
    PlayerClient client(1000);
    client.registerCallBack();
    for (int i = 0; i < 10; ++i)
        for (const int signal : {SIGPIPE, SIGUSR1, SIGUSR2, SIGALRM, SIGPWR}) {
            mpDaemon->signalEachThread(signal);
            client.callAccepted(request::kPlay, callback::kPlay);
        }
    WireClient second(1001);
    second.connect();
    second.send({9, 62, 1, false, true, "x"});
    EXPECT_TRUE(second.waitForAcknowledgements(1));
}

class Crash : public DaemonTest, public testing::WithParamInterface<int> {};

TEST_P(Crash, PrintsABackTraceAndAborts) {
    PlayerClient client(1000);
    client.registerCallBack();
    client.callAccepted(request::kPlay, callback::kPlay);
    EXPECT_TRUE(mpDaemon->waitForLine("MediaPlayerController::play"));
    mpDaemon->signal(GetParam());
    EXPECT_EQ(mpDaemon->waitForExit(), kAborted);
    // The main thread is in the event loop.
    EXPECT_THAT(mpDaemon->output().joined(), testing::HasSubstr("QCoreApplication"));
    EXPECT_THAT(mSyslog.lines("onSystemSingleCaught"), IsEmpty());
    EXPECT_THAT(mSyslog.lines("quit a.exec"), IsEmpty());
}

INSTANTIATE_TEST_SUITE_P(Signals, Crash, testing::Values(SIGSEGV, SIGBUS, SIGFPE, SIGQUIT));

} // namespace
