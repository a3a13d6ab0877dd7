// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>
#include <string>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/MediaClient.h"
#include "tests/daemon/support/SampleMedia.h"
#include "tests/engine/Mount.h"
#include "tests/support/TestFolder.h"

namespace fs = std::filesystem;

namespace {

/** Results. */
enum : std::int64_t { kOk = 0, kAccessDenied = 2, kNoSpace = 8 };

void fill(const fs::path& folder) {
    std::ofstream file(folder / "filler", std::ios::binary);
    const std::string block(4096, '.');
    while (file.write(block.data(), static_cast<std::streamsize>(block.size())).flush()) {
    }
}

/** The daemon with the engine that plays, beside a disk in trouble. */
class Disk : public DaemonTest {
protected:
    void SetUp() override { fs::create_directory(data()); }

    void startDaemon() {
        DaemonOptions options;
        options.environment["QNS_HV_DATA"] = data();
        start(options);
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
    }

    [[nodiscard]] fs::path data() const { return mFolder.path("data"); }

    /** A sound file that a small disk has no room for. */
    [[nodiscard]] std::string largeSound() const {
        auto path = mFolder.path("large.wav");
        fs::copy_file(sample::shortSound(), path);
        fs::resize_file(path, 5'000'000);
        return path;
    }

    TestFolder mFolder;
};

TEST_F(Disk, ThatIsFullIsToldToWhoImportsAndTheNextFileThatFitsIsTaken) {
    const auto disk = Mount::memory(data(), 2'000'000);
    startDaemon();
    MediaClient client(1000);
    EXPECT_EQ(client.import(largeSound(), "Sounds"), kNoSpace);
    EXPECT_EQ(client.import(sample::shortSound(), "Sounds"), kOk);
    EXPECT_FALSE(fs::exists(data() / "media/Sounds/large.wav"));
    EXPECT_TRUE(fs::exists(data() / "media/Sounds/short.wav"));
    EXPECT_TRUE(mSyslog.waitForLine("large.wav iRet: 8"));
}

TEST_F(Disk, ThatIsFullFromTheStartKeepsNothingAndHoldsUpNothingElse) {
    const auto disk = Mount::memory(data(), 100'000);
    fill(data());
    startDaemon();
    MediaClient client(1000);
    EXPECT_NE(client.import(sample::film()), kOk);
    EXPECT_EQ(client.describe(sample::film()), kOk);
    EXPECT_EQ(client.play(sample::film()), kOk);
    fs::remove(data() / "filler");
}

TEST_F(Disk, ThatIsFullIsToldToWhoWantsAPicture) {
    const auto disk = Mount::memory(mFolder.path("pictures"), 100'000);
    fill(mFolder.path("pictures"));
    startDaemon();
    MediaClient client(1000);
    EXPECT_EQ(client.draw(sample::film(), mFolder.path("pictures/a.png")), kNoSpace);
    EXPECT_EQ(client.draw(sample::film(), mFolder.path("a.png")), kOk);
}

TEST_F(Disk, ThatMayOnlyBeReadIsToldToWhoImportsAndToWhoWantsAPicture) {
    const auto disk = Mount::readOnly(data());
    startDaemon();
    MediaClient client(1000);
    EXPECT_EQ(client.import(sample::film()), kAccessDenied);
    EXPECT_EQ(client.draw(sample::film(), data() / "a.png"), kAccessDenied);
    EXPECT_EQ(client.play(sample::film()), kOk);
}

TEST_F(Disk, WithoutRoomForLogFilesLosesTheirLinesOnly) {
    const auto disk = Mount::memory("/var/log", 8192);
    fill("/var/log");
    startDaemon();
    MediaClient client(1000);
    EXPECT_EQ(client.import(sample::film()), kOk);
    EXPECT_EQ(client.play(sample::film()), kOk);
    EXPECT_TRUE(mSyslog.waitForLine("MediaPlayerController::open"));
}

TEST_F(Disk, WhoseLogFolderMayOnlyBeReadLosesTheirLinesOnly) {
    const auto disk = Mount::readOnly("/var/log");
    startDaemon();
    MediaClient client(1000);
    EXPECT_EQ(client.play(sample::film()), kOk);
    EXPECT_TRUE(mSyslog.waitForLine("MediaPlayerController::open"));
}

/** The engine's files need descriptors too. */
TEST_F(Disk, WithoutDescriptorsForItIsToldToWhoeverAsksAndUsedAgainWhenThereAreSome) {
    startDaemon();
    MediaClient client(1000);
    EXPECT_EQ(client.play(sample::film()), kOk);
    mpDaemon->limitFreeDescriptors(0);
    EXPECT_NE(client.describe(sample::film()), kOk);
    EXPECT_NE(client.import(sample::film()), kOk);
    EXPECT_NE(client.draw(sample::film(), mFolder.path("a.png")), kOk);
    mpDaemon->limitFreeDescriptors(200);
    EXPECT_EQ(client.describe(sample::film()), kOk);
    EXPECT_EQ(client.import(sample::film()), kOk);
    EXPECT_EQ(client.draw(sample::film(), mFolder.path("a.png")), kOk);
    EXPECT_EQ(client.play(sample::film()), kOk);
}

} // namespace
