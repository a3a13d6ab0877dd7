// SPDX-License-Identifier: MIT
#include <csignal>
#include <cstdint>
#include <limits>
#include <nlohmann/json.hpp>
#include <string>

#include "tests/mpris/support/MprisTest.h"

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

namespace {

constexpr std::int64_t kSecond = 1'000'000; // in microseconds, as the bus counts

class MprisPlayback : public MprisTest {
protected:
    bool waitForStatus(const std::string& status) {
        return mDesktop.waitForChange("PlaybackStatus", status);
    }

    bool waitForJumps(std::size_t count) {
        return mDesktop.waitUntil([&] { return mDesktop.jumps().size() >= count; });
    }

    sdbus::ObjectPath trackId() {
        return mDesktop.get<BusClient::Properties>("Metadata")
            .at("mpris:trackid")
            .get<sdbus::ObjectPath>();
    }
};

TEST_F(MprisPlayback, IsStoppedUntilAMediumIsOpened) {
    EXPECT_EQ(playerctl({"status"}), "Stopped");
    EXPECT_FALSE(mDesktop.get<bool>("CanPlay"));
    EXPECT_FALSE(mDesktop.get<bool>("CanPause"));
    EXPECT_FALSE(mDesktop.get<bool>("CanSeek"));
    EXPECT_TRUE(mDesktop.get<bool>("CanControl"));
    EXPECT_THAT(mDesktop.get<BusClient::Properties>("Metadata"), IsEmpty());
}

TEST_F(MprisPlayback, DoesNothingWithoutAMedium) {
    for (const char* const method : {"Play", "Pause", "PlayPause", "Stop", "Next", "Previous"})
        EXPECT_NO_THROW(mDesktop.call(method)) << method;
    EXPECT_NO_THROW(mDesktop.call("Seek", kSecond));
    EXPECT_NO_THROW(mDesktop.set("LoopStatus", std::string("Track")));
    EXPECT_EQ(playerctl({"status"}), "Stopped");
    EXPECT_EQ(playerctl({"loop"}), "None");
}

TEST_F(MprisPlayback, ObeysPlayerctl) {
    playerctl({"open", sample::film()});
    EXPECT_TRUE(waitForStatus("Playing"));
    playerctl({"pause"});
    EXPECT_TRUE(waitForStatus("Paused"));
    EXPECT_EQ(playerctl({"status"}), "Paused");
    playerctl({"position", "5"});
    EXPECT_TRUE(waitForJumps(1));
    EXPECT_EQ(playerctl({"position"}), "5.000000");
    playerctl({"position", "2-"});
    EXPECT_TRUE(waitForJumps(2));
    EXPECT_EQ(playerctl({"position"}), "3.000000");
    playerctl({"play"});
    EXPECT_TRUE(waitForStatus("Playing"));
    playerctl({"stop"});
    EXPECT_TRUE(waitForStatus("Stopped"));
}

TEST_F(MprisPlayback, IsFollowedByPlayerctl) {
    Tool follower(QNS_PLAYERCTL, {"--player", "qnsmedia", "--follow", "status"},
                  Tool::Output::pipe);
    EXPECT_TRUE(follower.waitFor("Stopped\n"));
    play(sample::film());
    EXPECT_TRUE(follower.waitFor("Playing\n"));
    mDesktop.call("PlayPause");
    EXPECT_TRUE(follower.waitFor("Paused\n"));
    mDesktop.call("PlayPause");
    EXPECT_TRUE(follower.waitFor("Playing\n"));
}

TEST_F(MprisPlayback, ShowsWhatAnotherClientDoes) {
    Tool tool(withIdentity({"play", sample::film()}), Tool::Output::terminal);
    ASSERT_TRUE(tool.waitFor("playing"));
    EXPECT_TRUE(waitForStatus("Playing"));
    EXPECT_THAT(playerctl({"metadata", "xesam:url"}), HasSubstr("film.mp4"));
    tool.press(" ");
    EXPECT_TRUE(waitForStatus("Paused"));
    tool.press("\x1b[C");
    EXPECT_TRUE(waitForJumps(1));
    tool.press("q");
    EXPECT_EQ(tool.waitForExit(), 0);
    EXPECT_TRUE(waitForStatus("Stopped")) << "which nobody notifies";
    EXPECT_THAT(mDesktop.get<BusClient::Properties>("Metadata"), IsEmpty());
    EXPECT_FALSE(mDesktop.get<bool>("CanPlay"));
}

TEST_F(MprisPlayback, ShowsAMediumThatIsOpenAlready) {
    endBridge();
    Tool tool(withIdentity({"play", sample::film()}));
    tool.waitFor("playing  0:01");
    startBridge();
    EXPECT_TRUE(waitForStatus("Playing"));
    EXPECT_GE(mDesktop.get<std::int64_t>("Position"), kSecond);
    EXPECT_NEAR(static_cast<double>(mDesktop.toldMetadata().at("mpris:length").get<std::int64_t>()),
                10.0 * kSecond, 0.1 * kSecond);
    mDesktop.call("Seek", 2 * kSecond);
    EXPECT_TRUE(waitForJumps(1));
}

TEST_F(MprisPlayback, TellsWherePlaybackIs) {
    play(sample::film());
    EXPECT_TRUE(
        mDesktop.askUntil([&] { return mDesktop.get<std::int64_t>("Position") > kSecond; }));
    mDesktop.call("Pause");
    EXPECT_TRUE(waitForStatus("Paused"));
    const auto shown = mDesktop.get<std::int64_t>("Position");
    Tool status(withIdentity({"status", "--json"}));
    EXPECT_EQ(status.waitForExit(), 0);
    EXPECT_EQ(nlohmann::json::parse(status.output()).at("position_ns").get<long>() / 1000, shown);
}

TEST_F(MprisPlayback, SeeksOnlyInsideTheTrackThatIsMeant) {
    play(sample::film());
    mDesktop.call("Pause");
    mDesktop.call("SetPosition", sdbus::ObjectPath("/qnsmedia/track/99"), 3 * kSecond);
    mDesktop.call("SetPosition", trackId(), -kSecond);
    mDesktop.call("SetPosition", trackId(), 11 * kSecond);
    mDesktop.call("SetPosition", trackId(), 4 * kSecond);
    EXPECT_TRUE(waitForJumps(1));
    EXPECT_THAT(mDesktop.jumps(), ElementsAre(4 * kSecond));
}

TEST_F(MprisPlayback, SeeksNoFurtherThanTheBeginning) {
    play(sample::film());
    mDesktop.call("Pause");
    mDesktop.call("Seek", std::numeric_limits<std::int64_t>::min());
    EXPECT_TRUE(waitForJumps(1));
    EXPECT_THAT(mDesktop.jumps(), ElementsAre(0));
}

TEST_F(MprisPlayback, PlaysTheSameTrackAgainAfterAStop) {
    play(sample::film());
    const std::string track = trackId();
    mDesktop.call("Stop");
    EXPECT_TRUE(waitForStatus("Stopped"));
    expectClosed();
    EXPECT_EQ(mDesktop.get<std::int64_t>("Position"), 0);
    EXPECT_TRUE(mDesktop.get<bool>("CanPlay"));
    mDesktop.call("Play");
    EXPECT_TRUE(waitForStatus("Playing"));
    EXPECT_EQ(trackId(), track);
}

TEST_F(MprisPlayback, PlaysFromTheBeginningAfterTheEnd) {
    play(sample::shortSound());
    EXPECT_TRUE(waitForStatus("Stopped"));
    EXPECT_NEAR(static_cast<double>(mDesktop.get<std::int64_t>("Position")), kSecond, 1000);
    mDesktop.call("Play");
    EXPECT_TRUE(waitForStatus("Playing"));
    EXPECT_TRUE(waitForStatus("Stopped"));
}

TEST_F(MprisPlayback, RepeatsATrackUntilThatIsEnded) {
    play(sample::shortSound());
    playerctl({"loop", "Track"});
    EXPECT_TRUE(mDesktop.waitForChange<std::string>("LoopStatus", "Track"));
    EXPECT_EQ(playerctl({"loop"}), "Track");
    EXPECT_TRUE(waitForJumps(2)) << "it has gone back twice";
    EXPECT_EQ(mDesktop.get<std::string>("PlaybackStatus"), "Playing");
    playerctl({"loop", "None"});
    EXPECT_TRUE(mDesktop.waitForChange<std::string>("LoopStatus", "None"));
    EXPECT_TRUE(waitForStatus("Stopped"));
}

TEST_F(MprisPlayback, KnowsNoLoopOfLists) {
    play(sample::film());
    EXPECT_THROW(mDesktop.set("LoopStatus", std::string("Playlist")), sdbus::Error);
    EXPECT_EQ(playerctl({"loop"}), "None");
}

TEST_F(MprisPlayback, PausesWhenTheRateIsNothing) {
    play(sample::film());
    mDesktop.set("Rate", 2.0);
    mDesktop.set("Rate", 0.0);
    EXPECT_TRUE(waitForStatus("Paused"));
    EXPECT_EQ(mDesktop.get<double>("Rate"), 1.0);
    EXPECT_EQ(mDesktop.get<double>("MinimumRate"), 1.0);
    EXPECT_EQ(mDesktop.get<double>("MaximumRate"), 1.0);
}

TEST_F(MprisPlayback, HasNoVolumeToSet) {
    EXPECT_EQ(mDesktop.get<double>("Volume"), 1.0);
    EXPECT_THROW(mDesktop.set("Volume", 0.5), sdbus::Error);
}

} // namespace
