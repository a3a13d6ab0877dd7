// SPDX-License-Identifier: MIT
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include "tests/mpris/support/MprisTest.h"

namespace fs = std::filesystem;
using testing::Contains;
using testing::EndsWith;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::StartsWith;

namespace {

constexpr const char* kRoot = "org.mpris.MediaPlayer2";

class MprisTracks : public MprisTest {
protected:
    /** The files in the folder of pictures. */
    std::vector<std::string> pictures() {
        std::vector<std::string> names;
        for (const auto& entry : fs::recursive_directory_iterator(mBus.runtimeFolder().path("")))
            if (entry.is_regular_file())
                names.push_back(entry.path().filename());
        return names;
    }

    std::string refusal(const std::string& uri) {
        try {
            mDesktop.call("OpenUri", uri);
        } catch (const sdbus::Error& error) {
            return error.getName() + ": " + error.getMessage();
        }
        return {};
    }
};

TEST_F(MprisTracks, ShowTheirTags) {
    play(sample::film());
    EXPECT_TRUE(mDesktop.waitUntil([&] {
        const auto metadata = mDesktop.toldMetadata();
        return metadata.count("xesam:title") == 1 &&
               metadata.at("xesam:title").get<std::string>() == "A film";
    }));
    EXPECT_EQ(playerctl({"metadata", "title"}), "A film");
    EXPECT_EQ(playerctl({"metadata", "xesam:url"}), "file://" + sample::film());
    EXPECT_NEAR(std::stod(playerctl({"metadata", "mpris:length"})), 10e6, 1e5);
}

TEST_F(MprisTracks, ShowAPictureWhichIsGoneAtTheEnd) {
    play(sample::film());
    EXPECT_TRUE(mDesktop.waitForMetadata("mpris:artUrl"));
    const std::string url = playerctl({"metadata", "mpris:artUrl"});
    ASSERT_THAT(url, StartsWith("file:///"));
    const std::string path = url.substr(7);
    std::string begin(2, ' ');
    std::ifstream(path, std::ios::binary).read(begin.data(), 2);
    EXPECT_EQ(begin, "\xFF\xD8") << "a JPEG file";
    endBridge();
    EXPECT_FALSE(fs::exists(path));
    EXPECT_THAT(pictures(), IsEmpty());
}

TEST_F(MprisTracks, HavePicturesWhereTheyAreWanted) {
    endBridge();
    const TestFolder folder;
    startBridge({"--pictures", folder.path("")});
    play(sample::film());
    EXPECT_TRUE(mDesktop.waitForMetadata("mpris:artUrl"));
    EXPECT_EQ(playerctl({"metadata", "mpris:artUrl"}),
              "file://" + folder.path("qnsmedia-mpris-1.jpg"));
    EXPECT_TRUE(folder.has("qnsmedia-mpris-1.jpg"));
    EXPECT_THAT(pictures(), IsEmpty());
    endBridge();
    EXPECT_FALSE(folder.has("qnsmedia-mpris-1.jpg"));
    EXPECT_TRUE(folder.has("")) << "which was there before";
}

TEST_F(MprisTracks, HaveNoPictureButTheirOwn) {
    play(sample::film());
    EXPECT_TRUE(mDesktop.waitForMetadata("mpris:artUrl"));
    play(sample::shortSound());
    EXPECT_EQ(mDesktop.get<BusClient::Properties>("Metadata").count("mpris:artUrl"), 0U);
    play(sample::filmWithUnicodeName());
    EXPECT_TRUE(mDesktop.waitForMetadata("mpris:artUrl"));
    EXPECT_THAT(playerctl({"metadata", "mpris:artUrl"}), EndsWith("/qnsmedia-mpris-3.jpg"));
    EXPECT_THAT(pictures(), testing::ElementsAre("qnsmedia-mpris-3.jpg"));
}

TEST_F(MprisTracks, MayHaveAnyName) {
    playerctl({"open", sample::filmWithUnicodeName()});
    EXPECT_TRUE(mDesktop.waitForChange<std::string>("PlaybackStatus", "Playing"));
    const auto url = playerctl({"metadata", "xesam:url"});
    EXPECT_THAT(url, HasSubstr("%20"));
    EXPECT_EQ(refusal(url), "") << "what is shown can be opened";
}

TEST_F(MprisTracks, ThatCannotBeOpenedAreRefusedWithAReason) {
    EXPECT_THAT(refusal("file:///no/such/film.mp4"),
                StartsWith("org.freedesktop.DBus.Error.Failed: "));
    EXPECT_THAT(refusal("file://" + sample::noise()),
                StartsWith("org.freedesktop.DBus.Error.Failed: "));
    EXPECT_EQ(playerctl({"status"}), "Stopped");
}

TEST_F(MprisTracks, ThatAreNoUrisAreRefused) {
    for (const char* const uri : {"", "film.mp4", "file:film.mp4", "file:///%zz", "mailto:me"})
        EXPECT_THAT(refusal(uri), StartsWith("org.freedesktop.DBus.Error.InvalidArgs: ")) << uri;
    EXPECT_EQ(playerctl({"status"}), "Stopped");
}

TEST_F(MprisTracks, AreOfTypesThatTheDaemonCanOpen) {
    EXPECT_TRUE(mDesktop.waitUntil([&] {
        return !mDesktop.get<std::vector<std::string>>("SupportedMimeTypes", kRoot).empty();
    }));
    const auto types = mDesktop.get<std::vector<std::string>>("SupportedMimeTypes", kRoot);
    EXPECT_THAT(types, Contains("video/mp4"));
    EXPECT_THAT(types, Not(Contains("")));
    EXPECT_THAT(mDesktop.get<std::vector<std::string>>("SupportedUriSchemes", kRoot),
                Contains("file"));
    EXPECT_EQ(mDesktop.get<std::string>("Identity", kRoot), "QNSMediaService");
    EXPECT_FALSE(mDesktop.get<bool>("CanQuit", kRoot));
    EXPECT_FALSE(mDesktop.get<bool>("CanRaise", kRoot));
    EXPECT_FALSE(mDesktop.get<bool>("HasTrackList", kRoot));
}

} // namespace
