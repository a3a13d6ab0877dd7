// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "cli/EventText.h"

using qnsmedia::ImportNotification;
using qnsmedia::ImportNotificationKind;
using qnsmedia::NotificationKind;
using qnsmedia::PlayerNotification;

namespace {

PlayerNotification make(NotificationKind kind, long value) {
    PlayerNotification notification;
    notification.kind = kind;
    notification.value = value;
    return notification;
}

TEST(EventText, TellsEachEventOfThePlayer) {
    PlayerNotification opened = make(NotificationKind::opened, 2'500'000'000);
    opened.text = "/a film";
    opened.param1 = 1;
    opened.param2 = 2;
    opened.value1 = 3;
    EXPECT_EQ(eventText(opened),
              "player    opened  /a film: 1 video, 2 audio, 0 text, 0:02.5, seekable, live\n");
    PlayerNotification state = make(NotificationKind::state, 1'000'000'000);
    state.param1 = 3;
    state.param2 = 1;
    EXPECT_EQ(eventText(state), "player    state  paused -> playing, at 0:01.0\n");
    PlayerNotification buffering = make(NotificationKind::buffering, 0);
    buffering.param1 = 50;
    EXPECT_EQ(eventText(buffering), "player    buffering  50%\n");
    EXPECT_EQ(eventText(make(NotificationKind::end, 0)), "player    end  at 0:00.0\n");
    EXPECT_EQ(eventText(make(NotificationKind::loop, 0)), "player    loop  at 0:00.0\n");
    EXPECT_EQ(eventText(make(NotificationKind::seekFinished, 0)), "player    sought  at 0:00.0\n");
    EXPECT_EQ(eventText(make(static_cast<NotificationKind>(99), 0)),
              "player    unknown  at 0:00.0\n");
}

TEST(EventText, TellsWhatFailed) {
    PlayerNotification failure = make(NotificationKind::failure, 0);
    failure.result = 4;
    EXPECT_EQ(eventText(failure), "player    failure  failed: damaged\n");
    failure.text = "The file ends too early";
    EXPECT_EQ(eventText(failure), "player    failure  failed: The file ends too early\n");
}

TEST(EventText, TellsOfImports) {
    ImportNotification notification;
    notification.kind = ImportNotificationKind::started;
    notification.text = "/a";
    EXPECT_EQ(eventText(notification), "importer  started  /a\n");
    notification.kind = ImportNotificationKind::finished;
    notification.result = 6;
    EXPECT_EQ(eventText(notification), "importer  finished  failed: /a\n");
    EXPECT_EQ(eventJson(notification).dump(),
              R"({"service":"importer","event":"finished","result":6,"text":"/a"})");
}

TEST(EventJson, HasWhatMeansSomething) {
    PlayerNotification state = make(NotificationKind::state, 5);
    state.param1 = 4;
    state.param2 = 3;
    EXPECT_EQ(eventJson(state).dump(), R"({"service":"player","event":"state","result":0,)"
                                       R"("state":"ended","before":"playing","position_ns":5})");
    PlayerNotification opened = make(NotificationKind::opened, 7);
    opened.param2 = 1;
    EXPECT_EQ(eventJson(opened).at("audio_streams"), 1);
    EXPECT_EQ(eventJson(opened).at("duration_ns"), 7);
    EXPECT_FALSE(eventJson(opened).contains("position_ns"));
}

} // namespace
