// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>
#include <string>

#include "tests/daemon/support/DaemonTest.h"

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

namespace {

constexpr const char* kLogFiles[] = {"/var/log/qn_ope.log", "/var/log/qn_ope_debug.log"};

/** A daemon that finds something unusual around it. The tests start it themselves. */
class Environment : public DaemonTest {
protected:
    void SetUp() override {}

    void startServing(const DaemonOptions& options) {
        start(options);
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
    }

    /** A client registers and is answered to this many requests. */
    static void expectService(int requests = 20) {
        PlayerClient client(1000);
        ASSERT_NO_FATAL_FAILURE(client.registerCallBack());
        for (int i = 0; i < requests; ++i)
            client.callAccepted(request::kPlay, callback::kPlay);
        EXPECT_EQ(client.connectionCount(), 1U);
        EXPECT_TRUE(client.waitForAcknowledgements(static_cast<std::size_t>(requests) + 1));
    }
};

TEST_F(Environment, WithThePortTakenItSaysSoAndRunsOn) {
    const auto taken = listenOn(kDaemonPort);
    startServing(withEngineDouble());
    EXPECT_THAT(mpDaemon->output().with("[Error]"),
                ElementsAre("[Error]Socket Server create failed!"));
    EXPECT_TRUE(mpDaemon->isRunning());
    EXPECT_EQ(mpDaemon->terminate(), 0);
}

TEST_F(Environment, ASecondDaemonLeavesTheFirstAlone) {
    startServing(withEngineDouble());
    {
        DaemonProcess second(withEngineDouble());
        EXPECT_TRUE(second.waitForLine("[Error]Socket Server create failed!"));
        EXPECT_TRUE(second.waitUntilServing());
        EXPECT_EQ(second.terminate(), 0);
    }
    expectService();
}

TEST_F(Environment, ANewDaemonMayFollowAtOnce) {
    for (int i = 0; i < 3; ++i) {
        startServing(withEngineDouble());
        EXPECT_THAT(mpDaemon->output().with("[Error]"), IsEmpty());
        expectService();
        EXPECT_EQ(mpDaemon->terminate(), 0);
    }
}

TEST_F(Environment, ALogDaemonThatStopsReadingHoldsUpNobody) {
    startServing(withEngineDouble());
    mSyslog.stopReading();
    PlayerClient client(1000);
    client.registerCallBack();
    for (int i = 0; i < 1500; ++i)
        client.request(request::kSetSystemFormat, wire::integer(1));
    client.callAccepted(request::kPlay, callback::kPlay);
}

/** Folders in the places of the log files, until the end of the scope. */
class UnwritableLogFiles {
public:
    UnwritableLogFiles() {
        for (const auto* file : kLogFiles) {
            std::filesystem::remove(file);
            std::filesystem::create_directory(file);
        }
    }
    ~UnwritableLogFiles() {
        for (const auto* file : kLogFiles)
            std::filesystem::remove(file);
    }
    UnwritableLogFiles(const UnwritableLogFiles&) = delete;
    UnwritableLogFiles& operator=(const UnwritableLogFiles&) = delete;
};

TEST_F(Environment, UnwritableLogFilesHarmNobody) {
    const UnwritableLogFiles files;
    startServing(withEngineDouble());
    expectService();
    EXPECT_EQ(mpDaemon->terminate(), 0);
}

TEST_F(Environment, ClosedStandardDescriptorsAreNotTakenForConnections) {
    auto options = withEngineDouble();
    options.output = DaemonOptions::Output::closed;
    start(options);
    expectService(100);
    for (const auto* file : kLogFiles)
        EXPECT_EQ(std::filesystem::file_size(file), 0U) << file;
}

TEST_F(Environment, ClosedStandardDescriptorsAreNotTakenForSignals) {
    const UnwritableLogFiles files;
    auto options = withEngineDouble();
    options.output = DaemonOptions::Output::closed;
    start(options);
    expectService();
    EXPECT_THAT(mSyslog.lines("onSystemSingleCaught"), IsEmpty());
    EXPECT_EQ(mpDaemon->terminate(), 0);
}

TEST_F(Environment, OutputThatNobodyReadsHoldsUpNobody) {
    auto options = withEngineDouble();
    options.output = DaemonOptions::Output::fullPipe;
    start(options);
    expectService(100);
}

TEST_F(Environment, WithoutADisplayItRunsWithoutBeingTold) {
    auto options = withEngineDouble();
    for (const char* variable : {"DISPLAY", "WAYLAND_DISPLAY", "QT_QPA_PLATFORM"})
        options.environment[variable] = std::nullopt;
    startServing(options);
    expectService();
}

TEST_F(Environment, WithAnEmptyEnvironmentItServes) {
    DaemonOptions options;
    for (const char* variable : {"HOME", "PATH", "LANG", "LC_ALL", "DISPLAY", "QT_QPA_PLATFORM",
                                 "XDG_RUNTIME_DIR", "TMPDIR", "USER"})
        options.environment[variable] = std::nullopt;
    options.preferLibraries(QNS_ENGINE_DOUBLE_DIR);
    startServing(options);
    expectService();
}

TEST_F(Environment, InTheCLocaleANameEndsAtItsFirstForeignCharacter) {
    auto options = withEngineDouble();
    options.environment["LC_ALL"] = "C";
    startServing(options);
    PlayerClient client(1000);
    client.registerCallBack();
    client.open("/media/a\xC3\xBC.mp4");
    client.expectReply(callback::kOpenPlayer, 0);
    EXPECT_TRUE(mSyslog.waitForLine("MediaPlayerController::open "));
    EXPECT_THAT(mSyslog.messages("MediaPlayerController::open "),
                ElementsAre("MediaPlayerService 101: MediaPlayerController::open /media/a"));
    client.callAccepted(request::kPlay, callback::kPlay);
}

TEST_F(Environment, InTheCLocaleANameThatIsAllForeignIsEmpty) {
    auto options = withEngineDouble();
    options.environment["LC_ALL"] = "C";
    startServing(options);
    PlayerClient client(1000);
    client.registerCallBack();
    client.open("\xC3\xBC");
    client.expectReply(callback::kOpenPlayer, 1);
}

TEST_F(Environment, HelpAndVersionArePrintedWithoutAService) {
    for (const char* argument : {"--help", "--version"}) {
        DaemonOptions options = withEngineDouble();
        options.arguments = {argument};
        start(options);
        EXPECT_EQ(mpDaemon->waitForExit(), 0) << argument;
        EXPECT_THAT(mpDaemon->output().joined(), HasSubstr("QNSMediaService")) << argument;
        EXPECT_THAT(mpDaemon->output().with("MediaServiceMain"), IsEmpty()) << argument;
    }
}

TEST_F(Environment, AnUnknownOptionIsRefused) {
    DaemonOptions options = withEngineDouble();
    options.arguments = {"--no-such-option"};
    start(options);
    EXPECT_EQ(mpDaemon->waitForExit(), 2);
    EXPECT_THAT(mpDaemon->output().joined(), HasSubstr("--no-such-option"));
}

TEST_F(Environment, WithoutSystemServicesItLogsThatAndEnds) {
    DaemonOptions options;
    options.preferLibraries(QNS_QNSYS_DOUBLE_DIR ":" QNS_ENGINE_DOUBLE_DIR);
    options.environment["QNSYS_DOUBLE_INIT"] = "-1";
    start(options);
    EXPECT_EQ(mpDaemon->waitForExit(), 255);
    EXPECT_THAT(mpDaemon->output().with("initialize is failed"),
                ElementsAre("<3>MediaPlayerService 101: MediaServiceMain initialize is failed."));
    EXPECT_THAT(mpDaemon->output().with("quit a.exec"), IsEmpty());
}

TEST_F(Environment, APositiveResultOfTheSystemServicesIsSuccess) {
    DaemonOptions options;
    options.preferLibraries(QNS_QNSYS_DOUBLE_DIR ":" QNS_ENGINE_DOUBLE_DIR);
    options.environment["QNSYS_DOUBLE_INIT"] = "1";
    startServing(options);
    expectService();
}

class WithoutLogDaemon : public testing::Test {};

TEST_F(WithoutLogDaemon, TheServiceIsTheSame) {
    ASSERT_FALSE(std::filesystem::exists("/dev/log"));
    DaemonOptions options;
    options.preferLibraries(QNS_ENGINE_DOUBLE_DIR);
    DaemonProcess daemon(options);
    ASSERT_TRUE(daemon.waitUntilServing());
    PlayerClient client(1000);
    client.registerCallBack();
    for (int i = 0; i < 100; ++i)
        client.request(request::kSetSystemFormat, wire::integer(1));
    client.callAccepted(request::kPlay, callback::kPlay);
    EXPECT_EQ(daemon.terminate(), 0);
}

/** The machine must have other users than this one: not so in a user's own namespace. */
bool canBecomeNobody() {
    std::ifstream map("/proc/self/uid_map");
    unsigned long inside = 0;
    unsigned long outside = 0;
    unsigned long count = 0;
    map >> inside >> outside >> count;
    return count > 65534;
}

class AsNobody : public Environment {
protected:
    void SetUp() override {
        if (!canBecomeNobody())
            GTEST_SKIP() << "There is no other user in this namespace.";
        mOptions.privileges = {"--reuid", "nobody", "--regid", "nogroup", "--clear-groups"};
    }

    /** Folders above the build that others may not enter would be no fault of the daemon. */
    DaemonOptions mOptions = withEngineDouble();
};

TEST_F(AsNobody, TheRightToBindItsPortIsEnough) {
    for (const char* option : {"--inh-caps", "--ambient-caps"}) {
        mOptions.privileges.emplace_back(option);
        mOptions.privileges.emplace_back("-all,+net_bind_service");
    }
    startServing(mOptions);
    EXPECT_THAT(mpDaemon->output().with("[Error]"), IsEmpty());
    expectService();
}

TEST_F(AsNobody, NoRightIsNeededWherePortsAreFree) {
    std::ofstream("/proc/sys/net/ipv4/ip_unprivileged_port_start") << "1000";
    startServing(mOptions);
    EXPECT_THAT(mpDaemon->output().with("[Error]"), IsEmpty());
    expectService();
}

TEST_F(AsNobody, WithoutTheRightItSaysThatThereIsNoServer) {
    std::ofstream("/proc/sys/net/ipv4/ip_unprivileged_port_start") << "1024";
    startServing(mOptions);
    EXPECT_THAT(mpDaemon->output().with("[Error]"),
                ElementsAre("[Error]Socket Server create failed!"));
}

} // namespace
