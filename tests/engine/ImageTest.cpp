// SPDX-License-Identifier: MIT
#include <array>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <memory>
#include <sys/stat.h>

#include <gmock/gmock.h>

#include "LibMediaPlayer/IMediaDiscoverer.h"
#include "LibMediaPlayer/InterfaceFactory.h"
#include "LibMediaPlayer/Result.h"
#include "tests/engine/CommandOutput.h"
#include "tests/engine/Samples.h"
#include "tests/engine/TestPlayer.h"
#include "tests/engine/truth/Truth.h"

using namespace LibMediaPlayer;

namespace {

/** Rows of pixels 0xAARRGGBB. */
struct Pixels {
    std::vector<std::uint32_t> values;

    [[nodiscard]] int red(std::size_t index) const { return values[index] >> 16 & 0xff; }
    [[nodiscard]] int green(std::size_t index) const { return values[index] >> 8 & 0xff; }
    [[nodiscard]] int blue(std::size_t index) const { return values[index] & 0xff; }
};

Pixels readPixels(const std::filesystem::path& path) {
    Pixels pixels;
    pixels.values.resize(std::filesystem::file_size(path) / sizeof(std::uint32_t));
    std::ifstream file(path, std::ios::binary);
    file.read(reinterpret_cast<char*>(pixels.values.data()),
              static_cast<std::streamsize>(pixels.values.size() * sizeof(std::uint32_t)));
    return pixels;
}

/** The first picture's time, reckoned from the beginning of the file. */
Seconds startOfVideo(const std::filesystem::path& path) {
    const auto told =
        nlohmann::json::parse(outputOf("ffprobe -v quiet -of json -select_streams v -show_entries "
                                       "stream=start_time:format=start_time '" +
                                       path.string() + "'"));
    const auto start = [](const nlohmann::json& part) {
        return Seconds(std::stod(part.at("start_time").get<std::string>()));
    };
    return start(told.at("streams").at(0)) - start(told.at("format"));
}

/** In decibels, over the three colours. */
double psnr(const Pixels& one, const Pixels& other) {
    EXPECT_EQ(one.values.size(), other.values.size());
    if (one.values.size() != other.values.size() || one.values.empty())
        return 0;
    double sum = 0;
    for (std::size_t index = 0; index < one.values.size(); ++index) {
        sum += std::pow(one.red(index) - other.red(index), 2);
        sum += std::pow(one.green(index) - other.green(index), 2);
        sum += std::pow(one.blue(index) - other.blue(index), 2);
    }
    const double mean = sum / static_cast<double>(3 * one.values.size());
    return mean == 0 ? 100 : 10 * std::log10(255 * 255 / mean);
}

class ImageTest : public testing::Test {
protected:
    void SetUp() override {
        std::string pattern = testing::TempDir() + "/qns-image-XXXXXX";
        mFolder = ::mkdtemp(pattern.data());
    }
    void TearDown() override { std::filesystem::remove_all(mFolder); }

    int open(const std::filesystem::path& path) { return mpDiscoverer->open(path.wstring()); }

    int makeImage(Seconds position, int width, int height, const std::string& name) {
        return mpDiscoverer->makeImage(toNanoseconds(position), width, height,
                                       (mFolder / name).wstring());
    }

    Pixels image(Seconds position, int width, int height) {
        EXPECT_EQ(makeImage(position, width, height, "image.raw"), kOk);
        return readPixels(mFolder / "image.raw");
    }

    /** The frame of that number, as the ffmpeg command decodes it. */
    Pixels frameOf(const std::filesystem::path& path, int number) {
        return converted("-noautorotate -i '" + path.string() + "' -vf \"select=eq(n\\," +
                         std::to_string(number) + ")\" -frames:v 1");
    }

    Pixels converted(const std::string& arguments) {
        const std::filesystem::path target = mFolder / "expected.raw";
        const std::string command = "ffmpeg -v error -nostdin -y " + arguments +
                                    " -f rawvideo -pix_fmt bgra '" + target.string() + "'";
        EXPECT_EQ(std::system(command.c_str()), 0) << command;
        return readPixels(target);
    }

    [[nodiscard]] std::size_t fileCount() const {
        std::size_t count = 0;
        for (const auto& entry : std::filesystem::directory_iterator(mFolder))
            count += entry.exists() ? 1 : 0;
        return count;
    }

    std::filesystem::path mFolder;
    const std::unique_ptr<IMediaDiscoverer> mpDiscoverer{InterfaceFactory::createDiscoverer()};
};

class FrameOf : public ImageTest, public testing::WithParamInterface<const char*> {};

} // namespace

TEST_P(FrameOf, AnyMomentIsTheOneThatIsShownThen) {
    const std::filesystem::path path = samplePath(GetParam());
    ASSERT_EQ(open(path), kOk);
    const Seconds start = startOfVideo(path);
    for (const int number : {0, 1, 24, 25, 49, 63, 98}) {
        const Pixels expected = frameOf(path, number);
        EXPECT_GT(psnr(image(start + 0.04_s * number + 0.02_s, 0, 0), expected), 35) << number;
    }
}

INSTANTIATE_TEST_SUITE_P(Engine, FrameOf,
                         testing::Values("film.mp4", "film.mkv", "film.webm", "vp8.webm",
                                         "film.avi", "film.ts", "film.mpg", "film.flv"),
                         [](const auto& instance) { return testName(instance.param); });

TEST_F(ImageTest, ExactlyAtAFramesTimeItIsThatFrame) {
    ASSERT_EQ(open(samplePath("film.mp4")), kOk);
    EXPECT_GT(psnr(image(2.0_s, 0, 0), frameOf(samplePath("film.mp4"), 50)), 35);
}

TEST_F(ImageTest, BehindTheEndItIsTheLast) {
    ASSERT_EQ(open(samplePath("film.mp4")), kOk);
    EXPECT_GT(psnr(image(100.0_s, 0, 0), frameOf(samplePath("film.mp4"), 99)), 35);
}

TEST_F(ImageTest, WithoutReachingThePositionItIsTheNearestFrameAndTheSameEveryTime) {
    ASSERT_EQ(open(samplePath("longkey.mp4")), kOk);
    EXPECT_GT(psnr(image(19.0_s, 0, 0), frameOf(samplePath("longkey.mp4"), 475)), 35);
    const Pixels first = image(24.8_s, 0, 0);
    EXPECT_EQ(first.values, image(24.8_s, 0, 0).values);
}

TEST_F(ImageTest, IsScaledAsFfmpegScales) {
    const std::filesystem::path path = truthPath("cropped.mp4");
    ASSERT_EQ(open(path), kOk);
    const Pixels expected =
        converted("-i '" + path.string() + "' -vf scale=240:135:flags=bicubic -frames:v 1");
    EXPECT_GT(psnr(image(0.0_s, 240, 135), expected), 35);
}

TEST_F(ImageTest, HasExactlyTheSizeWithBlackBorders) {
    ASSERT_EQ(open(truthPath("h264.mp4")), kOk);
    const Pixels pixels = image(0.0_s, 320, 320);
    ASSERT_EQ(pixels.values.size(), 320U * 320U);
    EXPECT_EQ(pixels.values.front(), 0xff000000);
    EXPECT_EQ(pixels.values[69U * 320U + 160U], 0xff000000);
    EXPECT_EQ(pixels.values.back(), 0xff000000);
    EXPECT_NE(pixels.values[160U * 320U + 160U], 0xff000000);
}

TEST_F(ImageTest, OneSizeFollowsFromTheOther) {
    ASSERT_EQ(open(truthPath("h264.mp4")), kOk);
    EXPECT_EQ(image(0.0_s, 160, 0).values.size(), 160U * 90U);
    EXPECT_EQ(image(0.0_s, 0, 90).values.size(), 160U * 90U);
    EXPECT_EQ(image(0.0_s, 0, 0).values.size(), 320U * 180U);
}

TEST_F(ImageTest, ShowsPixelsThatAreNotSquareAsTheyAreMeant) {
    ASSERT_EQ(open(truthPath("wide-pixels.mp4")), kOk);
    EXPECT_EQ(image(0.0_s, 0, 0).values.size(), 1024U * 576U);
}

TEST_F(ImageTest, IsTurnedAsItIsMeantToBeSeen) {
    ASSERT_EQ(open(truthPath("turned.mp4")), kOk);
    const Pixels expected = converted("-i '" + truthPath("turned.mp4").string() + "' -frames:v 1");
    EXPECT_GT(psnr(image(0.0_s, 180, 320), expected), 35);
}

TEST_F(ImageTest, OfHighDefinitionHasTheRightColours) {
    const std::filesystem::path film = mFolder / "red.mkv";
    const std::string make = "ffmpeg -v error -nostdin -y -f lavfi -i color=red:size=1280x720:d=1 "
                             "-vf scale=out_color_matrix=bt709 -c:v ffv1 -colorspace bt709 '" +
                             film.string() + "'";
    ASSERT_EQ(std::system(make.c_str()), 0);
    ASSERT_EQ(open(film), kOk);
    const Pixels pixels = image(0.0_s, 16, 9);
    EXPECT_NEAR(pixels.red(0), 255, 6);
    EXPECT_NEAR(pixels.green(0), 0, 6);
    EXPECT_NEAR(pixels.blue(0), 0, 6);
}

TEST_F(ImageTest, IsWrittenAsTheNameSays) {
    ASSERT_EQ(open(samplePath("film.mp4")), kOk);
    const Pixels raw = image(1.0_s, 0, 0);
    for (const char* name : {"image.png", "image.JPG", "image.jpeg"}) {
        ASSERT_EQ(makeImage(1.0_s, 0, 0, name), kOk);
        const Pixels decoded = converted("-i '" + (mFolder / name).string() + "'");
        EXPECT_GT(psnr(raw, decoded), 30) << name;
    }
    EXPECT_EQ(fileCount(), 5U) << "no temporary files are left";
}

TEST_F(ImageTest, OfPicturesIsThePictureAndGlassIsBlackBehind) {
    for (const char* name : {"photo.jpg", "picture.png", "picture.bmp", "picture.tiff",
                             "picture.webp", "deep.png", "pixel.png", "glass.png"}) {
        ASSERT_EQ(open(truthPath(name)), kOk) << name;
        for (const std::uint32_t pixel : image(0.0_s, 0, 0).values)
            ASSERT_EQ(pixel >> 24, 0xffU) << name;
    }
}

TEST_F(ImageTest, OfSoundIsItsCoverAndWithoutACoverThereIsNone) {
    for (const char* name : {"cover.mp3", "cover.m4a", "cover.flac"}) {
        ASSERT_EQ(open(truthPath(name)), kOk);
        EXPECT_GT(
            psnr(image(1.0_s, 0, 0), converted("-i '" + truthPath("photo.jpg").string() + "'")), 35)
            << name;
    }
    ASSERT_EQ(open(truthPath("constant.mp3")), kOk);
    EXPECT_EQ(makeImage(0.0_s, 10, 10, "none.png"), kNotAvailable);
    EXPECT_FALSE(std::filesystem::exists(mFolder / "none.png"));
}

TEST_F(ImageTest, OfImpossibleSizesIsRefused) {
    ASSERT_EQ(open(samplePath("film.mp4")), kOk);
    constexpr int kLeast = std::numeric_limits<int>::min();
    constexpr int kMost = std::numeric_limits<int>::max();
    const std::array<std::array<int, 2>, 8> sizes{{{-1, 10},
                                                   {10, -1},
                                                   {kLeast, kLeast},
                                                   {100000, 100000},
                                                   {kMost, kMost},
                                                   {kMost, 1},
                                                   {1, kMost},
                                                   {0, 16384}}};
    for (const auto& [width, height] : sizes)
        EXPECT_EQ(makeImage(0.0_s, width, height, "never.png"), kWrongState) << width << height;
    EXPECT_EQ(fileCount(), 0U);
}

TEST_F(ImageTest, ThatCannotBeWrittenSaysWhy) {
    ASSERT_EQ(open(samplePath("film.mp4")), kOk);
    EXPECT_EQ(makeImage(0.0_s, 10, 10, "no/such/folder.png"), kNotFound);
    std::filesystem::create_directory(mFolder / "folder.png");
    EXPECT_EQ(makeImage(0.0_s, 10, 10, "folder.png"), kAccessDenied);
    ASSERT_EQ(::mkfifo((mFolder / "pipe.png").c_str(), 0600), 0);
    EXPECT_EQ(makeImage(0.0_s, 10, 10, "pipe.png"), kAccessDenied);
    EXPECT_TRUE(std::filesystem::is_fifo(mFolder / "pipe.png"));
    EXPECT_EQ(fileCount(), 2U);
}

TEST_F(ImageTest, NeedsAnOpenFile) {
    EXPECT_EQ(makeImage(0.0_s, 10, 10, "never.png"), kWrongState);
    ASSERT_EQ(open(samplePath("film.mp4")), kOk);
    EXPECT_EQ(mpDiscoverer->close(), kOk);
    EXPECT_EQ(makeImage(0.0_s, 10, 10, "never.png"), kWrongState);
}
