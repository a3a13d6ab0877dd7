// SPDX-License-Identifier: MIT
#include "discoverer/MediaDiscovererController.h"

#include <limits>
#include <map>

#include <QMetaMethod>
#include <QSignalSpy>

#include "pack/PackedArguments.h"
#include "tests/discoverer/DiscovererFixture.h"
#include "tests/support/OutputCapture.h"

using LibMediaPlayer::MediaMetaInfo;
using LibMediaPlayer::SupportedExtensions;
using testing::_;
using testing::DoAll;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Return;
using testing::SetArgReferee;

namespace {

class DiscovererController : public DiscovererFixture {
protected:
    void SetUp() override {
        mpController = std::make_unique<MediaDiscovererController>();
        forget();
    }

    static MediaMetaInfo withDuration(int64_t duration) {
        MediaMetaInfo info;
        info.system.duration = duration;
        return info;
    }

    void askForImage(int64_t position, int32_t width = 4, int32_t height = 2) {
        mpController->setImageParam({1, width, height, position, mFolder.widePath("image"), L""},
                                    0);
    }

    /** The streams' bytes are only there during the signal. */
    void takeMetadata(int discoverer = 0) {
        const auto take = [&](int which) {
            EXPECT_EQ(which, discoverer);
            mInfo = mpController->metadata(which);
            mVideo.assign(mInfo.pVideoData, mInfo.pVideoData + mInfo.iVideoDataSize);
            mAudio.assign(mInfo.pAudioData, mInfo.pAudioData + mInfo.iAudioDataSize);
        };
        const auto connection = QObject::connect(
            mpController.get(), &MediaDiscovererController::retMetaData_signal, take);
        mResult = mpController->getMetadata(discoverer);
        QObject::disconnect(connection);
    }

    static Bytes bytesOf(const PackedArguments& arguments) {
        return {arguments.data(), arguments.data() + arguments.size()};
    }

    std::unique_ptr<MediaDiscovererController> mpController;
    MediaServiceDefine::_tagMediaMetaInfo mInfo;
    Bytes mVideo;
    Bytes mAudio;
    int mResult = 0;
};

} // namespace

TEST_F(DiscovererController, HasItsSlotsAndSignalsInOrder) {
    std::vector<std::string> names;
    const auto& meta = MediaDiscovererController::staticMetaObject;
    for (int i = meta.methodOffset(); i < meta.methodCount(); ++i)
        names.push_back(meta.method(i).methodSignature().toStdString());
    EXPECT_THAT(names, ElementsAre("retOpen_signal(int,int)", "retMetaData_signal(int)",
                                   "retImage_signal(int)", "retSupportedExtensions_signal(int)",
                                   "initialize(int)", "open(int)", "close(int)", "getMetadata(int)",
                                   "getImage(int)", "getSupportedExtensions(int)"));
}

TEST_F(DiscovererController, OwnsTenDiscoverersAndDeletesThemInOrder) {
    EXPECT_EQ(engineFactory().calls, 10U);
    const testing::InSequence inThisOrder;
    for (std::size_t i = 0; i < 10; ++i)
        EXPECT_CALL(engine(i), died());
    mpController.reset();
}

TEST_F(DiscovererController, HasNothingToInitialize) {
    EXPECT_CALL(engine(), open(_)).Times(0);
    EXPECT_EQ(mpController->initialize(0), 0);
}

TEST_F(DiscovererController, OpensTheFileOfItsSlot) {
    const QSignalSpy spy(mpController.get(), SIGNAL(retOpen_signal(int, int)));
    EXPECT_TRUE(mpController->setOpenFile(3, L"/a\u00fc %s"));
    OutputCapture output;
    EXPECT_CALL(engine(3), open(std::wstring(L"/a\u00fc %s"))).WillOnce(Return(0));
    EXPECT_EQ(mpController->open(3), 0);
    EXPECT_EQ(output.text(), "MediaDiscovererController::open 3 /a\xC3\xBC %s\n");
    ASSERT_EQ(spy.count(), 1);
    EXPECT_EQ(spy.at(0), (QList<QVariant>{0, 3}));
    EXPECT_THAT(platform_double::takeLog(), IsEmpty());
    EXPECT_FALSE(mpController->setOpenFile(3, L"/b")) << "one file at a time";
}

TEST_F(DiscovererController, AFailedOpenIsLoggedAndLeavesTheSlotClosed) {
    const QSignalSpy spy(mpController.get(), SIGNAL(retOpen_signal(int, int)));
    EXPECT_TRUE(mpController->setOpenFile(0, L"/a %d"));
    OutputCapture output;
    EXPECT_CALL(engine(), open(_)).WillOnce(Return(3));
    EXPECT_EQ(mpController->open(0), 3);
    output.text();
    EXPECT_EQ(spy.at(0), (QList<QVariant>{3, 0}));
    EXPECT_THAT(platform_double::takeLog(), ElementsAre(controllerLine("open /a %d iRet: 3")));
    EXPECT_TRUE(mpController->setOpenFile(0, L"/b"));
}

TEST_F(DiscovererController, ClosesAlsoWhatIsNotOpenAndReturnsTheEnginesCode) {
    EXPECT_CALL(engine(1), close()).WillOnce(Return(-9));
    EXPECT_EQ(mpController->close(1), -9);
    EXPECT_TRUE(mpController->setOpenFile(1, L"/a"));
    EXPECT_CALL(engine(1), close()).WillOnce(Return(2));
    EXPECT_EQ(mpController->close(1), 2);
    EXPECT_TRUE(mpController->setOpenFile(1, L"/b")) << "closed, whatever the engine says";
    EXPECT_THAT(platform_double::takeLog(), IsEmpty());
}

TEST_F(DiscovererController, PassesExtensionsOnAlsoWithAnError) {
    const QSignalSpy spy(mpController.get(), SIGNAL(retSupportedExtensions_signal(int)));
    EXPECT_CALL(engine(2), supportedExtensions(_))
        .WillOnce(DoAll(SetArgReferee<0>(SupportedExtensions{L"mp3,mp4", 2}), Return(7)))
        .WillOnce(Return(0));
    EXPECT_EQ(mpController->getSupportedExtensions(2), 7);
    EXPECT_EQ(mpController->extensions(2).strExtensions, L"mp3,mp4");
    EXPECT_EQ(mpController->extensions(2).iReserved, 0);
    EXPECT_EQ(mpController->extensions(2).iExtensionValue, 2);
    EXPECT_EQ(mpController->getSupportedExtensions(2), 0);
    EXPECT_EQ(mpController->extensions(2).strExtensions, L"") << "nothing of before is left";
    EXPECT_EQ(mpController->extensions(2).iExtensionValue, 0);
    EXPECT_EQ(spy.count(), 2);
    EXPECT_THAT(platform_double::takeLog(), IsEmpty());
}

TEST_F(DiscovererController, FailsEveryCallOfASlotWithoutADiscovererDifferently) {
    engineFactory() = {};
    engineFactory().refused = {4};
    mpController = std::make_unique<MediaDiscovererController>();
    const QSignalSpy opened(mpController.get(), SIGNAL(retOpen_signal(int, int)));
    OutputCapture output;
    EXPECT_TRUE(mpController->setOpenFile(4, L"/a"));
    EXPECT_EQ(mpController->open(4), 5);
    EXPECT_EQ(opened.at(0), (QList<QVariant>{5, 4}));
    EXPECT_FALSE(mpController->setOpenFile(4, L"/b")) << "it counts as open";
    EXPECT_EQ(mpController->getSupportedExtensions(4), -1);
    takeMetadata(4);
    EXPECT_EQ(mResult, -1);
    EXPECT_EQ(mInfo.iResult, 1);
    EXPECT_EQ(mInfo.iRet, -1);
    EXPECT_EQ(mInfo.iVideoCount, 0);
    EXPECT_EQ(mpController->getImage(4), -1);
    EXPECT_EQ(mpController->image(4).iResult, 1);
    EXPECT_EQ(mpController->image(4).iRet, -1);
    EXPECT_EQ(mpController->close(4), -1);
    EXPECT_TRUE(mpController->setOpenFile(4, L"/b"));
    EXPECT_EQ(output.text(), "");
    EXPECT_THAT(platform_double::takeLog(), IsEmpty()) << "no engine has failed";
    EXPECT_TRUE(mpController->setOpenFile(5, L"/b"));
    EXPECT_CALL(engine(5), open(_));
    EXPECT_EQ(mpController->open(5), 0) << "the others work";
}

TEST_F(DiscovererController, FillsMetadataFieldByField) {
    MediaMetaInfo info;
    info.system = {"video/x", L"TITLE=\u00fc", true, false, 1234567890123};
    info.videoCount = 1;
    info.video = {"video/v", L"V", 1, 2, 3, 4, 5, 6, 7, true, 8, 9, false};
    info.audioCount = 2;
    info.audio[0] = {"audio/a", L"A", 1, 2, 3, 4, 5};
    info.audio[1] = {"audio/b", L"B", -1, -2, -3, -4, -5};
    EXPECT_CALL(engine(9), metadata(_)).WillOnce(DoAll(SetArgReferee<0>(info), Return(0)));
    takeMetadata(9);
    EXPECT_EQ(mResult, 0);
    EXPECT_EQ(mInfo.iResult, 0);
    EXPECT_EQ(mInfo.iRet, 0);
    EXPECT_EQ(mInfo.systemInfo.strNarrowInfo, L"video/x");
    EXPECT_EQ(mInfo.systemInfo.strWideInfo, L"TITLE=\u00fc");
    EXPECT_EQ(mInfo.systemInfo.bFlag1, 1);
    EXPECT_EQ(mInfo.systemInfo.bFlag2, 0);
    EXPECT_EQ(mInfo.systemInfo.lDuration, 1234567890123);
    EXPECT_EQ(mInfo.iVideoCount, 1);
    EXPECT_EQ(mVideo, text("video/v") + text("V") + int32(1) + int32(2) + int32(3) + int32(4) +
                          int32(5) + int32(6) + int32(7) + boolean(true) + int32(8) + int32(9) +
                          boolean(false));
    EXPECT_EQ(mInfo.iAudioCount, 2);
    EXPECT_EQ(mAudio, text("audio/a") + text("A") + int32(1) + int32(2) + int32(3) + int32(4) +
                          int32(5) + text("audio/b") + text("B") + int32(-1) + int32(-2) +
                          int32(-3) + int32(-4) + int32(-5));
    EXPECT_THAT(platform_double::takeLog(), IsEmpty());
    EXPECT_EQ(mpController->metadata(9).pVideoData, nullptr) << "the block is gone";
    EXPECT_EQ(mpController->metadata(9).pAudioData, nullptr);
}

TEST_F(DiscovererController, StartsEachMetadataCallWithANewRecord) {
    MediaMetaInfo full = withDuration(5);
    full.videoCount = 1;
    EXPECT_CALL(engine(), metadata(_))
        .WillOnce(DoAll(SetArgReferee<0>(full), Return(0)))
        .WillOnce([](MediaMetaInfo& info) {
            EXPECT_EQ(info.system.duration, 0);
            EXPECT_EQ(info.video.frameRateDenominator, 1);
            EXPECT_EQ(info.video.pixelAspectNumerator, 1);
            EXPECT_EQ(info.video.pixelAspectDenominator, 1);
            EXPECT_FALSE(info.video.interlaced);
            EXPECT_TRUE(info.video.stillPicture);
            return 0;
        });
    takeMetadata();
    takeMetadata();
    EXPECT_EQ(mInfo.iVideoCount, 0);
    EXPECT_EQ(mVideo, Bytes());
    EXPECT_EQ(mInfo.iAudioCount, 0);
    EXPECT_EQ(mAudio, Bytes());
}

TEST_F(DiscovererController, TellsWhatAFailedMetadataCallHasLeft) {
    MediaMetaInfo half = withDuration(7);
    half.system.mediaType = "half";
    half.videoCount = 1;
    EXPECT_TRUE(mpController->setOpenFile(0, L"/a"));
    EXPECT_CALL(engine(), metadata(_)).WillOnce(DoAll(SetArgReferee<0>(half), Return(4)));
    takeMetadata();
    EXPECT_EQ(mInfo.iResult, 1);
    EXPECT_EQ(mInfo.iRet, 4);
    EXPECT_EQ(mInfo.systemInfo.strNarrowInfo, L"half");
    EXPECT_EQ(mInfo.systemInfo.lDuration, 7);
    EXPECT_EQ(mInfo.iVideoCount, 1);
    EXPECT_EQ(mVideo, text("") + text("") + int32(0) + int32(0) + int32(0) + int32(0) + int32(1) +
                          int32(1) + int32(1) + boolean(false) + int32(0) + int32(0) +
                          boolean(true));
    EXPECT_THAT(platform_double::takeLog(), ElementsAre(controllerLine("getMetadata /a iRet: 4")));
}

TEST_F(DiscovererController, ReadsNoStreamsThatTheEngineHasNoRoomFor) {
    MediaMetaInfo info;
    info.videoCount = std::numeric_limits<int32_t>::max();
    info.audioCount = 9;
    EXPECT_CALL(engine(), metadata(_)).WillOnce(DoAll(SetArgReferee<0>(info), Return(0)));
    takeMetadata();
    EXPECT_EQ(mInfo.iVideoCount, 1);
    EXPECT_EQ(mInfo.iAudioCount, 8);
    EXPECT_EQ(mAudio.size(), 8U * (2 + 2 + 5 * 5));
    info.videoCount = -1;
    info.audioCount = std::numeric_limits<int32_t>::min();
    EXPECT_CALL(engine(), metadata(_)).WillOnce(DoAll(SetArgReferee<0>(info), Return(0)));
    takeMetadata();
    EXPECT_EQ(mInfo.iVideoCount, 0);
    EXPECT_EQ(mInfo.iAudioCount, 0);
}

TEST_F(DiscovererController, SerializesRecordsAsTheyAreWhenNew) {
    PackedArguments video;
    EXPECT_EQ(MediaDiscovererController::serializeVideoMetaInfo(*video.get(), {}), 1);
    EXPECT_EQ(bytesOf(video), text("") + text("") + int32(0) + int32(0) + int32(0) + int32(0) +
                                  int32(1) + int32(1) + int32(1) + boolean(false) + int32(0) +
                                  int32(0) + boolean(true));
    PackedArguments audio;
    EXPECT_EQ(MediaDiscovererController::serializeAudioMetaInfo(*audio.get(), {}), 1);
    EXPECT_EQ(bytesOf(audio),
              text("") + text("") + int32(0) + int32(0) + int32(0) + int32(0) + int32(0));
}

TEST_F(DiscovererController, HasThePictureMadeAtThePositionUpToTheEnd) {
    EXPECT_CALL(engine(), metadata(_))
        .WillRepeatedly(DoAll(SetArgReferee<0>(withDuration(1000)), Return(0)));
    const std::map<int64_t, int64_t> positions{{0, 0},
                                               {-5, -5},
                                               {999, 999},
                                               {1000, 1000},
                                               {1001, 1},
                                               {1L << 62, 1},
                                               {-(1L << 62), -(1L << 62)}};
    for (const auto& [asked, used] : positions) {
        askForImage(asked);
        EXPECT_CALL(engine(), makeImage(used, 4, 2, mFolder.widePath("image"))).WillOnce(Return(0));
        EXPECT_EQ(mpController->getImage(0), 0) << asked;
    }
    EXPECT_FALSE(mFolder.has("image")) << "writing it is the engine's";
}

TEST_F(DiscovererController, TellsWhichPictureWasMadeOfWhichFile) {
    const QSignalSpy spy(mpController.get(), SIGNAL(retImage_signal(int)));
    EXPECT_TRUE(mpController->setOpenFile(0, L"/a"));
    askForImage(0);
    EXPECT_EQ(mpController->getImage(0), 0);
    EXPECT_EQ(mpController->image(0).iResult, 0);
    EXPECT_EQ(mpController->image(0).iRet, 0);
    EXPECT_EQ(mpController->image(0).strFileName, L"/a");
    EXPECT_EQ(mpController->image(0).strImagePath, mFolder.widePath("image"));
    EXPECT_EQ(spy.count(), 1);
    EXPECT_THAT(platform_double::takeLog(), IsEmpty());
}

TEST_F(DiscovererController, LeavesABlackPictureWhereTheEngineMadeNone) {
    EXPECT_TRUE(mpController->setOpenFile(0, L"/a"));
    askForImage(0);
    EXPECT_CALL(engine(), makeImage(_, _, _, _)).WillOnce(Return(8));
    EXPECT_EQ(mpController->getImage(0), 8);
    EXPECT_EQ(mpController->image(0).iResult, 1);
    EXPECT_EQ(mpController->image(0).iRet, 8);
    EXPECT_EQ(mpController->image(0).strFileName, L"/a");
    EXPECT_EQ(mpController->image(0).strImagePath, mFolder.widePath("image"));
    EXPECT_EQ(mFolder.contents("image").size(), 32U);
    EXPECT_EQ(mFolder.contents("image").substr(28), std::string("\0\0\0\xFF", 4));
    EXPECT_THAT(platform_double::takeLog(), ElementsAre(controllerLine("makeImage /a iRet: 8")));
}

TEST_F(DiscovererController, LeavesAnEmptyFileForAPictureWithoutPixels) {
    askForImage(0, 0, 2);
    EXPECT_CALL(engine(), makeImage(_, 0, 2, _)).WillOnce(Return(8));
    EXPECT_EQ(mpController->getImage(0), 8);
    EXPECT_TRUE(mFolder.has("image"));
    EXPECT_EQ(mFolder.contents("image"), "");
}

TEST_F(DiscovererController, LeavesNoBlackPictureOfAnImpossibleSize) {
    EXPECT_CALL(engine(), makeImage(_, _, _, _)).WillRepeatedly(Return(-1));
    for (const auto& [width, height] : {std::pair{100000, 100000}, {-1, 4}, {-4, -2}}) {
        askForImage(0, width, height);
        EXPECT_EQ(mpController->getImage(0), -1);
        EXPECT_EQ(mpController->image(0).iResult, 1);
        EXPECT_EQ(mpController->image(0).iRet, -1);
        EXPECT_FALSE(mFolder.has("image"));
    }
}

TEST_F(DiscovererController, AnEarlyFailureTellsTheNamesOfTheRequestBefore) {
    const QSignalSpy spy(mpController.get(), SIGNAL(retImage_signal(int)));
    EXPECT_CALL(engine(), metadata(_)).WillOnce(Return(0)).WillRepeatedly(Return(6));
    EXPECT_TRUE(mpController->setOpenFile(0, L"/first"));
    mpController->setImageParam({1, 4, 2, 0, L"/image1", L""}, 0);
    EXPECT_EQ(mpController->getImage(0), 0);
    mpController->close(0);
    EXPECT_TRUE(mpController->setOpenFile(0, L"/second"));
    mpController->setImageParam({1, 4, 2, 0, L"/image2", L""}, 0);
    EXPECT_CALL(engine(), makeImage(_, _, _, _)).Times(0);
    EXPECT_EQ(mpController->getImage(0), 6);
    EXPECT_EQ(mpController->image(0).iResult, 1);
    EXPECT_EQ(mpController->image(0).iRet, 6);
    EXPECT_EQ(mpController->image(0).strFileName, L"/first");
    EXPECT_EQ(mpController->image(0).strImagePath, L"/image1");
    EXPECT_EQ(spy.count(), 2);
    EXPECT_THAT(platform_double::takeLog(),
                ElementsAre(controllerLine("getImage /second iRet: 6")));
}

TEST_F(DiscovererController, KeepsTheResultsOfSlotsApart) {
    EXPECT_CALL(engine(1), metadata(_)).WillRepeatedly(Return(4));
    EXPECT_EQ(mpController->getImage(0), 0);
    EXPECT_EQ(mpController->getImage(1), 4);
    EXPECT_EQ(mpController->image(0).iResult, 0);
    EXPECT_EQ(mpController->image(1).iResult, 1);
    EXPECT_EQ(mpController->image(2).iResult, -1) << "a new record";
    EXPECT_EQ(mpController->image(2).iRet, 0);
    EXPECT_EQ(mpController->metadata(2).iResult, -1);
}
