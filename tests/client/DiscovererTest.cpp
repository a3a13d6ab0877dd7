// SPDX-License-Identifier: MIT
#include <chrono>
#include <future>
#include <memory>
#include <optional>
#include <vector>

#include "qnsmedia/Discoverer.h"
#include "qnsmedia/Error.h"
#include "tests/daemon/support/DiscovererDaemonTest.h"
#include "tests/daemon/support/Patience.h"
#include "tests/engine_double/MetadataText.h"

using namespace std::chrono_literals;
using LibMediaPlayer::MediaMetaInfo;
using qnsmedia::Discoverer;
using qnsmedia::Metadata;

namespace {

/** The library and the daemon, with discoverers that the test plays. */
class LibraryAndDiscoverers : public DiscovererDaemonTest {
protected:
    void SetUp() override {
        DiscovererDaemonTest::SetUp();
        if (HasFatalFailure())
            return;
        mConnection.emplace();
        mDiscoverer.emplace(*mConnection);
    }

    void TearDown() override {
        mDiscoverer.reset();
        mConnection.reset();
        DiscovererDaemonTest::TearDown();
    }

    void open() {
        auto opened = mDiscoverer->open("/film");
        mDiscoverers.expectCall("discoverer 0 open \"/film\"");
        opened.get();
    }

    template<typename Value>
    static int codeOf(std::future<Value> future) {
        try {
            future.get();
        } catch (const qnsmedia::MediaError& error) {
            return error.result();
        }
        return 0;
    }

    std::optional<qnsmedia::Connection> mConnection;
    std::optional<Discoverer> mDiscoverer;
};

MediaMetaInfo film() {
    MediaMetaInfo info;
    info.system = {"video/mp4", L"TITLE=a=b\nARTIST=\u00fc\nno tag\n", true, true, 2'000'000'000};
    info.videoCount = 1;
    info.video = {"video/x-h264", L"H.264", 320, 180, 24, 25, 1, 16, 15, true, 1000, 2000, false};
    info.audioCount = 2;
    info.audio[0] = {"audio/mpeg", L"AAC", 2, 44100, 16, 128000, 256000};
    info.audio[1] = {"audio/x-ac3", L"AC-3", 6, 48000, 0, 0, 0};
    return info;
}

TEST_F(LibraryAndDiscoverers, TellAllThatTheEngineTells) {
    EXPECT_EQ(mDiscoverer->clientId(), 1);
    open();
    auto future = mDiscoverer->metadata();
    mDiscoverers.expectCall("discoverer 0 metadata", script::metadataAnswer(0, film()));
    const Metadata told = future.get();
    EXPECT_EQ(told.mediaType, "video/mp4");
    EXPECT_TRUE(told.seekable);
    EXPECT_TRUE(told.live);
    EXPECT_EQ(told.duration, 2s);
    EXPECT_THAT(told.tags, testing::ElementsAre(testing::Pair("TITLE", "a=b"),
                                                testing::Pair("ARTIST", "\xc3\xbc")));
    ASSERT_EQ(told.video.size(), 1U);
    const qnsmedia::VideoStream& video = told.video.front();
    EXPECT_EQ(video.mediaType, "video/x-h264");
    EXPECT_EQ(video.description, "H.264");
    EXPECT_EQ(video.width, 320);
    EXPECT_EQ(video.height, 180);
    EXPECT_EQ(video.depth, 24);
    EXPECT_EQ(video.frameRate.numerator, 25);
    EXPECT_EQ(video.frameRate.denominator, 1);
    EXPECT_EQ(video.pixelAspect.numerator, 16);
    EXPECT_EQ(video.pixelAspect.denominator, 15);
    EXPECT_TRUE(video.interlaced);
    EXPECT_EQ(video.bitRate, 1000);
    EXPECT_EQ(video.maxBitRate, 2000);
    EXPECT_FALSE(video.stillPicture);
    ASSERT_EQ(told.audio.size(), 2U);
    EXPECT_EQ(told.audio[0].channels, 2);
    EXPECT_EQ(told.audio[0].sampleRate, 44100);
    EXPECT_EQ(told.audio[0].depth, 16);
    EXPECT_EQ(told.audio[0].bitRate, 128000);
    EXPECT_EQ(told.audio[0].maxBitRate, 256000);
    EXPECT_EQ(told.audio[1].mediaType, "audio/x-ac3");
    EXPECT_EQ(told.audio[1].description, "AC-3");
}

TEST_F(LibraryAndDiscoverers, TellWhyAFileCannotBeOpened) {
    auto opened = mDiscoverer->open("/film");
    mDiscoverers.expectCall("discoverer 0 open \"/film\"", "return 3");
    EXPECT_EQ(codeOf(std::move(opened)), 3);
    auto metadata = mDiscoverer->metadata();
    mDiscoverers.expectCall("discoverer 0 metadata", "return -1");
    EXPECT_EQ(codeOf(std::move(metadata)), -1);
    open();
    EXPECT_EQ(codeOf(mDiscoverer->open("/other")), 5) << "one is open";
}

TEST_F(LibraryAndDiscoverers, OpenTheNextFileWhenTheLastIsClosed) {
    for (int round = 0; round < 3; ++round) {
        open();
        auto closed = mDiscoverer->close();
        mDiscoverers.expectCall("discoverer 0 close");
        EXPECT_EQ(closed.wait_for(0s), std::future_status::timeout);
        mDiscoverers.expectCall("discoverer 0 extensions", "return 0 \"\" 0");
        closed.get();
    }
}

TEST_F(LibraryAndDiscoverers, DrawPictures) {
    open();
    auto drawn = mDiscoverer->makeImage(1s, 40, 20, "/a.png");
    mDiscoverers.expectCall("discoverer 0 metadata", "return 0 \"\" \"\" 1 0 2000000000");
    mDiscoverers.expectCall("discoverer 0 makeImage 1000000000 40 20 \"/a.png\"");
    EXPECT_EQ(codeOf(std::move(drawn)), 0);
    drawn = mDiscoverer->makeImage(1s, -1, 20, "/a.png");
    mDiscoverers.expectCall("discoverer 0 metadata", "return 4");
    EXPECT_EQ(codeOf(std::move(drawn)), 4);
}

TEST_F(LibraryAndDiscoverers, TellWhichFilesThereCanBe) {
    auto future = mDiscoverer->extensions();
    mDiscoverers.expectCall("discoverer 0 extensions", "return 0 \"mp3,mp4\" 2");
    EXPECT_THAT(future.get(), testing::ElementsAre("mp3", "mp4"));
}

TEST_F(LibraryAndDiscoverers, AnswerCallbacksToo) {
    std::promise<std::exception_ptr> opened;
    mDiscoverer->open("/film", [&](std::exception_ptr error) { opened.set_value(error); });
    mDiscoverers.expectCall("discoverer 0 open \"/film\"");
    EXPECT_EQ(opened.get_future().get(), nullptr);
    std::promise<Metadata> told;
    mDiscoverer->metadata(
        [&](std::exception_ptr, Metadata metadata) { told.set_value(std::move(metadata)); });
    mDiscoverers.expectCall("discoverer 0 metadata", script::metadataAnswer(0, film()));
    EXPECT_EQ(told.get_future().get().audio.size(), 2U);
    std::promise<std::exception_ptr> drawn;
    mDiscoverer->makeImage(0s, 1, 1, "/a",
                           [&](std::exception_ptr error) { drawn.set_value(error); });
    mDiscoverers.expectCall("discoverer 0 metadata", "return 4");
    EXPECT_NE(drawn.get_future().get(), nullptr);
    std::promise<std::size_t> listed;
    mDiscoverer->extensions([&](std::exception_ptr, const std::vector<std::string>& extensions) {
        listed.set_value(extensions.size());
    });
    mDiscoverers.expectCall("discoverer 0 extensions", "return 0 \"a,b\" 2");
    EXPECT_EQ(listed.get_future().get(), 2U);
    std::promise<std::exception_ptr> closed;
    mDiscoverer->close([&](std::exception_ptr error) { closed.set_value(error); });
    mDiscoverers.expectCall("discoverer 0 close");
    mDiscoverers.expectCall("discoverer 0 extensions", "return 0 \"\" 0");
    EXPECT_EQ(closed.get_future().get(), nullptr);
}

TEST_F(LibraryAndDiscoverers, WorkSideBySideAndTakeThePlaceOfOnesThatLeft) {
    open();
    Discoverer second(*mConnection);
    auto opened = second.open("/other");
    mDiscoverers.expectCall("discoverer 1 open \"/other\"");
    opened.get();
    mDiscoverer.reset();
    mDiscoverer.emplace(*mConnection);
    open();
}

TEST_F(LibraryAndDiscoverers, RefuseNamesThatEndEarly) {
    EXPECT_THROW(mDiscoverer->open(std::string("/a\0b", 4)).get(), qnsmedia::Error);
    EXPECT_THROW(mDiscoverer->makeImage(0s, 1, 1, std::string("/a\0b", 4)).get(), qnsmedia::Error);
}

TEST_F(LibraryAndDiscoverers, EndWithTheDaemon) {
    auto waiting = mDiscoverer->open("/film");
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 0 open \"/film\"");
    mpDaemon->signal(SIGKILL);
    EXPECT_THROW(waiting.get(), qnsmedia::ConnectionLost);
    mpDaemon->waitForExit();
}

} // namespace
