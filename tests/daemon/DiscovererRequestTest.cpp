// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include "tests/daemon/support/DiscovererDaemonTest.h"
#include "tests/engine_double/MetadataText.h"

using namespace discoverer;
using LibMediaPlayer::MediaMetaInfo;
using testing::ElementsAre;
using testing::IsEmpty;
using wire::Bytes;

namespace {

class DiscovererRequest : public DiscovererClientTest {
protected:
    std::vector<std::string> trace() { return mpDaemon->output().with("MediaDiscoverer"); }

    void expectMetadata(const std::string& engineAnswer, const Bytes& arguments) {
        mClient.request(kGetMetadata, mId);
        mDiscoverers.expectCall("discoverer 0 metadata", engineAnswer);
        mClient.expectCallBack(kObject, kMetadataCallBack, arguments);
    }

    /** All that was asked of the engine has been carried out. */
    void expectExtensions() {
        mClient.request(kGetExtensions, mId);
        mDiscoverers.expectCall("discoverer 0 extensions");
        mClient.expectCallBack(kObject, kExtensionsCallBack, extensions("", 0));
    }
};

TEST_F(DiscovererRequest, InitializeIsAcceptedWithoutTheEngine) {
    mClient.request(kInitialize, mId);
    mClient.expectResult(kObject, kInitializeCallBack, 0);
    expectServiceLog({"initializeDiscoverer Enter.", "initializeDiscoverer Leave, Success."});
    EXPECT_THAT(trace(), ElementsAre("MediaDiscovererService::initializeDiscoverer 1"));
}

TEST_F(DiscovererRequest, OpenIsAnsweredWhenTheEngineHasOpened) {
    mClient.open(mId, "/media/a b.mp4");
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 0 open \"/media/a b.mp4\"");
    mClient.expectNothingElse();
    mDiscoverers.answer("return 0");
    mClient.expectResult(kObject, kOpenCallBack, 0);
    expectServiceLog({"openDiscoverer Enter.", "openDiscoverer Leave, Success."});
    EXPECT_THAT(trace(), ElementsAre("MediaDiscovererController::open 0 /media/a b.mp4"));
}

TEST_F(DiscovererRequest, ANameMayHaveAnyCharacters) {
    mClient.open(mId, "/m/\xC3\xBC \xF0\x9F\x8E\xB5 %s.mp4");
    mDiscoverers.expectCall("discoverer 0 open \"/m/\\x{fc} \\x{1f3b5} %s.mp4\"", "return 1");
    mClient.expectResult(kObject, kOpenCallBack, 1);
    expectEngineFailure("open /m/\xC3\xBC \xF0\x9F\x8E\xB5 %s.mp4 iRet: 1");
}

TEST_F(DiscovererRequest, AFailedOpenIsToldAndLoggedAndMayBeTriedAgain) {
    mClient.open(mId, "/a");
    mDiscoverers.expectCall("discoverer 0 open \"/a\"", "return 3");
    mClient.expectResult(kObject, kOpenCallBack, 3);
    expectEngineFailure("open /a iRet: 3");
    open("/a");
}

TEST_F(DiscovererRequest, ASecondOpenIsRefusedUntilTheFileIsClosed) {
    open("/a");
    mClient.open(mId, "/b");
    mClient.expectResult(kObject, kOpenCallBack, 5);
    mClient.request(kClose, mId);
    mClient.expectResult(kObject, kCloseCallBack, 0);
    mDiscoverers.expectCall("discoverer 0 close");
    expectExtensions();
    open("/b");
    expectServiceLog({"openDiscoverer Enter.", "openDiscoverer Leave, Success.",
                      "openDiscoverer Enter.", "openDiscoverer Leave, Failed.(NULL != mOpenFile)",
                      "closeDiscoverer Enter.", "closeDiscoverer Leave, Success.",
                      "getSupportedExtensions Enter.", "getSupportedExtensions Leave, Success.",
                      "openDiscoverer Enter.", "openDiscoverer Leave, Success."});
}

TEST_F(DiscovererRequest, ASecondOpenIsRefusedWhileTheFirstIsStillAtWork) {
    mClient.open(mId, "/a");
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 0 open \"/a\"");
    mClient.open(mId, "/b");
    mClient.expectResult(kObject, kOpenCallBack, 5);
    mDiscoverers.answer("return 0");
    mClient.expectResult(kObject, kOpenCallBack, 0);
}

TEST_F(DiscovererRequest, InitializeMakesReadyForAnOpenWithoutClosing) {
    open("/a");
    mClient.request(kInitialize, mId);
    mClient.expectResult(kObject, kInitializeCallBack, 0);
    open("/b");
}

TEST_F(DiscovererRequest, AnEmptyNameReachesTheEngineAndCountsAsClosed) {
    open("");
    open("");
    open("/a");
}

TEST_F(DiscovererRequest, CloseIsAnsweredBeforeTheEngineHasClosed) {
    open("/a");
    mClient.request(kClose, mId);
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 0 close");
    mClient.expectResult(kObject, kCloseCallBack, 0);
    mDiscoverers.answer("return 0");
}

TEST_F(DiscovererRequest, CloseReachesTheEngineAlsoWhenNothingIsOpen) {
    mClient.request(kClose, mId);
    mClient.expectResult(kObject, kCloseCallBack, 0);
    mDiscoverers.expectCall("discoverer 0 close", "return -1");
    expectExtensions();
    EXPECT_THAT(mSyslog.lines("MediaDiscovererController"), IsEmpty());
}

TEST_F(DiscovererRequest, AFileIsClosedAlsoWhenTheEngineFailsToCloseIt) {
    open("/a");
    mClient.request(kClose, mId);
    mClient.expectResult(kObject, kCloseCallBack, 0);
    mDiscoverers.expectCall("discoverer 0 close", "return 9");
    expectExtensions();
    open("/b");
}

TEST_F(DiscovererRequest, MetadataAreToldFieldByFieldWithTheStreamsPacked) {
    MediaMetaInfo info;
    info.system = {"video/x", L"TITLE=\u00fc", true, false, 72623859790382856};
    info.videoCount = 1;
    info.video = {"v", L"w", 1, 2, 3, 4, 5, 6, 7, true, 8, -9, false};
    info.audioCount = 2;
    info.audio[0] = {"a", L"b", 1, 2, 3, 4, 5};
    info.audio[1] = {"", L"", -1, 0, 0, 0, 0};
    const Bytes video = wire::hex("A2 76 00  A2 77 00"
                                  "D2 00 00 00 01  D2 00 00 00 02  D2 00 00 00 03  D2 00 00 00 04"
                                  "D2 00 00 00 05  D2 00 00 00 06  D2 00 00 00 07  C3"
                                  "D2 00 00 00 08  D2 FF FF FF F7  C2");
    const Bytes audio = wire::hex("A2 61 00  A2 62 00"
                                  "D2 00 00 00 01  D2 00 00 00 02  D2 00 00 00 03  D2 00 00 00 04"
                                  "D2 00 00 00 05"
                                  "A1 00  A1 00"
                                  "D2 FF FF FF FF  D2 00 00 00 00  D2 00 00 00 00  D2 00 00 00 00"
                                  "D2 00 00 00 00");
    expectMetadata(script::metadataAnswer(0, info),
                   wire::hex("D2 00 00 00 00  D2 00 00 00 00"
                             "A8 76 69 64 65 6F 2F 78 00  A9 54 49 54 4C 45 3D C3 BC 00"
                             "01 00  D3 01 02 03 04 05 06 07 08"
                             "DA 00 35") +
                       video + wire::hex("D2 00 00 00 35  D2 00 00 00 01  DA 00 3C") + audio +
                       wire::hex("D2 00 00 00 3C  D2 00 00 00 02"));
    expectServiceLog({"getMetadata Enter.", "getMetadata Leave, Success."});
}

TEST_F(DiscovererRequest, MetadataWithoutStreamsHaveTwoEmptyBlocks) {
    expectMetadata("return 0", newMetadata(0, 0));
    EXPECT_THAT(newMetadata(0, 0),
                testing::EndsWith(wire::hex("A0 D2 00 00 00 00 D2 00 00 00 00"
                                            "A0 D2 00 00 00 00 D2 00 00 00 00")));
}

TEST_F(DiscovererRequest, EightAudioStreamsAreToldInOrder) {
    MediaMetaInfo info;
    info.audioCount = 8;
    Bytes packed;
    for (std::int32_t i = 0; i < 8; ++i) {
        info.audio[static_cast<std::size_t>(i)] = {"a", L"b", i, 0, 0, 0, 0};
        packed += wire::text("a") + wire::text("b") + wire::int32(i);
        for (int field = 2; field <= 5; ++field)
            packed += wire::int32(0);
    }
    Bytes expected = newMetadata(0, 0);
    expected.resize(expected.size() - streams("", 0).size());
    expectMetadata(script::metadataAnswer(0, info), expected + streams(packed, 8));
}

TEST_F(DiscovererRequest, FailedMetadataAreLoggedAndToldWithWhatTheEngineFound) {
    open("/a");
    MediaMetaInfo info;
    info.system.mediaType = "x";
    info.audioCount = 1;
    expectMetadata(script::metadataAnswer(4, info),
                   wire::int32(1) + wire::int32(4) + wire::text("x") + wire::text("") +
                       wire::integer(0) + wire::integer(0) + wire::int64(0) + streams("", 0) +
                       streams(wire::hex("A1 00 A1 00") + wire::int32(0) + wire::int32(0) +
                                   wire::int32(0) + wire::int32(0) + wire::int32(0),
                               1));
    expectEngineFailure("getMetadata /a iRet: 4");
}

TEST_F(DiscovererRequest, MetadataThatDoNotFitIntoAPacketAreNotSent) {
    MediaMetaInfo info;
    const std::size_t rest = newMetadata(0, 0).size() + 2; // the header of a long text
    info.system.tags.assign(wire::kMaxPayload - rest + 1, L'x');
    mClient.request(kGetMetadata, mId);
    mDiscoverers.expectCall("discoverer 0 metadata", script::metadataAnswer(0, info));
    expectExtensions();
    info.system.tags.pop_back();
    mClient.request(kGetMetadata, mId);
    mDiscoverers.expectCall("discoverer 0 metadata", script::metadataAnswer(0, info));
    const auto reply = mClient.receive();
    ASSERT_TRUE(reply);
    EXPECT_EQ(reply->payload.size(), wire::kMaxPayload);
}

TEST_F(DiscovererRequest, ExtensionsAreTheEnginesWithAZeroBetween) {
    mClient.request(kGetExtensions, mId);
    mDiscoverers.expectCall("discoverer 0 extensions", "return 0 \"mp3,mp4\" 258");
    mClient.expectCallBack(kObject, kExtensionsCallBack,
                           wire::hex("A8 6D 70 33 2C 6D 70 34 00  D2 00 00 00 00  D2 00 00 01 02"));
    expectServiceLog({"getSupportedExtensions Enter.", "getSupportedExtensions Leave, Success."});
}

TEST_F(DiscovererRequest, ExtensionsAreToldAlsoWhenTheEngineFails) {
    mClient.request(kGetExtensions, mId);
    mDiscoverers.expectCall("discoverer 0 extensions", "return 9 \"mp3\" 1");
    mClient.expectCallBack(kObject, kExtensionsCallBack, extensions("mp3", 1));
    mClient.request(kGetExtensions, mId);
    mDiscoverers.expectCall("discoverer 0 extensions", "return 9");
    mClient.expectCallBack(kObject, kExtensionsCallBack, extensions("", 0));
    EXPECT_THAT(mSyslog.lines("MediaDiscovererController"), IsEmpty());
}

TEST_F(DiscovererRequest, AnUnknownClientIsLoggedAndNotAnswered) {
    for (const long method : {kInitialize, kClose, kGetMetadata, kGetExtensions})
        mClient.request(method, 77);
    mClient.open(77, "/a");
    mClient.getImage(77, "/nowhere/i");
    mClient.expectNothingElse();
    expectExtensions();
    std::vector<std::string> lines;
    for (const std::string name : {"initializeDiscoverer", "closeDiscoverer", "getMetadata",
                                   "getSupportedExtensions", "openDiscoverer", "getImage"}) {
        lines.push_back(name + " Enter.");
        lines.push_back(name + " Leave, Failed.(isEnableID(iClientID) == false)");
    }
    lines.insert(lines.end(),
                 {"getSupportedExtensions Enter.", "getSupportedExtensions Leave, Success."});
    expectServiceLog(lines);
}

TEST_F(DiscovererRequest, AnUnregisteredClientIsUnknown) {
    mClient.request(kUnregister, mId);
    mClient.request(kInitialize, mId);
    mClient.request(kGetMetadata, mId);
    mClient.expectNothingElse();
}

TEST_F(DiscovererRequest, AnUnknownMethodIsNothing) {
    for (const long method : {0L, 9L, -1L, 1L << 32})
        mClient.request(method, mId);
    mClient.expectNothingElse();
    EXPECT_THAT(mSyslog.lines("MediaDiscovererService"), IsEmpty());
}

TEST_F(DiscovererRequest, ARequestWithoutArgumentsIsThatOfAnUnknownClient) {
    for (long method = kInitialize; method <= kUnregister; ++method)
        mClient.request(method, Bytes());
    mClient.expectNothingElse();
    expectExtensions();
}

TEST_F(DiscovererRequest, MissingArgumentsHaveTheValuesOfANewRecord) {
    mClient.request(kOpen, mId);
    mDiscoverers.expectCall("discoverer 0 open \"\"", "return 1");
    mClient.expectResult(kObject, kOpenCallBack, 1);
    mClient.request(kGetImage, mId);
    mDiscoverers.expectCall("discoverer 0 metadata");
    mDiscoverers.expectCall("discoverer 0 makeImage 0 0 0 \"\"");
    mClient.expectCallBack(kObject, kImageCallBack, image(0, 0, "", ""));
}

TEST_F(DiscovererRequest, AnyClientMayActForAnother) {
    DiscovererClient other(1001);
    other.registerCallBack(7);
    other.request(kInitialize, mId);
    mClient.expectResult(kObject, kInitializeCallBack, 0);
    other.expectNothingElse();
}

TEST_F(DiscovererRequest, OthersAreAcceptedWhileTheEngineIsBusyAndServedAfterwards) {
    DiscovererClient other(1001);
    const auto id = other.registerCallBack(7);
    mClient.request(kGetMetadata, mId);
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 0 metadata");
    other.request(kInitialize, id);
    other.expectResult(7, kInitializeCallBack, 0);
    other.open(id, "/b");
    other.request(kClose, id);
    other.expectResult(7, kCloseCallBack, 0);
    mDiscoverers.answer("return 0");
    mClient.expectCallBack(kObject, kMetadataCallBack, newMetadata(0, 0));
    mDiscoverers.expectCall("discoverer 1 open \"/b\"");
    other.expectResult(7, kOpenCallBack, 0);
    mDiscoverers.expectCall("discoverer 1 close");
}

/** A daemon whose engine makes no discoverer for the first client. */
class MissingDiscoverer : public DiscovererRequest {
protected:
    void SetUp() override {
        ASSERT_NO_FATAL_FAILURE(startDiscoverers({0}));
        mId = mClient.registerCallBack(kObject);
    }

    void expectOpen(std::int32_t result) {
        mClient.open(mId, "/a");
        mClient.expectResult(kObject, kOpenCallBack, result);
    }
};

TEST_F(MissingDiscoverer, FailsOpenAndCountsAsOpenUntilInitializedOrClosed) {
    const std::vector<std::string> opened{"openDiscoverer Enter.",
                                          "openDiscoverer Leave, Success."};
    const std::vector<std::string> refused{"openDiscoverer Enter.",
                                           "openDiscoverer Leave, Failed.(NULL != mOpenFile)"};
    expectOpen(5);
    expectOpen(5);
    mClient.request(kInitialize, mId);
    mClient.expectResult(kObject, kInitializeCallBack, 0);
    expectOpen(5);
    mClient.request(kClose, mId);
    mClient.expectResult(kObject, kCloseCallBack, 0);
    mClient.request(kGetExtensions, mId);
    mClient.expectCallBack(kObject, kExtensionsCallBack, extensions("", 0));
    expectOpen(5);
    std::vector<std::string> lines = opened;
    lines.insert(lines.end(), refused.begin(), refused.end());
    lines.insert(lines.end(),
                 {"initializeDiscoverer Enter.", "initializeDiscoverer Leave, Success."});
    lines.insert(lines.end(), opened.begin(), opened.end());
    lines.insert(lines.end(),
                 {"closeDiscoverer Enter.", "closeDiscoverer Leave, Success.",
                  "getSupportedExtensions Enter.", "getSupportedExtensions Leave, Success."});
    lines.insert(lines.end(), opened.begin(), opened.end());
    expectServiceLog(lines);
    EXPECT_THAT(mSyslog.lines("MediaDiscovererController"), IsEmpty());
}

TEST_F(MissingDiscoverer, FailsEachRequestWithMinusOneAndLogsNothing) {
    mClient.request(kGetMetadata, mId);
    mClient.expectCallBack(kObject, kMetadataCallBack, newMetadata(1, -1));
    mClient.getImage(mId, "/nowhere/i");
    mClient.expectCallBack(kObject, kImageCallBack, image(1, -1, "", ""));
    EXPECT_THAT(mSyslog.lines("MediaDiscovererController"), IsEmpty());
}

TEST_F(MissingDiscoverer, HarmsOnlyItsOwnClient) {
    const auto next = mClient.registerCallBack(7);
    mClient.request(kGetExtensions, next);
    mDiscoverers.expectCall("discoverer 1 extensions", "return 0 \"x\" 1");
    mClient.expectCallBack(7, kExtensionsCallBack, extensions("x", 1));
}

} // namespace
