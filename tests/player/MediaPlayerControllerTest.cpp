// SPDX-License-Identifier: MIT
#include "player/MediaPlayerController.h"

#include <chrono>

#include <QMetaMethod>
#include <QSignalSpy>

#include "tests/player/PlayerFixture.h"
#include "tests/support/OutputCapture.h"

using platform_double::LogLine;
using testing::_;
using testing::DoAll;
using testing::ElementsAre;
using testing::InSequence;
using testing::Invoke;
using testing::IsEmpty;
using testing::Return;
using testing::SetArgReferee;

namespace {

const std::wstring kBlackPicture = L"/opt/caf\u00e9/share/mediaplayer/images/black.jpg";

class PlayerController : public testing::Test {
protected:
    PlayerController() {
        application();
        engineFactory().next = mpEngine = new testing::NiceMock<PlayerMock>;
        mController = std::make_unique<MediaPlayerController>();
        platform_double::takeLog();
    }

    testing::NiceMock<PlayerMock>* mpEngine = nullptr; ///< owned by the controller
    std::unique_ptr<MediaPlayerController> mController;
};

class PlayerControllerWithoutAnEngine : public testing::Test {
protected:
    PlayerControllerWithoutAnEngine() {
        application();
        engineFactory().next = nullptr;
    }
};

LogLine logLine(const std::string& text) {
    return {6, "MediaPlayerService 101: " + text};
}

} // namespace

TEST_F(PlayerController, AsksTheEngineForAPlayerWithoutAWindow) {
    EXPECT_EQ(engineFactory().window, nullptr);
    EXPECT_EQ(engineFactory().flags, 15U);
    EXPECT_TRUE(mpEngine->notify);
}

TEST_F(PlayerController, DeletesItsPlayer) {
    bool deleted = false;
    mpEngine->atDestruction = [&] { deleted = true; };
    mController.reset();
    EXPECT_TRUE(deleted);
}

TEST_F(PlayerController, ReturnsWhatTheEngineAnswers) {
    EXPECT_CALL(*mpEngine, open(std::wstring(), 2)).WillOnce(Return(1));
    EXPECT_CALL(*mpEngine, close).WillOnce(Return(2));
    EXPECT_CALL(*mpEngine, play).WillOnce(Return(3));
    EXPECT_CALL(*mpEngine, pause).WillOnce(Return(4));
    EXPECT_CALL(*mpEngine, seek(0, 0)).WillOnce(Return(5));
    EXPECT_CALL(*mpEngine, status).WillOnce(Return(6));
    EXPECT_CALL(*mpEngine, repeat(_)).WillOnce(Invoke([](LibMediaPlayer::RepeatParam& param) {
        EXPECT_FALSE(param.repeat);
        EXPECT_EQ(param.start, 0);
        EXPECT_EQ(param.end, -1);
        return 7;
    }));
    EXPECT_CALL(*mpEngine, dumpGraph(std::wstring())).WillOnce(Return(8));
    OutputCapture output;
    EXPECT_EQ(mController->open(), 1);
    EXPECT_EQ(mController->close(), 2);
    EXPECT_EQ(mController->play(), 3);
    EXPECT_EQ(mController->pause(), 4);
    EXPECT_EQ(mController->seek(), 5);
    EXPECT_EQ(mController->getStatus(), 6);
    EXPECT_EQ(mController->setRepeat(), 7);
    EXPECT_EQ(mController->generateDotFile(), 8);
    EXPECT_EQ(output.text(), "MediaPlayerController::open\n"
                             "MediaPlayerController::close\n"
                             "MediaPlayerController::play\n"
                             "MediaPlayerController::pause\n"
                             "MediaPlayerController::seek\n"
                             "MediaPlayerController::setRepeat\n"
                             "MediaPlayerController::generateDotFile\n");
    EXPECT_THAT(platform_double::takeLog(), ElementsAre(logLine("MediaPlayerController::open "),
                                                        logLine("MediaPlayerController::close")));
}

TEST_F(PlayerController, LogsAFileNameAsItStands) {
    const std::wstring name = L"/100%s %n \u00fc " + std::wstring(400, L'x') + L".mp4";
    const std::string narrowName = "/100%s %n \xC3\xBC " + std::string(400, 'x') + ".mp4";
    mController->setFileName(name);
    EXPECT_CALL(*mpEngine, open(name, 2));
    mController->open();
    EXPECT_THAT(platform_double::takeLog(),
                ElementsAre(logLine("MediaPlayerController::open " + narrowName)));
}

TEST_F(PlayerController, WarmsTheEngineUpWithABlackPicture) {
    {
        const InSequence inThisOrder;
        EXPECT_CALL(*mpEngine, open(kBlackPicture, 3)).WillOnce(Return(5));
        EXPECT_CALL(*mpEngine, close).WillOnce(Return(6));
        EXPECT_CALL(*mpEngine, open(kBlackPicture, 3));
    }
    mController->setFormat(3);
    OutputCapture output;
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(mController->initialize(), 0);
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::seconds(2));
    EXPECT_EQ(output.text(), "MediaPlayerController::initialize\n");
    EXPECT_THAT(platform_double::takeLog(),
                ElementsAre(logLine("MediaPlayerController::initializePlayer"),
                            logLine("MediaPlayerController::initializePlayer open "
                                    "/opt/caf\xC3\xA9/share/mediaplayer/images/black.jpg"),
                            logLine("MediaPlayerController::initializePlayer close")));
    mController->open(); // the picture stays the file to open
}

TEST_F(PlayerController, KeepsTheStatusForWhoeverAsked) {
    const auto fresh = mController->statusAnswer();
    EXPECT_EQ(fresh.status.iStatus, -1);
    EXPECT_EQ(fresh.status.lStatusValue1, 0);
    EXPECT_EQ(fresh.status.lStatusValue2, 0);

    const QSignalSpy spy(mController.get(), SIGNAL(retPlayerStatus_signal()));
    EXPECT_CALL(*mpEngine, status)
        .WillOnce(DoAll(SetArgReferee<0>(8), SetArgReferee<1>(9), Return(4)));
    mController->setStatusClientID(3);
    OutputCapture output;
    EXPECT_EQ(mController->getStatus(), 4);
    EXPECT_EQ(output.text(), "");
    EXPECT_EQ(spy.count(), 1);
    const auto [iClientID, status] = mController->statusAnswer();
    EXPECT_EQ(iClientID, 3);
    EXPECT_EQ(status.iStatus, 4);
    EXPECT_EQ(status.iReserved, 0);
    EXPECT_EQ(status.lStatusValue1, 8);
    EXPECT_EQ(status.lStatusValue2, 9);
    EXPECT_THAT(platform_double::takeLog(), IsEmpty());
}

TEST_F(PlayerController, HasCopiedANotificationWholeWhenItSignals) {
    MediaServiceDefine::_tagMediaPlayerNotify seen;
    QObject::connect(mController.get(), &MediaPlayerController::openNotify_signal,
                     [&] { seen = mController->notification(); });
    LibMediaPlayer::MediaPlayerNotify notification{1, 2, L"text", 4, 5, 6, 7, 8, 9};
    OutputCapture output;
    mpEngine->notify(notification);
    EXPECT_EQ(output.text(), "MediaPlayerController::openNotify\n");
    EXPECT_EQ(seen.iNotifyType, 1);
    EXPECT_EQ(seen.iNotifyResult, 2);
    EXPECT_EQ(seen.strNotifyText, L"text");
    EXPECT_EQ(seen.iNotifyParam1, 4);
    EXPECT_EQ(seen.iNotifyParam2, 5);
    EXPECT_EQ(seen.iNotifyParam3, 6);
    EXPECT_EQ(seen.ulNotifyValue1, 7U);
    EXPECT_EQ(seen.ulNotifyValue2, 8U);
    EXPECT_EQ(seen.lNotifyValue, 9);
    EXPECT_THAT(platform_double::takeLog(),
                ElementsAre(logLine("MediaPlayerController::openNotify")));
}

TEST_F(PlayerController, LetsNoExceptionReachTheEnginesThreads) {
    QObject::connect(mController.get(), &MediaPlayerController::openNotify_signal,
                     [] { throw std::runtime_error("from a slot"); });
    LibMediaPlayer::MediaPlayerNotify notification;
    EXPECT_NO_THROW(mpEngine->notify(notification));
    EXPECT_NO_THROW(mpEngine->notify(notification));
}

TEST_F(PlayerController, DeclaresItsSignalsAndSlotsInOrder) {
    const QMetaObject* const type = mController->metaObject();
    std::vector<std::string> names;
    for (int i = type->methodOffset(); i < type->methodCount(); ++i)
        names.push_back(std::string(type->method(i).typeName()) + ' ' +
                        type->method(i).methodSignature().toStdString());
    EXPECT_THAT(names, ElementsAre("void openNotify_signal()", "void retPlayerStatus_signal()",
                                   "int32_t initialize()", "int32_t open()", "int32_t close()",
                                   "int32_t play()", "int32_t pause()", "int32_t seek()",
                                   "int32_t getStatus()", "int32_t setRepeat()",
                                   "int32_t generateDotFile()"));
}

TEST_F(PlayerControllerWithoutAnEngine, ReturnsMinusOneFromEverySlot) {
    MediaPlayerController controller;
    EXPECT_EQ(controller.open(), -1);
    EXPECT_EQ(controller.close(), -1);
    EXPECT_EQ(controller.play(), -1);
    EXPECT_EQ(controller.pause(), -1);
    EXPECT_EQ(controller.seek(), -1);
    EXPECT_EQ(controller.setRepeat(), -1);
    EXPECT_EQ(controller.generateDotFile(), -1);
    EXPECT_EQ(controller.initialize(), 0);
}

TEST_F(PlayerControllerWithoutAnEngine, SignalsStatusMinusOne) {
    MediaPlayerController controller;
    const QSignalSpy spy(&controller, SIGNAL(retPlayerStatus_signal()));
    EXPECT_EQ(controller.getStatus(), -1);
    EXPECT_EQ(spy.count(), 1);
    EXPECT_EQ(controller.statusAnswer().status.iStatus, -1);
    EXPECT_EQ(controller.statusAnswer().status.lStatusValue1, 0);
    EXPECT_EQ(controller.statusAnswer().status.lStatusValue2, 0);
}
