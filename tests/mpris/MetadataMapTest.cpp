// SPDX-License-Identifier: MIT
#include "mpris/MetadataMap.h"

#include <cstdint>
#include <vector>

#include <gmock/gmock.h>

using namespace std::chrono_literals;
using mpris::MetadataMap;
using mpris::metadataOf;
using mpris::Track;
using testing::ElementsAre;

namespace {

Track trackAt(const std::string& path) {
    Track track;
    track.number = 3;
    track.path = path;
    return track;
}

Track trackWith(std::vector<std::pair<std::string, std::string>> tags) {
    Track track = trackAt("/a/b.mp3");
    track.tags = std::move(tags);
    return track;
}

std::string text(const MetadataMap& map, const char* key) {
    return map.at(key).get<std::string>();
}

std::vector<std::string> list(const MetadataMap& map, const char* key) {
    return map.at(key).get<std::vector<std::string>>();
}

TEST(Metadata, IsEmptyWithoutATrack) {
    EXPECT_TRUE(metadataOf({}).empty());
}

TEST(Metadata, NamesTheTrackAndItsPlace) {
    Track track = trackAt("/a ü/b.mp4");
    track.duration = 2s;
    track.picture = "/run/3.jpg";
    const MetadataMap map = metadataOf(track);
    EXPECT_EQ(map.at("mpris:trackid").get<sdbus::ObjectPath>(), "/qnsmedia/track/3");
    EXPECT_EQ(map.at("mpris:length").get<std::int64_t>(), 2'000'000);
    EXPECT_EQ(text(map, "mpris:artUrl"), "file:///run/3.jpg");
    EXPECT_EQ(text(map, "xesam:url"), "file:///a%20%C3%BC/b.mp4");
    EXPECT_EQ(text(map, "xesam:title"), "b.mp4");
}

TEST(Metadata, LeavesOutWhatIsNotKnown) {
    const MetadataMap map = metadataOf(trackAt(""));
    EXPECT_EQ(map.size(), 1U);
    EXPECT_EQ(map.count("mpris:trackid"), 1U);
}

TEST(Metadata, LeavesUrisAsTheyAre) {
    EXPECT_EQ(text(metadataOf(trackAt("http://host/a%20b")), "xesam:url"), "http://host/a%20b");
    const MetadataMap file = metadataOf(trackAt("file:///a/b%20c.mp3"));
    EXPECT_EQ(text(file, "xesam:url"), "file:///a/b%20c.mp3");
    EXPECT_EQ(text(file, "xesam:title"), "b c.mp3");
}

TEST(Metadata, TellsTagsInTheBussWords) {
    const MetadataMap map = metadataOf(trackWith({{"TITLE", "t"},
                                                  {"ARTIST", "a"},
                                                  {"ALBUM", "b"},
                                                  {"ALBUMARTIST", "c"},
                                                  {"DATE", "1999-12-31"},
                                                  {"GENRE", "d"},
                                                  {"COMPOSER", "e"},
                                                  {"COMMENT", "f"},
                                                  {"ENCODER", "g"}}));
    EXPECT_EQ(text(map, "xesam:title"), "t");
    EXPECT_THAT(list(map, "xesam:artist"), ElementsAre("a"));
    EXPECT_EQ(text(map, "xesam:album"), "b");
    EXPECT_THAT(list(map, "xesam:albumArtist"), ElementsAre("c"));
    EXPECT_EQ(text(map, "xesam:contentCreated"), "1999-12-31");
    EXPECT_THAT(list(map, "xesam:genre"), ElementsAre("d"));
    EXPECT_THAT(list(map, "xesam:composer"), ElementsAre("e"));
    EXPECT_THAT(list(map, "xesam:comment"), ElementsAre("f"));
    EXPECT_EQ(map.size(), 10U) << "and the track's id and its URL, but no ENCODER";
}

TEST(Metadata, CollectsTagsThatComeSeveralTimes) {
    EXPECT_THAT(list(metadataOf(trackWith({{"ARTIST", "a"}, {"ARTIST", "b"}})), "xesam:artist"),
                ElementsAre("a", "b"));
}

TEST(Metadata, ReadsNumbersFromTheirBeginning) {
    const MetadataMap map = metadataOf(trackWith({{"TRACKNUMBER", "3/12"}, {"DISCNUMBER", "2"}}));
    EXPECT_EQ(map.at("xesam:trackNumber").get<std::int32_t>(), 3);
    EXPECT_EQ(map.at("xesam:discNumber").get<std::int32_t>(), 2);
    EXPECT_EQ(metadataOf(trackWith({{"TRACKNUMBER", "A1"}})).count("xesam:trackNumber"), 0U);
    EXPECT_EQ(metadataOf(trackWith({{"TRACKNUMBER", "99999999999"}})).count("xesam:trackNumber"),
              0U);
}

TEST(Metadata, HasNothingThatABusWouldRefuse) {
    const MetadataMap map = metadataOf(trackWith({{"TITLE", "\xFC"}, {"ARTIST", "\xFC"}}));
    EXPECT_EQ(text(map, "xesam:title"), "\xEF\xBF\xBD");
    EXPECT_THAT(list(map, "xesam:artist"), ElementsAre("\xEF\xBF\xBD"));
    EXPECT_EQ(text(metadataOf(trackAt("/\xFC")), "xesam:title"), "\xEF\xBF\xBD");
    EXPECT_EQ(text(metadataOf(trackAt("http://\xFC")), "xesam:url"), "http://\xEF\xBF\xBD");
}

} // namespace
