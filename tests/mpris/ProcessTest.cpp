// SPDX-License-Identifier: MIT
#include <csignal>
#include <cstdlib>
#include <string>

#include "tests/mpris/support/MprisTest.h"

using testing::AnyOf;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;

namespace {

/** The program where nothing that it needs is there. */
class MprisAlone : public testing::Test {
protected:
    /** Runs it to its end, which must come with this exit status; returns what it says of that. */
    static std::string errorsOf(std::vector<std::string> arguments, int status) {
        Tool tool(QNS_MPRIS, std::move(arguments), Tool::Output::pipe);
        EXPECT_EQ(tool.waitForExit(), status) << tool.errors();
        return tool.errors();
    }
};

TEST_F(MprisAlone, ExplainsItself) {
    Tool help(QNS_MPRIS, {"--help"}, Tool::Output::pipe);
    EXPECT_EQ(help.waitForExit(), 0);
    for (const char* const told : {"--identity", "--wait", "--version", "Exit status"})
        EXPECT_THAT(help.output(), HasSubstr(told));
    Tool version(QNS_MPRIS, {"--version"}, Tool::Output::pipe);
    EXPECT_EQ(version.waitForExit(), 0);
    EXPECT_THAT(version.output(), StartsWith("qnsmedia-mpris "));
}

TEST_F(MprisAlone, RefusesWrongUsage) {
    for (const char* const argument :
         {"--identity=999", "--identity=1008", "--nothing", "file", "--pictures=/no/such/folder"})
        EXPECT_NE(errorsOf({argument}, 2), "") << argument;
}

TEST_F(MprisAlone, NeedsABus) {
    EXPECT_THAT(errorsOf({}, 1), HasSubstr("no session bus"));
    ::setenv("DBUS_SESSION_BUS_ADDRESS", "unix:path=/no/such/bus", 1);
    EXPECT_THAT(errorsOf({}, 1), HasSubstr("no session bus"));
    ::unsetenv("DBUS_SESSION_BUS_ADDRESS");
}

TEST_F(MprisAlone, NeedsADaemon) {
    const BusProcess bus;
    EXPECT_THAT(errorsOf({}, 3), HasSubstr("not running"));
}

TEST_F(MprisAlone, CanBeEndedWhileItWaitsForADaemon) {
    const BusProcess bus;
    Tool tool(QNS_MPRIS, {"--wait"}, Tool::Output::pipe);
    BusClient desktop;
    EXPECT_TRUE(desktop.waitForClients(2)) << "the desktop and the program";
    tool.signal(SIGINT);
    EXPECT_EQ(tool.waitForExit(), 128 + SIGINT);
}

class MprisProcess : public MprisTest {
protected:
    void killDaemon() {
        mpDaemon->signal(SIGKILL);
        mpDaemon->waitForExit();
    }

    /** The bridge has ended by itself. */
    void expectEnd(int status) {
        EXPECT_EQ(mBridge->waitForExit(), status);
        mBridge.reset();
    }
};

TEST_F(MprisProcess, LeavesTheBusWhenASignalEndsIt) {
    mBridge->signal(SIGTERM);
    EXPECT_TRUE(mDesktop.waitForName(false));
    EXPECT_EQ(mBridge->errors(), "");
    expectEnd(128 + SIGTERM);
}

TEST_F(MprisProcess, IsAlone) {
    Tool second(QNS_MPRIS, withIdentity({}), Tool::Output::pipe);
    EXPECT_EQ(second.waitForExit(), 1);
    EXPECT_THAT(second.errors(), HasSubstr("another process"));
}

TEST_F(MprisProcess, NeedsAnIdentityThatIsFree) {
    Tool second(QNS_MPRIS, {"--identity=1000"}, Tool::Output::pipe);
    EXPECT_EQ(second.waitForExit(), 1);
    EXPECT_THAT(second.errors(), HasSubstr("1000"));
}

TEST_F(MprisProcess, EndsWithTheDaemon) {
    killDaemon();
    EXPECT_TRUE(mDesktop.waitForName(false));
    EXPECT_EQ(mBridge->waitForExit(), 4);
    EXPECT_THAT(mBridge->errors(), StartsWith("qnsmedia-mpris: "));
    mBridge.reset();
}

TEST_F(MprisProcess, EndsWithTheBus) {
    mBus.kill();
    EXPECT_EQ(mBridge->waitForExit(), 1);
    EXPECT_THAT(mBridge->errors(), StartsWith("qnsmedia-mpris: "));
    mBridge.reset();
}

/** The bridge waits for daemons. */
class WaitingMpris : public MprisProcess {
protected:
    void SetUp() override {
        ASSERT_NO_FATAL_FAILURE(ToolTest::SetUp());
        startBridge({"--wait"});
    }
};

TEST_F(WaitingMpris, ShowsTheNextDaemon) {
    play(sample::film());
    killDaemon();
    EXPECT_TRUE(mDesktop.waitForName(false));
    ASSERT_NO_FATAL_FAILURE(ToolTest::SetUp());
    EXPECT_TRUE(mDesktop.waitForName(true));
    EXPECT_EQ(mDesktop.get<std::string>("PlaybackStatus"), "Stopped");
    mDesktop.call("OpenUri", sample::film());
    EXPECT_TRUE(mDesktop.waitUntil(
        [&] { return mDesktop.get<std::string>("PlaybackStatus") == "Playing"; }));
}

/** With an engine that the test plays. */
class ScriptedMpris : public MprisProcess {
protected:
    void SetUp() override {
        DaemonOptions options = withEngineDouble();
        options.environment["QNS_ENGINE_DOUBLE"] = mEngine.address();
        start(options);
        mEngine.expectCall("player create null 15");
        ASSERT_TRUE(mpDaemon->waitUntilServing());
        startBridge();
    }

    EngineScript mEngine;
};

TEST_F(ScriptedMpris, AnswersWhoWaitsWhenTheDaemonEnds) {
    std::vector<std::string> errors;
    mDesktop.callLater("OpenUri", "/film", errors);
    mEngine.expectCall("player open \"/film\" 2");
    killDaemon();
    EXPECT_TRUE(mDesktop.waitUntil([&] { return !errors.empty(); }));
    EXPECT_THAT(errors, ElementsAre(AnyOf(HasSubstr("lost"), HasSubstr("ended"))));
    expectEnd(4);
}

TEST_F(ScriptedMpris, ShowsTextsInAnyEncoding) {
    mEngine.notify({1, 0, L"/\xDC", 1, 1, 0, 1, 0, 5'000'000'000});
    EXPECT_TRUE(mDesktop.waitForChange<std::string>("PlaybackStatus", "Paused"));
    EXPECT_EQ(mDesktop.toldMetadata().at("xesam:title").get<std::string>(), "\xC3\x9C");
}

} // namespace
