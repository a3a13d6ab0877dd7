// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>

#include <nlohmann/json.hpp>

#include "tests/cli/support/LibraryTest.h"

using testing::AllOf;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::StartsWith;

namespace {

class ToolReads : public LibraryTest {
protected:
    void SetUp() override {
        LibraryTest::SetUp();
        run({"import", sample::film(), sample::shortSound()});
    }

    [[nodiscard]] nlohmann::json json(std::vector<std::string> arguments) {
        return nlohmann::json::parse(run(std::move(arguments)));
    }
};

TEST_F(ToolReads, TheLibraryAsAList) {
    const auto rows = json({"library", "list", "--json"});
    ASSERT_EQ(rows.size(), 2U);
    EXPECT_EQ(rows[0].at("path"), sample::shortSound()) << "what has no artist comes first";
    EXPECT_EQ(rows[1].at("title"), "A film");
    EXPECT_EQ(rows[1].at("duration_ns").get<long>() / 1'000'000'000, 10);
}

TEST_F(ToolReads, WhatWordsAreFoundIn) {
    EXPECT_THAT(run({"library", "search", "FILM"}), HasSubstr("A film"));
    EXPECT_THAT(run({"library", "search", "fil", "a"}), HasSubstr("A film"))
        << "the beginnings of words will do";
    EXPECT_THAT(run({"library", "search", "short"}),
                AllOf(HasSubstr("short.wav"), Not(HasSubstr("film"))));
    EXPECT_THAT(run({"library", "search", "film", "nowhere"}), IsEmpty());
    EXPECT_EQ(json({"library", "search", "--json", "nowhere"}), nlohmann::json::array());
}

TEST_F(ToolReads, SearchWordsAsTheyAreWritten) {
    for (const char* words : {"\"", "film\" OR \"short", "NEAR(", "a AND", "*", "title:film",
                              "-film", "'; DROP TABLE media;", "   "})
        EXPECT_THAT(run({"library", "search", "--", words}), Not(HasSubstr("qnsmedia:"))) << words;
    EXPECT_EQ(json({"library", "list", "--json"}).size(), 2U);
}

TEST_F(ToolReads, AllOfAMediumByNumberOrPath) {
    const auto film = json({"library", "show", "--json", sample::film()});
    EXPECT_EQ(film.at("video").at(0).at("width"), 320);
    EXPECT_EQ(film.at("tags").at("TITLE"), "A film");
    EXPECT_EQ(json({"library", "show", "--json", std::to_string(film.at("id").get<int>())}), film);
    EXPECT_THAT(run({"library", "show", sample::film()}),
                AllOf(StartsWith(sample::film() + "\n  id  "),
                      HasSubstr("\n  container   video/mp4\n"),
                      HasSubstr("\n  video       H.264")));
    run({"library", "show", "4711"}, 1);
    EXPECT_THAT(mErrors, HasSubstr("not in the library: 4711"));
    run({"library", "show", ""}, 1);
}

TEST_F(ToolReads, EverythingForOtherPrograms) {
    const auto all = json({"library", "export"});
    ASSERT_EQ(all.size(), 2U);
    EXPECT_EQ(all[0].at("audio").at(0).at("channels"), 1);
    EXPECT_EQ(all[1].at("video").size(), 1U);
    EXPECT_EQ(json({"library", "export", "--json"}), all);
}

TEST_F(ToolReads, ADatabaseThatItIsTold) {
    const std::string database = dataFolder() / "mediaplayer/media.db";
    EXPECT_THAT(run({"library", "--database", database, "list"}), HasSubstr("A film"));
    run({"library", "--database", "/no/such.db", "list"}, 1);
    EXPECT_THAT(mErrors, HasSubstr("/no/such.db"));
    run({"library", "--database", sample::film(), "list"}, 1);
    EXPECT_THAT(mErrors, HasSubstr(sample::film()));
}

TEST_F(ToolReads, NothingWithoutAQuestion) {
    run({"library"}, 2);
    run({"library", "search"}, 2);
    run({"library", "show"}, 2);
}

} // namespace
