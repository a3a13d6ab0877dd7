// SPDX-License-Identifier: MIT
#include "importer/MediaImporterController.h"

#include <QSignalSpy>

#include <gmock/gmock.h>

#include "log/Logging.h"
#include "tests/importer/EngineMock.h"
#include "tests/support/PlatformDouble.h"

using namespace std::string_literals;
using LibMediaPlayer::MediaImporterNotify;
using LibMediaPlayer::MediaImporterStatus;
using LibMediaPlayer::MediaMetaInfo;
using platform_double::LogLine;
using testing::_;
using testing::DoAll;
using testing::ElementsAre;
using testing::InSequence;
using testing::IsEmpty;
using testing::NiceMock;
using testing::Return;
using testing::SetArgReferee;

namespace {

MediaMetaInfo film() {
    MediaMetaInfo info;
    info.video.width = 640;
    info.video.height = 360;
    info.video.depth = 24;
    info.video.frameRateNumerator = 30000;
    info.video.frameRateDenominator = 1001;
    info.video.description = L"H.264";
    info.audio[0].channels = 2;
    info.audio[0].sampleRate = 48000;
    info.audio[0].description = L"AAC";
    info.audio[1].sampleRate = 1;
    return info;
}

class ImporterController : public testing::Test {
protected:
    ImporterController() {
        INIT_LOGGING(L"importer_test");
        make(new NiceMock<ImporterMock>, new NiceMock<DiscovererMock>);
    }
    ~ImporterController() override {
        mController.reset();
        UNINIT_LOGGING();
    }

    /** Null where the engine has no such object. */
    void make(NiceMock<ImporterMock>* importer, NiceMock<DiscovererMock>* discoverer) {
        mController.reset();
        engineFactory() = {mpImporter = importer, mpDiscoverer = discoverer};
        mController = std::make_unique<MediaImporterController>();
        mController->setTexts(L"/a 100%.mp4", L"films");
        platform_double::takeLog();
    }

    NiceMock<ImporterMock>* mpImporter = nullptr;     ///< owned by the controller
    NiceMock<DiscovererMock>* mpDiscoverer = nullptr; ///< owned by the controller
    std::unique_ptr<MediaImporterController> mController;
};

} // namespace

TEST_F(ImporterController, HasNothingToInitialize) {
    EXPECT_EQ(mController->initialize(), 0);
    EXPECT_THAT(platform_double::takeLog(), IsEmpty());
}

TEST_F(ImporterController, LooksAtAFileAndThenImportsIt) {
    const InSequence order;
    EXPECT_CALL(*mpDiscoverer, open(L"/a 100%.mp4"s));
    EXPECT_CALL(*mpDiscoverer, metadata(_)).WillOnce(DoAll(SetArgReferee<0>(film()), Return(0)));
    EXPECT_CALL(*mpDiscoverer, close());
    EXPECT_CALL(*mpImporter, import(L"/a 100%.mp4"s, L"films"s)).WillOnce(Return(17));
    EXPECT_EQ(mController->import(), 17);
    EXPECT_THAT(platform_double::takeLog(), IsEmpty());
}

TEST_F(ImporterController, TellsWhatItFoundWithEveryNotification) {
    EXPECT_CALL(*mpDiscoverer, metadata(_)).WillOnce(DoAll(SetArgReferee<0>(film()), Return(0)));
    mController->import();
    const QSignalSpy spy(mController.get(), SIGNAL(importNotify_signal()));
    MediaImporterNotify started{3, 0, L"/a"};
    mpImporter->notify(started);
    EXPECT_EQ(spy.count(), 1);
    const auto notification = mController->notification();
    EXPECT_EQ(notification.iNotifyType, 3);
    EXPECT_EQ(notification.iRet, 0);
    EXPECT_EQ(notification.strText1, L"/a");
    EXPECT_EQ(notification.strText2, L"H.264");
    EXPECT_EQ(notification.strText3, L"AAC");
    EXPECT_THAT(notification.iValue, ElementsAre(640, 360, 30000, 1001, 48000));
    EXPECT_THAT(platform_double::takeLog(), IsEmpty());
}

TEST_F(ImporterController, ForgetsAFailedOpenWhenTheMetadataCanBeRead) {
    EXPECT_CALL(*mpDiscoverer, open(_)).WillOnce(Return(4));
    EXPECT_CALL(*mpImporter, import(_, _));
    EXPECT_EQ(mController->import(), 0);
    EXPECT_THAT(platform_double::takeLog(),
                ElementsAre(LogLine{4, "MediaImporterController 310: import /a 100%.mp4 iRet: 4"}));
}

TEST_F(ImporterController, DoesNotImportWhatCannotBeRead) {
    const QSignalSpy spy(mController.get(), SIGNAL(importNotify_signal()));
    EXPECT_CALL(*mpDiscoverer, metadata(_)).WillOnce(DoAll(SetArgReferee<0>(film()), Return(3)));
    EXPECT_CALL(*mpDiscoverer, close()).WillOnce(Return(9));
    EXPECT_CALL(*mpImporter, import(_, _)).Times(0);
    EXPECT_EQ(mController->import(), 3);
    EXPECT_EQ(spy.count(), 1);
    const auto notification = mController->notification();
    EXPECT_EQ(notification.iNotifyType, 2);
    EXPECT_EQ(notification.iRet, 3);
    EXPECT_EQ(notification.strText1, L"");
    EXPECT_EQ(notification.strText2, L"H.264") << "what was found is told all the same";
    EXPECT_THAT(
        platform_double::takeLog(),
        ElementsAre(LogLine{4, "MediaImporterController 311: import /a 100%.mp4 iRet: 3"},
                    LogLine{4, "MediaImporterController 312: importNotify /a 100%.mp4 iRet: 3"}));
}

TEST_F(ImporterController, ForgetsWhatTheFileBeforeWas) {
    EXPECT_CALL(*mpDiscoverer, metadata(_))
        .WillOnce(DoAll(SetArgReferee<0>(film()), Return(0)))
        .WillOnce(Return(3));
    mController->import();
    mController->import();
    EXPECT_EQ(mController->notification().strText2, L"");
    EXPECT_THAT(mController->notification().iValue, ElementsAre(0, 0, 0, 1, 0));
}

TEST_F(ImporterController, WithoutADiscovererImportsNothing) {
    make(new NiceMock<ImporterMock>, nullptr);
    EXPECT_CALL(*mpImporter, import(_, _)).Times(0);
    EXPECT_EQ(mController->import(), -1);
    EXPECT_EQ(mController->notification().iNotifyType, 2);
    EXPECT_EQ(mController->notification().iRet, -1);
}

TEST_F(ImporterController, WithoutAnImporterRefusesAndStillLogsACancel) {
    make(nullptr, new NiceMock<DiscovererMock>);
    EXPECT_EQ(mController->cancel(), -1);
    EXPECT_THAT(platform_double::takeLog(),
                ElementsAre(LogLine{6, "MediaImporterController 101: cancel() called. "},
                            LogLine{6, "MediaImporterController 102: cancel() finished. "}));
    EXPECT_EQ(mController->generateDotFile(), -1);
    EXPECT_EQ(mController->getStatus(), -1);
    EXPECT_EQ(mController->statusAnswer().status.iStatus, -1);
    EXPECT_EQ(mController->import(), 0) << "the file could be read";
}

TEST_F(ImporterController, PassesACancelOn) {
    EXPECT_CALL(*mpImporter, cancel()).WillOnce(Return(5));
    EXPECT_EQ(mController->cancel(), 5);
}

TEST_F(ImporterController, KeepsTheStatusForWhoAsked) {
    const QSignalSpy spy(mController.get(), SIGNAL(retImporterStatus_signal()));
    EXPECT_CALL(*mpImporter, status(_))
        .WillOnce(DoAll(SetArgReferee<0>(MediaImporterStatus{10, 20}), Return(1)));
    mController->setStatusClientID(7);
    EXPECT_EQ(mController->getStatus(), 1);
    EXPECT_EQ(spy.count(), 1);
    const auto [client, status] = mController->statusAnswer();
    EXPECT_EQ(client, 7);
    EXPECT_EQ(status.iStatus, 1);
    EXPECT_EQ(status.iReserved, 0);
    EXPECT_EQ(status.llValue1, 10);
    EXPECT_EQ(status.llValue2, 20);
}

TEST_F(ImporterController, LogsOnlyNotificationsOfFailures) {
    MediaImporterNotify good{2, 0, L"x"};
    mpImporter->notify(good);
    EXPECT_THAT(platform_double::takeLog(), IsEmpty());
    MediaImporterNotify bad{2, 8, L"the disk is full"};
    mpImporter->notify(bad);
    EXPECT_THAT(
        platform_double::takeLog(),
        ElementsAre(LogLine{4, "MediaImporterController 312: importNotify /a 100%.mp4 iRet: 8"}));
}

TEST_F(ImporterController, DumpsTheGraphToNoFileOfItsOwn) {
    EXPECT_CALL(*mpImporter, dumpGraph(L""s)).WillOnce(Return(2));
    EXPECT_EQ(mController->generateDotFile(), 2);
}

TEST_F(ImporterController, EndsTheImporterBeforeTheDiscoverer) {
    const InSequence order;
    EXPECT_CALL(*mpImporter, died());
    EXPECT_CALL(*mpDiscoverer, died());
    mController.reset();
}
