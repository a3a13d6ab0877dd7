// SPDX-License-Identifier: MIT
#include <climits>
#include <filesystem>
#include <fstream>
#include <string>
#include <sys/stat.h>

#include "tests/daemon/support/DiscovererDaemonTest.h"
#include "tests/engine_double/MetadataText.h"
#include "tests/support/TestFolder.h"

using namespace discoverer;

namespace {

constexpr std::int64_t kDuration = 1000;

class DiscovererImage : public DiscovererClientTest {
protected:
    void SetUp() override {
        DiscovererClientTest::SetUp();
        if (!HasFatalFailure())
            open("/a.mp4");
    }

    /** The engine is asked for the duration first. */
    void answerMetadata(const std::string& discoverer = "discoverer 0") {
        LibMediaPlayer::MediaMetaInfo info;
        info.system.duration = kDuration;
        mDiscoverers.expectCall(discoverer + " metadata", script::metadataAnswer(0, info));
    }

    void expectMakeImage(std::int64_t position, const std::string& size, const std::string& path,
                         const std::string& answer = "return 0") {
        answerMetadata();
        mDiscoverers.expectCall("discoverer 0 makeImage " + std::to_string(position) + ' ' + size +
                                    " \"" + path + '"',
                                answer);
    }

    void expectImage(std::int32_t result, std::int32_t code, const std::string& path) {
        mClient.expectCallBack(kObject, kImageCallBack, image(result, code, "/a.mp4", path));
    }

    void write(const std::string& name, const std::string& contents) {
        std::ofstream(mFolder.path(name)) << contents;
    }

    TestFolder mFolder;
    const std::string mPicture = mFolder.path("i.png");
    const std::string mNotice = mFolder.path("notice");
};

TEST_F(DiscovererImage, IsMadeByTheEngineAndToldWithBothNames) {
    mClient.getImage(mId, mPicture, "", 500, 320, 180);
    expectMakeImage(500, "320 180", mPicture);
    expectImage(0, 0, mPicture);
    EXPECT_FALSE(mFolder.has("i.png"));
    EXPECT_FALSE(mFolder.has("notice"));
    expectServiceLog({"openDiscoverer Enter.", "openDiscoverer Leave, Success.", "getImage Enter.",
                      "getImage Leave, Success."});
}

TEST_F(DiscovererImage, BeyondTheEndIsTakenNearTheStart) {
    const struct {
        std::int64_t asked;
        std::int64_t taken;
    } positions[] = {
        {kDuration, kDuration}, {kDuration + 1, 1}, {LONG_MAX, 1}, {0, 0}, {LONG_MIN, LONG_MIN}};
    for (const auto& position : positions) {
        mClient.getImage(mId, mPicture, "", position.asked);
        expectMakeImage(position.taken, "4 2", mPicture);
        expectImage(0, 0, mPicture);
    }
}

TEST_F(DiscovererImage, IsBlackWhereTheEngineCanMakeNone) {
    write("i.png", std::string(100, 'x'));
    mClient.getImage(mId, mPicture);
    expectMakeImage(0, "4 2", mPicture, "return 4");
    expectImage(1, 4, mPicture);
    std::string black;
    for (int pixel = 0; pixel < 8; ++pixel)
        black += std::string("\0\0\0\xFF", 4);
    EXPECT_EQ(mFolder.contents("i.png"), black);
    expectEngineFailure("makeImage /a.mp4 iRet: 4");
}

TEST_F(DiscovererImage, IsEmptyWithoutPixels) {
    for (const auto& [width, height] : {std::pair{0, 2}, {4, 0}, {0, 0}}) {
        write("i.png", "x");
        mClient.getImage(mId, mPicture, "", 0, width, height);
        expectMakeImage(0, std::to_string(width) + ' ' + std::to_string(height), mPicture,
                        "return 9");
        expectImage(1, 9, mPicture);
        EXPECT_TRUE(mFolder.has("i.png"));
        EXPECT_EQ(mFolder.contents("i.png"), "");
    }
}

TEST_F(DiscovererImage, OfAHostileSizeIsAnsweredAndNotWritten) {
    const std::pair<std::int32_t, std::int32_t> sizes[] = {
        {100000, 100000},   {-4, 2},           {4, -2}, {-4, -2}, {65536, 65536},
        {INT_MAX, INT_MAX}, {INT_MIN, INT_MIN}};
    write("i.png", "kept");
    for (const auto& [width, height] : sizes) {
        mClient.getImage(mId, mPicture, "", 0, width, height);
        expectMakeImage(0, std::to_string(width) + ' ' + std::to_string(height), mPicture,
                        "return -1");
        expectImage(1, -1, mPicture);
    }
    EXPECT_EQ(mFolder.contents("i.png"), "kept");
}

TEST_F(DiscovererImage, WithoutMetadataFailsWithTheNamesOfTheImageBefore) {
    const auto failEarly = [&](int code) {
        mClient.getImage(mId, mFolder.path("other.png"));
        mDiscoverers.expectCall("discoverer 0 metadata", "return " + std::to_string(code));
    };
    failEarly(3);
    mClient.expectCallBack(kObject, kImageCallBack, image(1, 3, "", ""));
    expectEngineFailure("getImage /a.mp4 iRet: 3");
    mClient.getImage(mId, mPicture);
    expectMakeImage(0, "4 2", mPicture);
    expectImage(0, 0, mPicture);
    failEarly(7);
    expectImage(1, 7, mPicture);
    EXPECT_FALSE(mFolder.has("other.png"));
}

TEST_F(DiscovererImage, AskedForTwiceOfABusyEngineIsTheLaterOneTwice) {
    mClient.request(kGetExtensions, mId);
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 0 extensions");
    mClient.getImage(mId, mPicture, "", 1, 2, 3);
    mClient.getImage(mId, mPicture + "2", "", 4, 5, 6);
    mClient.expectNothingElse();
    mDiscoverers.answer("return 0");
    mClient.expectCallBack(kObject, kExtensionsCallBack, extensions("", 0));
    for (int i = 0; i < 2; ++i) {
        expectMakeImage(4, "5 6", mPicture + "2");
        expectImage(0, 0, mPicture + "2");
    }
}

TEST_F(DiscovererImage, WithANoticePathIsNotedThereBeforeItIsAnswered) {
    write("notice", "something longer than the word");
    mClient.getImage(mId, mPicture, mNotice);
    answerMetadata();
    EXPECT_THAT(mDiscoverers.nextCall(), testing::StartsWith("discoverer 0 makeImage"));
    EXPECT_EQ(mFolder.contents("notice"), "something longer than the word");
    mDiscoverers.answer("return 0");
    expectImage(0, 0, mPicture);
    EXPECT_EQ(mFolder.contents("notice"), "notice");
}

TEST_F(DiscovererImage, ThatFailsIsNotedToo) {
    mClient.getImage(mId, mPicture, mNotice);
    mDiscoverers.expectCall("discoverer 0 metadata", "return 3");
    mClient.expectCallBack(kObject, kImageCallBack, image(1, 3, "", ""));
    EXPECT_EQ(mFolder.contents("notice"), "notice");
}

TEST_F(DiscovererImage, ThatIsRefusedIsNotedToo) {
    std::int32_t last = 0;
    for (long object = 1; object <= 10; ++object)
        last = mClient.registerCallBack(object);
    EXPECT_EQ(last, 11);
    mClient.getImage(last, mPicture);
    mClient.expectCallBack(10, kImageCallBack, image(1, 1, "", ""));
    EXPECT_FALSE(mFolder.has("notice"));
    mClient.getImage(last, mPicture, mNotice);
    mClient.expectCallBack(10, kImageCallBack, image(1, 1, "", ""));
    EXPECT_EQ(mFolder.contents("notice"), "notice");
}

TEST_F(DiscovererImage, IsNotedAtThePathOfTheLastRequestWhicheverClientMadeIt) {
    const auto other = mClient.registerCallBack(7);
    mClient.getImage(mId, mPicture, mFolder.path("x"));
    answerMetadata();
    EXPECT_THAT(mDiscoverers.nextCall(), testing::StartsWith("discoverer 0 makeImage"));
    mClient.getImage(other, mPicture, mFolder.path("y"));
    mClient.expectNothingElse();
    mDiscoverers.answer("return 0");
    answerMetadata("discoverer 1");
    expectImage(0, 0, mPicture);
    EXPECT_FALSE(mFolder.has("x"));
    EXPECT_EQ(mFolder.contents("y"), "notice");
    EXPECT_THAT(mDiscoverers.nextCall(), testing::StartsWith("discoverer 1 makeImage"));
    mDiscoverers.answer("return 0");
    mClient.expectCallBack(7, kImageCallBack, image(0, 0, "", mPicture));
}

TEST_F(DiscovererImage, ARefusedRequestOfAnUnknownClientWritesNothingButItsPathIsTheLast) {
    mClient.getImage(mId, mPicture, mFolder.path("x"));
    answerMetadata();
    EXPECT_THAT(mDiscoverers.nextCall(), testing::StartsWith("discoverer 0 makeImage"));
    mClient.getImage(77, mPicture, mFolder.path("y"));
    mClient.expectNothingElse();
    EXPECT_FALSE(mFolder.has("y"));
    mDiscoverers.answer("return 0");
    expectImage(0, 0, mPicture);
    EXPECT_FALSE(mFolder.has("x"));
    EXPECT_EQ(mFolder.contents("y"), "notice");
}

TEST_F(DiscovererImage, IsAnsweredAlsoWhereNothingCanBeWritten) {
    const std::string pipe = mFolder.path("pipe");
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
    for (const std::string& path : {mFolder.path(""), mFolder.path("no/such"), pipe}) {
        mClient.getImage(mId, path, path);
        expectMakeImage(0, "4 2", path, "return 8");
        expectImage(1, 8, path);
    }
}

} // namespace
