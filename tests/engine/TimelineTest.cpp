// SPDX-License-Identifier: MIT
#include "player/Timeline.h"

#include <gtest/gtest.h>

using engine::Timeline;
using std::chrono::seconds;

TEST(Timeline, CountsFromZeroWhileItIsEmpty) {
    EXPECT_EQ(Timeline().positionAt(seconds(3)), seconds(3));
}

TEST(Timeline, ReckonsFromTheSpanThatIsBeingPlayed) {
    Timeline timeline;
    timeline.add({seconds(0), seconds(10)});
    timeline.add({seconds(5), seconds(12)});
    EXPECT_EQ(timeline.positionAt(seconds(4)), seconds(14));
    EXPECT_EQ(timeline.positionAt(seconds(5)), seconds(12));
    EXPECT_EQ(timeline.positionAt(seconds(6)), seconds(13));
}

TEST(Timeline, StandsBeforeItsFirstSpan) {
    Timeline timeline;
    timeline.add({seconds(5), seconds(12)});
    EXPECT_EQ(timeline.positionAt(seconds(1)), seconds(12));
}

TEST(Timeline, TakesASpanAtTheSameTimeForACorrection) {
    Timeline timeline;
    timeline.add({seconds(0), seconds(10)});
    timeline.add({seconds(0), seconds(20)});
    EXPECT_EQ(timeline.positionAt(seconds(1)), seconds(21));
}

TEST(Timeline, KeepsTheNewestOfManySpans) {
    Timeline timeline;
    for (int round = 0; round < 100; ++round)
        timeline.add({seconds(round), seconds(7)});
    EXPECT_EQ(timeline.last().base, seconds(99));
    EXPECT_EQ(timeline.positionAt(seconds(98)), seconds(7));
    timeline.clear();
    EXPECT_TRUE(timeline.isEmpty());
}
