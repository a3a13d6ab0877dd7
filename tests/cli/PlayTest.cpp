// SPDX-License-Identifier: MIT
#include <csignal>

#include <nlohmann/json.hpp>

#include "tests/cli/support/ToolTest.h"

using testing::EndsWith;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::StartsWith;

namespace {

class ToolPlay : public ToolTest {
protected:
    void expectCannotPlay(const std::string& file) {
        Tool tool(withIdentity({"play", file}));
        EXPECT_EQ(tool.waitForExit(), 1) << file;
        EXPECT_THAT(tool.errors(), StartsWith("qnsmedia: "));
        EXPECT_THAT(tool.output(), IsEmpty());
    }

    /** The signal ends a playback properly: the medium is closed. */
    void expectEndBy(int number) {
        Tool tool(withIdentity({"play", sample::film()}));
        tool.waitFor("playing");
        tool.signal(number);
        EXPECT_EQ(tool.waitForExit(), 128 + number);
        expectClosed();
    }
};

TEST_F(ToolPlay, TellsInPlainLinesWhereItIs) {
    Tool tool(withIdentity({"play", sample::shortSound()}));
    EXPECT_EQ(tool.waitForExit(), 0) << tool.errors();
    EXPECT_THAT(tool.output(),
                StartsWith(sample::shortSound() + ": 0 video, 1 audio, 0 text, 0:01.0\n"));
    EXPECT_THAT(tool.output(), HasSubstr(" / 0:01.0\n"));
    EXPECT_THAT(tool.output(), EndsWith("end\n"));
    EXPECT_THAT(tool.output(), Not(HasSubstr("\r")));
    EXPECT_THAT(tool.output(), Not(HasSubstr("\x1b")));
    EXPECT_THAT(tool.errors(), IsEmpty());
    expectClosed();
}

TEST_F(ToolPlay, PlaysFilesWithAnyName) {
    Tool tool(withIdentity({"play", sample::filmWithUnicodeName()}));
    EXPECT_TRUE(tool.waitFor("playing"));
    EXPECT_THAT(tool.output(), StartsWith(sample::filmWithUnicodeName() + ": 1 video, 1 audio"));
}

TEST_F(ToolPlay, ShowsAPictureUntilItIsInterrupted) {
    Tool tool(withIdentity({"play", QNS_SOURCE_DIR "/share/mediaplayer/images/black.jpg"}));
    EXPECT_TRUE(tool.waitFor("playing  0:01"));
    tool.signal(SIGINT);
    EXPECT_EQ(tool.waitForExit(), 130);
    EXPECT_THAT(tool.output(), HasSubstr("1 video, 0 audio"));
    expectClosed();
}

TEST_F(ToolPlay, SaysWhatCannotBePlayed) {
    expectCannotPlay(sample::noise());
    expectCannotPlay(sample::text());
    expectCannotPlay("/no/such/film.mp4");
    expectCannotPlay("");
}

TEST_F(ToolPlay, ClosesTheMediumWhenItIsInterrupted) {
    expectEndBy(SIGINT);
    expectEndBy(SIGTERM);
    expectEndBy(SIGHUP);
}

TEST_F(ToolPlay, ClosesTheMediumWhenNobodyReadsItsOutput) {
    Tool tool(withIdentity({"play", sample::film()}));
    tool.waitFor("playing");
    tool.closeOutput();
    EXPECT_EQ(tool.waitForExit(), 128 + SIGPIPE);
    EXPECT_THAT(tool.errors(), IsEmpty());
    expectClosed();
}

TEST_F(ToolPlay, SaysThatThereIsNoRoomForItsOutput) {
    Tool play(withIdentity({"play", sample::film()}), Tool::Output::full);
    EXPECT_EQ(play.waitForExit(), 1);
    EXPECT_THAT(play.errors(), HasSubstr("standard output"));
    expectClosed();
    Tool status(withIdentity({"status"}), Tool::Output::full);
    EXPECT_EQ(status.waitForExit(), 1);
}

TEST_F(ToolPlay, EndsWithTheDaemon) {
    Tool tool(withIdentity({"play", sample::film()}));
    tool.waitFor("playing");
    mpDaemon->signal(SIGKILL);
    EXPECT_EQ(tool.waitForExit(), 4);
    EXPECT_THAT(tool.errors(), StartsWith("qnsmedia: "));
    mpDaemon->waitForExit();
}

TEST_F(ToolPlay, LeavesThePlayerToAnotherClient) {
    Tool first(withIdentity({"play", sample::film()}));
    first.waitFor("playing");
    Tool second(withIdentity({"play", sample::filmWithUnicodeName()}));
    EXPECT_EQ(first.waitForExit(), 1);
    EXPECT_THAT(first.output(), EndsWith("ended by another client\n"));
    EXPECT_TRUE(second.waitFor("playing  0:01")) << "it was not closed by the first";
}

TEST_F(ToolPlay, TheStatusIsOneLine) {
    Tool status(withIdentity({"status"}));
    EXPECT_EQ(status.waitForExit(), 0);
    EXPECT_EQ(status.output(), "not ready  0:00.0 / 0:00.0\n");
}

TEST_F(ToolPlay, TheStatusCanBeReadByPrograms) {
    Tool tool(withIdentity({"play", sample::film()}));
    tool.waitFor("playing  0:01");
    Tool status(withIdentity({"status", "--json"}));
    EXPECT_EQ(status.waitForExit(), 0);
    const auto object = nlohmann::json::parse(status.output());
    EXPECT_EQ(object.at("state"), "playing");
    EXPECT_GE(object.at("position_ns").get<long>(), 1'000'000'000);
    EXPECT_NEAR(static_cast<double>(object.at("duration_ns").get<long>()), 10e9, 0.1e9);
}

} // namespace
