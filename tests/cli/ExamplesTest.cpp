// SPDX-License-Identifier: MIT
#include <filesystem>
#include <unistd.h>

#include "tests/cli/support/ToolTest.h"

using testing::HasSubstr;

namespace {

class Examples : public ToolTest {
protected:
    /** Takes the tour, which ends the daemon. */
    std::string tour(const std::string& file) {
        Tool tool(QNS_TOUR, {file}, Tool::Output::pipe);
        EXPECT_EQ(tool.waitForExit(), 0) << tool.output() << tool.errors();
        EXPECT_EQ(mpDaemon->waitForExit(), 0);
        return tool.output();
    }
};

TEST_F(Examples, TheTourTellsEveryStepOfAFilm) {
    const std::string told = tour(sample::filmWithUnicodeName());
    std::size_t at = 0;
    for (const char* step : {"Registered as identity 1000, client id 1",
                             "Described ",
                             "video/mp4",
                             "H.264",
                             "Imported ",
                             "Opened ",
                             "1 video, 1 audio, 0 text",
                             "duration: 0:10.0; seekable",
                             "Playing\n",
                             "  at 0:00.",
                             "Paused at ",
                             "Playing again",
                             "Sought to 0:05.0",
                             "Looping from 0:05.0 to 0:06.0",
                             "returned to the start (1)",
                             "returned to the start (2)",
                             "Loop ended",
                             "Sought to 0:08.5",
                             "End of the file",
                             "Closed",
                             "Power-off accepted"}) {
        const std::size_t found = told.find(step, at);
        ASSERT_NE(found, std::string::npos) << step << " is not in\n" << told.substr(at);
        at = found;
    }
}

TEST_F(Examples, TheTourLeavesOutWhatAShortSoundCannotDo) {
    EXPECT_THAT(tour(sample::shortSound()), HasSubstr("Too short"));
}

TEST_F(Examples, TheTourLeavesOutWhatAPictureCannotDo) {
    EXPECT_THAT(tour(QNS_SOURCE_DIR "/share/mediaplayer/images/black.jpg"),
                HasSubstr("Without a duration"));
}

TEST_F(Examples, TheTourDrawsAPictureWhereItMay) {
    const std::string folder = testing::TempDir() + "/qns-tour-" + std::to_string(::getpid());
    std::filesystem::create_directory(folder);
    Tool tool(QNS_TOUR, {sample::shortSound(), folder}, Tool::Output::pipe);
    EXPECT_EQ(tool.waitForExit(), 0) << tool.errors();
    EXPECT_THAT(tool.output(), HasSubstr("No picture: image: not available"));
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
    std::filesystem::remove_all(folder);
}

TEST_F(Examples, TheTourSaysWhatCannotBePlayed) {
    Tool tool(QNS_TOUR, {sample::noise()}, Tool::Output::pipe);
    EXPECT_EQ(tool.waitForExit(), 1);
    EXPECT_THAT(tool.output(), HasSubstr("Not imported: not media"));
    EXPECT_THAT(tool.errors(), testing::StartsWith("Failed: "));
}

TEST_F(Examples, TheShortestProgramPlaysAFileToItsEnd) {
    Tool tool(QNS_EXAMPLE_PLAY, {sample::shortSound()}, Tool::Output::pipe);
    EXPECT_EQ(tool.waitForExit(), 0) << tool.errors();
    EXPECT_TRUE(mpDaemon->waitForLine("MediaPlayerController::play"));
}

TEST_F(Examples, AnotherTellsWhatAFileIsAndDrawsIt) {
    const std::string picture =
        testing::TempDir() + "/qns-example-" + std::to_string(::getpid()) + ".png";
    Tool tool(QNS_EXAMPLE_DESCRIBE, {sample::film(), picture}, Tool::Output::pipe);
    EXPECT_EQ(tool.waitForExit(), 0) << tool.errors();
    EXPECT_THAT(tool.output(), testing::StartsWith("TITLE: A film\n"));
    EXPECT_THAT(tool.output(), HasSubstr(", 320x180\nAAC"));
    EXPECT_TRUE(std::filesystem::remove(picture));
}

TEST_F(Examples, AnotherCopiesAFileIntoTheLibrary) {
    Tool tool(QNS_EXAMPLE_IMPORT, {sample::film(), "films"}, Tool::Output::pipe);
    EXPECT_EQ(tool.waitForExit(), 0) << tool.errors();
    EXPECT_THAT(tool.output(), testing::EndsWith("/media/films/film.mp4\n"));
}

TEST_F(Examples, TheySayWhatCannotBeDone) {
    Tool describe(QNS_EXAMPLE_DESCRIBE, {sample::noise(), "/p.png"}, Tool::Output::pipe);
    EXPECT_EQ(describe.waitForExit(), 1);
    EXPECT_THAT(describe.errors(), HasSubstr("not media"));
}

TEST_F(Examples, TheySayWhatCannotBeImported) {
    Tool import(QNS_EXAMPLE_IMPORT, {"/no/such", "films"}, Tool::Output::pipe);
    EXPECT_EQ(import.waitForExit(), 1);
    EXPECT_EQ(import.errors(), "not found\n");
}

} // namespace
