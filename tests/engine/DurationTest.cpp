// SPDX-License-Identifier: MIT
#include "probe/Duration.h"

#include <chrono>
#include <filesystem>
#include <fstream>
#include <string>

#include <gtest/gtest.h>

#include "probe/MediaFile.h"
#include "tests/engine/Matroska.h"
#include "tests/engine/truth/Truth.h"

using namespace std::chrono_literals;
using namespace std::string_literals;
using probe::MediaFile;

namespace {

constexpr int kFrames = 1000;
constexpr std::chrono::nanoseconds kTime((kFrames * 1024 * 1'000'000'000LL + 22050) / 44100);

/** 371 bytes of AAC. */
std::string frame() {
    std::string bytes = "\xff\xf1\x50\x40\x2e\x7f\xfc"s;
    bytes.resize(371);
    return bytes;
}

std::string frames(int count) {
    std::string bytes;
    while (count-- > 0)
        bytes += frame();
    return bytes;
}

class Duration : public testing::Test {
protected:
    void SetUp() override {
        std::string pattern = testing::TempDir() + "/qns-duration-XXXXXX";
        mFolder = ::mkdtemp(pattern.data());
    }
    void TearDown() override { std::filesystem::remove_all(mFolder); }

    [[nodiscard]] probe::Duration of(const std::string& content,
                                     MediaFile::Bounds bounds = MediaFile::kLook) const {
        std::ofstream(mFolder / "file", std::ios::binary) << content;
        return ofFile(mFolder / "file", bounds);
    }

    static probe::Duration ofFile(const std::filesystem::path& path, MediaFile::Bounds bounds) {
        probe::RegularFile regular;
        EXPECT_EQ(regular.open(path), 0) << path;
        auto opened = MediaFile::open(std::move(regular), bounds);
        auto* const pFile = std::get_if<std::unique_ptr<MediaFile>>(&opened);
        EXPECT_TRUE(pFile) << path;
        return pFile ? (*pFile)->duration() : probe::Duration{};
    }

    std::filesystem::path mFolder;
};

} // namespace

TEST_F(Duration, OfBareSoundIsThatOfAllItsFrames) {
    const auto duration = of(frames(kFrames));
    EXPECT_EQ(duration.time, kTime);
    EXPECT_TRUE(duration.isMeasured);
}

TEST_F(Duration, OfBareSoundCountsNoTagNorJunkNorHalfAFrame) {
    const std::string tag = "ID3\x04\0\0\0\0\x07\x68"s + std::string(1000, '\0');
    const std::string junk = std::string(3000, 'x') + frame().substr(0, 7) + std::string(500, 'x');
    EXPECT_EQ(of(tag + frames(kFrames)).time, kTime);
    EXPECT_EQ(of(frames(kFrames / 2) + junk + frames(kFrames / 2)).time, kTime);
    EXPECT_EQ(of(frames(kFrames) + "TAG" + std::string(125, ' ')).time, kTime);
    EXPECT_EQ(of(frames(kFrames) + frame().substr(0, 370)).time, kTime);
}

TEST_F(Duration, OfMoreBareSoundThanMayBeReadIsReckoned) {
    const auto duration = of(frames(4 * kFrames), {700 * 1024, 10s});
    EXPECT_NEAR(static_cast<double>(duration.time.count()), 4.0 * kTime.count(),
                0.01 * 4 * kTime.count());
    EXPECT_FALSE(duration.isMeasured);
}

TEST_F(Duration, OfARecordingIsReadFromItsEnd) {
    for (const char* const name : {"live.mkv", "late.ts"}) {
        const std::filesystem::path path = truthPath(name);
        const auto size = static_cast<std::int64_t>(std::filesystem::file_size(path));
        ASSERT_GT(size, 1400 * 1024) << "too small to tell";
        const auto duration = ofFile(path, {size * 3 / 4, 10s});
        EXPECT_NEAR(std::chrono::duration<double>(duration.time).count(), 20, 0.06) << name;
        EXPECT_TRUE(duration.isMeasured) << name;
    }
}

TEST_F(Duration, ThatNoClockCanCountIsTheLongestOfAll) {
    constexpr std::uint64_t kManyYears = 0x4331c37937e08000; // 5e15 as a double
    const auto duration = of(matroska::file(matroska::soundTrack(1), kManyYears));
    EXPECT_EQ(duration.time,
              std::chrono::floor<std::chrono::microseconds>(std::chrono::nanoseconds::max()));
    EXPECT_EQ(of(matroska::file(matroska::soundTrack(1))).time, 5s);
}
