// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include <cstdlib>
#include <numeric>

#include "LibMediaPlayer/Result.h"
#include "tests/engine/CommandOutput.h"
#include "tests/engine/Samples.h"
#include "tests/engine/TestImporter.h"
#include "worker/Media.h"

using namespace LibMediaPlayer;
using worker::drawThumbnail;
namespace fs = std::filesystem;

namespace {

/** A JPEG as ffmpeg sees it. */
struct Seen {
    std::string size; ///< WIDTHxHEIGHT
    int brightness = 0;
};

Seen look(const std::string& jpeg) {
    const TestFolder folder;
    const fs::path file = folder / "thumbnail.jpg";
    writeFile(file, jpeg);
    const std::string size = outputOf("ffprobe -v error -of csv=p=0:s=x -show_entries "
                                      "stream=width,height '" +
                                      file.string() + "'");
    const std::string pixels =
        outputOf("ffmpeg -v error -nostdin -i '" + file.string() + "' -f rawvideo -pix_fmt gray -");
    const int sum = std::accumulate(pixels.begin(), pixels.end(), 0, [](int before, char pixel) {
        return before + static_cast<unsigned char>(pixel);
    });
    return {size.substr(0, size.find('\n')),
            pixels.empty() ? 0 : sum / static_cast<int>(pixels.size())};
}

/** What ffmpeg makes of the arguments, in a file of that name. */
fs::path make(const TestFolder& folder, const std::string& arguments, const std::string& name) {
    const fs::path file = folder / name;
    const std::string command =
        "ffmpeg -v error -nostdin -y " + arguments + " '" + file.string() + "'";
    EXPECT_EQ(std::system(command.c_str()), 0) << command;
    return file;
}

constexpr char kH264[] = " -c:v libx264 -preset ultrafast -pix_fmt yuv420p ";

/** Black for a while, then bright; with one key frame, or one each ten pictures. */
std::string filmWithDarkBeginning(bool hasKeyFrames) {
    return std::string("-f lavfi -i color=black:size=64x48:rate=10:duration=2 "
                       "-f lavfi -i color=white:size=64x48:rate=10:duration=4 "
                       "-filter_complex concat=n=2:v=1 -sc_threshold 0") +
           kH264 + (hasKeyFrames ? "-g 10" : "-g 1000");
}

} // namespace

TEST(Thumbnail, EveryFilmHasOneThatIsNotDark) {
    for (const Sample& sample : timedSamples()) {
        const auto thumbnail = drawThumbnail(samplePath(sample.name));
        if (sample.videoCount == 0)
            continue;
        EXPECT_EQ(thumbnail.result, kOk) << sample.name;
        const Seen seen = look(thumbnail.jpeg);
        EXPECT_EQ(seen.size, "192x108") << sample.name;
        EXPECT_GT(seen.brightness, 60) << sample.name;
    }
}

TEST(Thumbnail, OfSoundItIsTheCover) {
    EXPECT_EQ(look(drawThumbnail(samplePath("cover.mp3")).jpeg).size, "192x108");
    EXPECT_EQ(drawThumbnail(samplePath("sound.mp3")).result, kNotAvailable);
    EXPECT_EQ(drawThumbnail(samplePath("sound.flac")).result, kNotAvailable);
}

TEST(Thumbnail, AFilmsCoverComesBeforeItsScenes) {
    const TestFolder folder;
    const fs::path cover = make(
        folder, "-f lavfi -i color=white:size=40x60:duration=1:rate=1 -frames:v 1", "cover.jpg");
    const fs::path film =
        make(folder,
             "-i '" + samplePath("film.mp4").string() + "' -i '" + cover.string() +
                 "' -map 0 -map 1 -c copy -disposition:v:1 attached_pic",
             "film.mp4");
    const Seen seen = look(drawThumbnail(film).jpeg);
    EXPECT_EQ(seen.size, "40x60");
    EXPECT_GT(seen.brightness, 240);
}

TEST(Thumbnail, PicturesHaveOneToo) {
    for (const std::string& name : pictureNames())
        EXPECT_EQ(look(drawThumbnail(samplePath(name)).jpeg).size, "192x108") << name;
}

TEST(Thumbnail, ADarkBeginningIsLeftOut) {
    const TestFolder folder;
    for (const bool hasKeyFrames : {true, false}) {
        const fs::path film = make(folder, filmWithDarkBeginning(hasKeyFrames), "film.mp4");
        EXPECT_GT(look(drawThumbnail(film).jpeg).brightness, 200) << hasKeyFrames;
    }
}

TEST(Thumbnail, AFilmThatIsDarkThroughoutHasADarkOne) {
    const TestFolder folder;
    const fs::path film = make(
        folder, std::string("-f lavfi -i color=black:size=64x48:duration=2") + kH264, "film.mp4");
    const auto thumbnail = drawThumbnail(film);
    EXPECT_EQ(thumbnail.result, kOk);
    EXPECT_EQ(look(thumbnail.jpeg).size, "64x48");
}

TEST(Thumbnail, LargePicturesBecomeSmallAndKeepTheirShape) {
    const TestFolder folder;
    const auto picture = [&](const std::string& size, const std::string& name) {
        return make(folder, "-f lavfi -i testsrc2=size=" + size + ":duration=1:rate=1 -frames:v 1",
                    name);
    };
    const auto wide = drawThumbnail(picture("1920x1080", "wide.jpg"));
    EXPECT_EQ(look(wide.jpeg).size, "256x144");
    EXPECT_LT(wide.jpeg.size(), 20'000U);
    EXPECT_EQ(look(drawThumbnail(picture("200x800", "high.jpg")).jpeg).size, "64x256");
    EXPECT_EQ(look(drawThumbnail(picture("2000x2", "line.png")).jpeg).size, "256x1");
}

TEST(Thumbnail, OfWhatIsNoMediumThereIsNone) {
    EXPECT_EQ(drawThumbnail(samplePath("text.txt")).result, kNotMedia);
    EXPECT_EQ(drawThumbnail(samplePath("missing.mp4")).result, kNotFound);
    EXPECT_NE(drawThumbnail(samplePath("unfinished.mp4")).result, kOk);
    EXPECT_NE(drawThumbnail(samplePath("stub.mp4")).result, kOk);
}
