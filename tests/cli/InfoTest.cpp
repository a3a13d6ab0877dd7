// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>

#include <nlohmann/json.hpp>

#include "tests/cli/support/LibraryTest.h"

using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

namespace {

class ToolDiscovers : public LibraryTest {};

TEST_F(ToolDiscovers, TellsWhatAFileIs) {
    const std::string told = run({"info", sample::film()});
    EXPECT_THAT(told, StartsWith(sample::film() + "\n  container   video/mp4\n"
                                                  "  duration    0:10.0\n  video       H.264"));
    EXPECT_THAT(told, HasSubstr("\n  audio       AAC"));
    EXPECT_THAT(mErrors, IsEmpty());
}

TEST_F(ToolDiscovers, TellsOfManyFilesInOrderAndOfThoseThatAreNone) {
    std::vector<std::string> arguments{"info"};
    for (int round = 0; round < 5; ++round) {
        arguments.push_back(sample::film());
        arguments.push_back(sample::noise());
        arguments.push_back(sample::shortSound());
    }
    const std::string told = run(arguments, 1);
    std::size_t at = 0;
    for (int round = 0; round < 5; ++round) {
        for (const std::string& file : {sample::film(), sample::shortSound()}) {
            at = told.find(file + "\n  container", at);
            ASSERT_NE(at, std::string::npos) << told;
            ++at;
        }
    }
    EXPECT_THAT(mErrors, StartsWith("qnsmedia: " + sample::noise() + ": "));
}

TEST_F(ToolDiscovers, TellsProgramsToo) {
    const auto told =
        nlohmann::json::parse(run({"info", "--json", sample::film(), sample::shortSound()}));
    ASSERT_EQ(told.size(), 2U);
    EXPECT_EQ(told[0].at("file"), sample::film());
    EXPECT_EQ(told[0].at("video").size(), 1U);
    EXPECT_EQ(told[1].at("duration_ns").get<long>() / 100'000'000, 10);
    EXPECT_EQ(told[1].at("audio").at(0).at("channels"), 1);
    EXPECT_EQ(nlohmann::json::parse(run({"info", "--json", sample::noise()}, 1)),
              nlohmann::json::array());
}

TEST_F(ToolDiscovers, WritesPictures) {
    const std::string png = (mFolder / "a.png").string();
    run({"image", sample::film(), "-o", png, "--at", "50%", "--size", "64x0"});
    std::ifstream file(png, std::ios::binary);
    std::string head(4, '\0');
    file.read(head.data(), 4);
    EXPECT_EQ(head, "\x89PNG");
    const std::string raw = (mFolder / "a.raw").string();
    run({"image", sample::film(), "-o", raw, "--at", "0:01.5", "--size", "10x10"});
    EXPECT_EQ(std::filesystem::file_size(raw), 400U);
    run({"image", sample::shortSound(), "-o", raw}, 1);
    EXPECT_THAT(mErrors, HasSubstr("image: not available"));
}

TEST_F(ToolDiscovers, RefusesWhatIsNoTimeAndNoSize) {
    for (const char* time : {"", "x", "1:2:3:4", "1:60", "-1", "101%", "1e3", "%", "1:-2"})
        run({"image", "/a", "-o", "/b", "--at", time}, 2);
    for (const char* size : {"", "3", "3x", "x3", "3x3x", "-1x2", "999999x1", "3X3"})
        run({"image", "/a", "-o", "/b", "--size", size}, 2);
    run({"image", "/a"}, 2);
    run({"info"}, 2);
}

TEST_F(ToolDiscovers, ListsExtensions) {
    EXPECT_THAT(run({"extensions"}), HasSubstr("\nmp3\n"));
    EXPECT_THAT(nlohmann::json::parse(run({"extensions", "--json"})), testing::Contains("webm"));
}

} // namespace
