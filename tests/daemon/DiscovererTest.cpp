// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "tests/daemon/support/DiscovererDaemonTest.h"
#include "tests/engine_double/MetadataText.h"

using LibMediaPlayer::MediaMetaInfo;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;

namespace {

constexpr long kObject = 70;

std::string contentOf(const std::filesystem::path& path) {
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

class Discovering : public DiscovererDaemonTest {
protected:
    void SetUp() override {
        DiscovererDaemonTest::SetUp();
        std::string pattern = testing::TempDir() + "/qns-notice-XXXXXX";
        mFolder = ::mkdtemp(pattern.data());
        if (!HasFatalFailure())
            mId = mClient.registerCallBack(kObject);
    }
    void TearDown() override {
        DiscovererDaemonTest::TearDown();
        std::filesystem::remove_all(mFolder);
    }

    void expectResult(long callback, std::int32_t result, long object = kObject) {
        mClient.expectResult(object, callback, result);
    }

    void open(std::int32_t client, const std::string& call, long object = kObject) {
        mClient.open(client, "/film");
        mDiscoverers.expectCall(call);
        expectResult(discoverer::kOpenCallBack, 0, object);
    }

    /** What the service has logged about an operation, in order. */
    std::vector<std::string> logged(const std::string& operation, const std::string& last) {
        EXPECT_TRUE(mSyslog.waitForLine("MediaDiscovererService::" + operation + " " + last));
        return mSyslog.messages("MediaDiscovererService::" + operation);
    }

    [[nodiscard]] std::string path(const std::string& name) const {
        return (mFolder / name).string();
    }

    std::filesystem::path mFolder;
    DiscovererClient mClient{1000};
    std::int32_t mId = 0;
};

TEST_F(Discovering, AClientIsGivenItsIdAndTheFirstFreeDiscoverer) {
    EXPECT_EQ(mId, 1);
    open(mId, "discoverer 0 open \"/film\"");
    const std::int32_t second = mClient.registerCallBack(71);
    EXPECT_EQ(second, 2);
    open(second, "discoverer 1 open \"/film\"", 71);
}

TEST_F(Discovering, OpeningIsAnsweredWithWhatTheEngineSays) {
    mClient.open(mId, "/a b\xc3\xbc.mp4");
    mDiscoverers.expectCall(R"(discoverer 0 open "/a b\x{fc}.mp4")", "return 3");
    expectResult(discoverer::kOpenCallBack, 3);
    EXPECT_TRUE(mSyslog.waitForLine("MediaDiscovererController 410: open "));
    EXPECT_THAT(mSyslog.lines("MediaDiscovererController 410: open "),
                ElementsAre(StartsWith("<131>")));
    EXPECT_THAT(mSyslog.messages("MediaDiscovererController 410: open "),
                ElementsAre(HasSubstr("iRet: 3")));
    EXPECT_THAT(logged("openDiscoverer", "Leave, Success."),
                ElementsAre(HasSubstr("101: MediaDiscovererService::openDiscoverer Enter."),
                            HasSubstr("101: MediaDiscovererService::openDiscoverer Leave, "
                                      "Success.")));
    open(mId, "discoverer 0 open \"/film\"");
    EXPECT_TRUE(mpDaemon->waitForLine("MediaDiscovererController::open 0 /film"));
}

TEST_F(Discovering, ASecondFileIsRefusedUntilTheFirstIsClosed) {
    open(mId, "discoverer 0 open \"/film\"");
    mClient.open(mId, "/other");
    expectResult(discoverer::kOpenCallBack, 5);
    EXPECT_THAT(logged("openDiscoverer", "Leave, Failed.(NULL != mOpenFile)").back(),
                HasSubstr("MediaDiscovererService::openDiscoverer Leave, Failed."
                          "(NULL != mOpenFile)"));
    mClient.request(discoverer::kClose, mId);
    expectResult(discoverer::kCloseCallBack, 0);
    mDiscoverers.expectCall("discoverer 0 close");
    // What is answered behind the closing tells that it is done.
    mClient.request(discoverer::kGetExtensions, mId);
    mDiscoverers.expectCall("discoverer 0 extensions", "return 0 \"a\" 1");
    ASSERT_TRUE(mClient.receive());
    open(mId, "discoverer 0 open \"/film\"");
}

TEST_F(Discovering, InitialisingMakesRoomForAnotherFile) {
    open(mId, "discoverer 0 open \"/film\"");
    mClient.request(discoverer::kInitialize, mId);
    expectResult(discoverer::kInitializeCallBack, 0);
    EXPECT_TRUE(mpDaemon->waitForLine("MediaDiscovererService::initializeDiscoverer 1"));
    open(mId, "discoverer 0 open \"/film\"");
}

TEST_F(Discovering, ClosingWithoutAFileStillAsksTheEngine) {
    mClient.request(discoverer::kClose, mId);
    expectResult(discoverer::kCloseCallBack, 0);
    mDiscoverers.expectCall("discoverer 0 close", "return -1");
}

TEST_F(Discovering, MetadataComesWithABlockForEachKindOfStream) {
    open(mId, "discoverer 0 open \"/film\"");
    MediaMetaInfo info;
    info.system = {"video/mp4", L"TITLE=x", true, false, 5};
    info.videoCount = 1;
    info.video = {"v", L"w", 1, 2, 3, 4, 5, 6, 7, true, 8, 9, false};
    info.audioCount = 2;
    info.audio[0] = {"a", L"b", 1, 2, 3, 4, 5};
    info.audio[1] = {"c", L"d", 6, 7, 8, 9, 10};
    mClient.request(discoverer::kGetMetadata, mId);
    mDiscoverers.expectCall("discoverer 0 metadata", script::metadataAnswer(0, info));
    wire::Bytes video = wire::text("v") + wire::text("w");
    for (int value = 1; value <= 7; ++value)
        video += wire::int32(value);
    video += wire::boolean(true) + wire::int32(8) + wire::int32(9) + wire::boolean(false);
    wire::Bytes audio = wire::text("a") + wire::text("b");
    for (int value = 1; value <= 5; ++value)
        audio += wire::int32(value);
    audio += wire::text("c") + wire::text("d");
    for (int value = 6; value <= 10; ++value)
        audio += wire::int32(value);
    mClient.expectCallBack(
        kObject, discoverer::kMetadataCallBack,
        wire::int32(0) + wire::int32(0) + wire::text("video/mp4") + wire::text("TITLE=x") +
            wire::integer(1) + wire::integer(0) + wire::int64(5) + wire::raw(video) +
            wire::int32(static_cast<std::int32_t>(video.size())) + wire::int32(1) +
            wire::raw(audio) + wire::int32(static_cast<std::int32_t>(audio.size())) +
            wire::int32(2));
}

TEST_F(Discovering, FailedMetadataSaysWithWhatAndHasEmptyBlocks) {
    mClient.request(discoverer::kGetMetadata, mId);
    mDiscoverers.expectCall("discoverer 0 metadata", "return -1");
    mClient.expectCallBack(kObject, discoverer::kMetadataCallBack,
                           wire::int32(1) + wire::int32(-1) + wire::text("") + wire::text("") +
                               wire::integer(0) + wire::integer(0) + wire::int64(0) +
                               discoverer::noStreams() + discoverer::noStreams());
    EXPECT_TRUE(mSyslog.waitForLine("MediaDiscovererController 410: getMetadata  iRet: -1"));
}

TEST_F(Discovering, ExtensionsAreAnsweredWhateverTheEngineReturns) {
    mClient.request(discoverer::kGetExtensions, mId);
    mDiscoverers.expectCall("discoverer 0 extensions", "return 9 \"mp3,mp4\" 2");
    mClient.expectCallBack(kObject, discoverer::kExtensionsCallBack,
                           wire::text("mp3,mp4") + wire::int32(0) + wire::int32(2));
}

TEST_F(Discovering, AnImageIsAnsweredWithItsNamesAndANotice) {
    open(mId, "discoverer 0 open \"/film\"");
    mClient.getImage(mId, path("image.png"), path("notice"), 7, 40, 20);
    mDiscoverers.expectCall("discoverer 0 metadata", "return 0 \"\" \"\" 1 0 7");
    mDiscoverers.expectCall("discoverer 0 makeImage 7 40 20 \"" + path("image.png") + '"');
    mClient.expectCallBack(kObject, discoverer::kImageCallBack,
                           discoverer::imageResult(0, 0, "/film", path("image.png")));
    EXPECT_EQ(contentOf(path("notice")), "notice");
}

TEST_F(Discovering, BeyondTheEndTheImageIsTakenNearTheStart) {
    open(mId, "discoverer 0 open \"/film\"");
    mClient.getImage(mId, path("image.png"), "", 8);
    mDiscoverers.expectCall("discoverer 0 metadata", "return 0 \"\" \"\" 1 0 7");
    mDiscoverers.expectCall("discoverer 0 makeImage 1 4 2 \"" + path("image.png") + '"');
    EXPECT_TRUE(mClient.receive());
    EXPECT_FALSE(std::filesystem::exists(path("notice")));
}

TEST_F(Discovering, AnImageThatCannotBeMadeIsBlack) {
    open(mId, "discoverer 0 open \"/film\"");
    mClient.getImage(mId, path("image"));
    mDiscoverers.expectCall("discoverer 0 metadata");
    mDiscoverers.expectCall("discoverer 0 makeImage 0 4 2 \"" + path("image") + '"', "return 4");
    mClient.expectCallBack(kObject, discoverer::kImageCallBack,
                           discoverer::imageResult(1, 4, "/film", path("image")));
    std::string black;
    for (int pixel = 0; pixel < 8; ++pixel)
        black += wire::hex("00 00 00 FF");
    EXPECT_EQ(contentOf(path("image")), black);
    EXPECT_TRUE(mSyslog.waitForLine("MediaDiscovererController 410: makeImage /film iRet: 4"));
}

TEST_F(Discovering, ABlackImageOfImpossibleSizeIsAnsweredWithoutAFile) {
    open(mId, "discoverer 0 open \"/film\"");
    for (const auto& [width, height] :
         {std::pair{-4, 2}, std::pair{4, -2}, std::pair{100'000, 100'000}, std::pair{65536, 65536},
          std::pair{INT32_MAX, INT32_MAX}, std::pair{INT32_MIN, INT32_MIN}}) {
        mClient.getImage(mId, path("huge"), "", 0, width, height);
        mDiscoverers.expectCall("discoverer 0 metadata");
        mDiscoverers.expectCall("discoverer 0 makeImage 0 " + std::to_string(width) + ' ' +
                                    std::to_string(height) + " \"" + path("huge") + '"',
                                "return -1");
        mClient.expectCallBack(kObject, discoverer::kImageCallBack,
                               discoverer::imageResult(1, -1, "/film", path("huge")));
        EXPECT_FALSE(std::filesystem::exists(path("huge"))) << width << 'x' << height;
    }
}

TEST_F(Discovering, AnEarlyFailureOfAnImageTellsTheNamesOfTheLastOne) {
    open(mId, "discoverer 0 open \"/film\"");
    mClient.getImage(mId, path("first"));
    mDiscoverers.expectCall("discoverer 0 metadata");
    mDiscoverers.expectCall("discoverer 0 makeImage 0 4 2 \"" + path("first") + '"');
    mClient.expectCallBack(kObject, discoverer::kImageCallBack,
                           discoverer::imageResult(0, 0, "/film", path("first")));
    mClient.getImage(mId, path("second"));
    mDiscoverers.expectCall("discoverer 0 metadata", "return 4");
    mClient.expectCallBack(kObject, discoverer::kImageCallBack,
                           discoverer::imageResult(1, 4, "/film", path("first")));
    EXPECT_TRUE(mSyslog.waitForLine("MediaDiscovererController 410: getImage /film iRet: 4"));
}

TEST_F(Discovering, TheLastRequestsNoticePathIsUsedForAllAnswers) {
    DiscovererClient other(1001);
    const std::int32_t otherId = other.registerCallBack(80);
    mClient.getImage(mId, path("mine"), path("my notice"));
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 0 metadata");
    other.getImage(otherId, path("other"), path("other notice"));
    // The second request has been taken in when its success is logged.
    EXPECT_TRUE(mSyslog.waitForLine("MediaDiscovererService::getImage Leave, Success.", 2));
    mDiscoverers.answer("return 9");
    EXPECT_TRUE(mClient.receive());
    EXPECT_EQ(contentOf(path("other notice")), "notice");
    EXPECT_FALSE(std::filesystem::exists(path("my notice")));
    mDiscoverers.expectCall("discoverer 1 metadata", "return 9");
    EXPECT_TRUE(other.receive());
}

TEST_F(Discovering, TheEleventhClientHasNoPlaceAndEachRequestSaysSoInItsWay) {
    for (long object = 71; object < 80; ++object)
        mClient.registerCallBack(object);
    const std::int32_t id = mClient.registerCallBack(90);
    EXPECT_EQ(id, 11);
    mClient.request(discoverer::kInitialize, id);
    expectResult(discoverer::kInitializeCallBack, 1, 90);
    mClient.open(id, "/film");
    expectResult(discoverer::kOpenCallBack, 5, 90);
    mClient.request(discoverer::kClose, id);
    expectResult(discoverer::kCloseCallBack, 1, 90);
    mClient.request(discoverer::kGetMetadata, id);
    mClient.expectCallBack(90, discoverer::kMetadataCallBack,
                           wire::int32(-1) + wire::int32(0) + wire::text("") + wire::text("") +
                               wire::integer(0) + wire::integer(0) + wire::int64(0) +
                               discoverer::noStreams() + discoverer::noStreams());
    mClient.getImage(id, path("image"), path("notice"));
    mClient.expectCallBack(90, discoverer::kImageCallBack, discoverer::imageResult(1, 1, "", ""));
    EXPECT_EQ(contentOf(path("notice")), "notice");
    mClient.request(discoverer::kGetExtensions, id);
    mClient.expectCallBack(90, discoverer::kExtensionsCallBack,
                           wire::text("") + wire::int32(0) + wire::int32(0));
    for (const char* operation : {"initializeDiscoverer", "openDiscoverer", "closeDiscoverer",
                                  "getMetadata", "getImage", "getSupportedExtensions"})
        EXPECT_THAT(
            logged(operation, "Leave, Failed."),
            testing::Contains(HasSubstr("Leave, Failed.(getDiscovererId(iClientID) == false)")))
            << operation;
    EXPECT_THAT(mSyslog.lines("Failed.(getDiscovererId"), testing::Each(StartsWith("<134>")));
}

TEST_F(Discovering, APlaceIsFreeAgainWhenItsClientHasLeft) {
    for (long object = 71; object < 80; ++object)
        mClient.registerCallBack(object);
    mClient.request(discoverer::kUnregister, 4);
    const std::int32_t id = mClient.registerCallBack(90);
    open(id, "discoverer 3 open \"/film\"", 90);
}

TEST_F(Discovering, AnAnswerForAClientThatHasLeftIsDroppedAndItsPlaceClosed) {
    mClient.open(mId, "/film");
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 0 open \"/film\"");
    mClient.request(discoverer::kUnregister, mId);
    // Taken in when what follows it has been answered.
    const std::int32_t witness = mClient.registerCallBack(71);
    mDiscoverers.answer("return 0");
    // The new client has the place of the old one, whose answer may be on its way.
    mClient.request(discoverer::kInitialize, witness);
    EXPECT_TRUE(mClient.receive());
}

TEST_F(Discovering, AnUnknownClientGetsNoAnswer) {
    for (long method = discoverer::kInitialize; method <= discoverer::kGetExtensions; ++method)
        mClient.request(method, 99);
    mClient.expectNothingElse();
    EXPECT_TRUE(mSyslog.waitForLine("MediaDiscovererService::getMetadata Leave, "
                                    "Failed.(isEnableID(iClientID) == false)"));
}

TEST_F(Discovering, UnknownMethodsAndShortArgumentsDoNoHarm) {
    for (const long method : {0L, 9L, -1L, 1L << 40})
        mClient.request(method, mId);
    for (long method = discoverer::kInitialize; method <= discoverer::kUnregister; ++method)
        mClient.request(method, wire::Bytes());
    mClient.request(discoverer::kGetImage, wire::integer(mId));
    mDiscoverers.expectCall("discoverer 0 metadata", "return 9");
    EXPECT_TRUE(mClient.receive());
    mClient.expectNothingElse();
}

class DiscoveringWithoutEngine : public Discovering {
protected:
    void SetUp() override {
        startDiscoverers({0});
        std::string pattern = testing::TempDir() + "/qns-notice-XXXXXX";
        mFolder = ::mkdtemp(pattern.data());
        mId = mClient.registerCallBack(kObject);
    }
};

TEST_F(DiscoveringWithoutEngine, EveryRequestIsAnsweredWithAFailure) {
    mClient.open(mId, "/film");
    expectResult(discoverer::kOpenCallBack, 5);
    mClient.open(mId, "/film");
    expectResult(discoverer::kOpenCallBack, 5);
    EXPECT_TRUE(mSyslog.waitForLine("Failed.(NULL != mOpenFile)")) << "it counts as open";
    mClient.request(discoverer::kGetMetadata, mId);
    mClient.expectCallBack(kObject, discoverer::kMetadataCallBack,
                           wire::int32(1) + wire::int32(-1) + wire::text("") + wire::text("") +
                               wire::integer(0) + wire::integer(0) + wire::int64(0) +
                               discoverer::noStreams() + discoverer::noStreams());
    mClient.getImage(mId, path("image"));
    mClient.expectCallBack(kObject, discoverer::kImageCallBack,
                           discoverer::imageResult(1, -1, "", ""));
    mClient.request(discoverer::kGetExtensions, mId);
    mClient.expectCallBack(kObject, discoverer::kExtensionsCallBack,
                           wire::text("") + wire::int32(0) + wire::int32(0));
    mClient.request(discoverer::kClose, mId);
    expectResult(discoverer::kCloseCallBack, 0);
}

} // namespace
