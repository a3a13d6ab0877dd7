// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "cli/HumanSize.h"
#include "cli/ImportOutcomes.h"
#include "cli/ImportProgress.h"

using namespace std::chrono_literals;
using qnsmedia::ImportNotification;
using qnsmedia::ImportNotificationKind;

namespace {

TEST(HumanSize, HasThreeDigitsAtMost) {
    EXPECT_EQ(humanSize(0), "0 B");
    EXPECT_EQ(humanSize(999), "999 B");
    EXPECT_EQ(humanSize(1000), "1.0 kB");
    EXPECT_EQ(humanSize(1540), "1.5 kB");
    EXPECT_EQ(humanSize(9990), "10 kB");
    EXPECT_EQ(humanSize(999'499), "999 kB");
    EXPECT_EQ(humanSize(999'500), "1.0 MB");
    EXPECT_EQ(humanSize(23'400'000), "23 MB");
    EXPECT_EQ(humanSize(INT64_MAX), "9.2 EB");
}

TEST(ImportProgress, ShowsFilesAndBytes) {
    EXPECT_EQ(progressText({3, 12, 500, 2000, 100ms}),
              "[#####...............] 3/12 files, 500 B of 2.0 kB");
    EXPECT_EQ(progressText({0, 0, 0, 0, 0ms}), "[####################] 0/0 files, 0 B of 0 B");
    EXPECT_EQ(progressText({1, 2, 0, 0, 0ms}), "[##########..........] 1/2 files, 0 B of 0 B");
}

TEST(ImportProgress, ShowsRateAndTimeLeftOnceTheyMeanSomething) {
    EXPECT_EQ(progressText({1, 4, 1'000'000, 4'000'000, 10s}),
              "[#####...............] 1/4 files, 1.0 MB of 4.0 MB, 100 kB/s, 0:30 left");
    EXPECT_LE(progressText({99'999, 100'000, INT64_MAX / 3, INT64_MAX, 1000h}).size(), 90U);
}

class Outcomes : public testing::Test {
protected:
    static ImportNotification finished(int result, const std::string& text) {
        ImportNotification notification;
        notification.kind = ImportNotificationKind::finished;
        notification.result = result;
        notification.text = text;
        return notification;
    }

    const std::vector<ImportFile> mFiles = {
        {"/a/song.mp3", "/a/song.mp3", 1}, {"/b/song.mp3", "/b/song.mp3", 2}, {"/l", "/c/film", 4}};
};

TEST_F(Outcomes, AreBelievedWhenTheyNameAFile) {
    ImportOutcomes outcomes(mFiles, "");
    outcomes.tell(finished(0, "/c/film"));
    EXPECT_TRUE(outcomes.of(2).known);
    EXPECT_EQ(outcomes.of(2).text, "/c/film");
    outcomes.tell(finished(0, "/another/song.mp3"));
    outcomes.tell(finished(3, "Broken: /another/song.mp3"));
    outcomes.tell(finished(8, ""));
    EXPECT_EQ(outcomes.knownCount(), 1U);
    EXPECT_EQ(outcomes.knownBytes(), 4);
    outcomes.tell(finished(4, "The file is damaged: /b/song.mp3"));
    EXPECT_EQ(outcomes.of(1).result, 4);
    outcomes.tell(finished(8, "It cannot be written: /a/song.mp3 (No space left on device)"));
    EXPECT_EQ(outcomes.of(0).result, 8);
    EXPECT_EQ(outcomes.knownCount(), 3U);
}

TEST_F(Outcomes, OfCopiesAreToldByTheNamesInTheFolder) {
    ImportOutcomes outcomes(mFiles, "/music//");
    outcomes.tell(finished(0, "/data/media/other/song.mp3"));
    EXPECT_EQ(outcomes.knownCount(), 0U);
    outcomes.tell(finished(0, "/data/media/music/song.mp3"));
    outcomes.tell(finished(0, "/data/media/music/song.mp3"));
    EXPECT_EQ(outcomes.knownCount(), 1U) << "told twice it is the same one";
    EXPECT_TRUE(outcomes.of(0).known);
    outcomes.tell(finished(0, "/data/media/music/song (x).mp3"));
    outcomes.tell(finished(0, "/data/media/music/song ().mp3"));
    EXPECT_EQ(outcomes.knownCount(), 1U);
    outcomes.tell(finished(0, "/data/media/music/film (2)"));
    EXPECT_EQ(outcomes.of(2).text, "/data/media/music/film (2)");
}

TEST_F(Outcomes, WithoutANameAreThoseOfTheFileOnItsWay) {
    ImportOutcomes outcomes(mFiles, "");
    outcomes.setCurrent(1);
    outcomes.tell(finished(3, ""));
    EXPECT_EQ(outcomes.of(1).result, 3);
    EXPECT_EQ(outcomes.of(1).text, "not media, or no decoder for it");
    outcomes.tell(finished(0, "/b/song.mp3"));
    EXPECT_EQ(outcomes.of(1).result, 0) << "the failure was another client's";
    outcomes.tell(finished(3, ""));
    EXPECT_EQ(outcomes.of(1).result, 0);
    outcomes.setNoCurrent();
    outcomes.tell(finished(3, ""));
    EXPECT_EQ(outcomes.knownCount(), 1U);
}

TEST_F(Outcomes, OfFilesOfOneNameAreToldApartOneByOne) {
    ImportOutcomes outcomes(mFiles, "music");
    EXPECT_FALSE(outcomes.isAmbiguous(0));
    EXPECT_TRUE(outcomes.isAmbiguous(1));
    outcomes.tell(finished(0, "/data/media/music/song.mp3"));
    outcomes.beginOneByOne();
    outcomes.setCurrent(1);
    outcomes.tell(finished(0, "/data/media/music/song.mp3"));
    EXPECT_EQ(outcomes.knownCount(), 1U) << "it is the first one's";
    outcomes.tell(finished(0, "/data/media/music/song (2).mp3"));
    EXPECT_EQ(outcomes.of(1).text, "/data/media/music/song (2).mp3");
}

TEST_F(Outcomes, WithAnotherNameAreThoseOfTheOnlyFileThatIsAskedFor) {
    ImportOutcomes outcomes(mFiles, "..");
    outcomes.setCurrent(1);
    outcomes.tell(finished(2, "Not inside the library: .."));
    EXPECT_EQ(outcomes.knownCount(), 0U);
    outcomes.beginOneByOne();
    outcomes.tell(finished(2, "Not inside the library: .."));
    EXPECT_EQ(outcomes.of(1).result, 2);
}

TEST_F(Outcomes, AreNeitherStartedNorProgress) {
    ImportOutcomes outcomes(mFiles, "");
    ImportNotification notification = finished(0, "/c/film");
    notification.kind = ImportNotificationKind::progress;
    outcomes.tell(notification);
    notification.kind = ImportNotificationKind::started;
    outcomes.tell(notification);
    EXPECT_EQ(outcomes.knownCount(), 0U);
}

} // namespace
