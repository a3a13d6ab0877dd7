// SPDX-License-Identifier: MIT
#include "worker/Media.h"

#include <gtest/gtest.h>

#include "LibMediaPlayer/Result.h"
#include "tests/engine/Samples.h"

using namespace LibMediaPlayer;
using worker::lookAt;

namespace {

probe::MediaLook look(const std::string& name) {
    const auto result = lookAt(samplePath(name));
    const auto* const told = std::get_if<probe::MediaLook>(&result);
    EXPECT_TRUE(told) << name;
    return told ? *told : probe::MediaLook{};
}

int failureOf(const std::string& path) {
    const auto result = lookAt(path);
    const auto* const failure = std::get_if<probe::LookFailure>(&result);
    return failure ? failure->result : kOk;
}

} // namespace

TEST(MediaLook, CountsStreamsAsTheFileHasThem) {
    for (const Sample& sample : timedSamples()) {
        const auto told = look(sample.name);
        EXPECT_EQ(told.videoCount, sample.videoCount) << sample.name;
        EXPECT_EQ(told.audioCount, sample.audioCount) << sample.name;
        EXPECT_EQ(told.textCount, sample.textCount) << sample.name;
        EXPECT_NEAR(std::chrono::duration<double>(told.duration.time).count(), 4.0, 0.1)
            << sample.name;
        EXPECT_FALSE(told.still) << sample.name;
    }
}

TEST(MediaLook, KnowsAPictureAndHowFastAFilmIs) {
    for (const std::string& name : pictureNames())
        EXPECT_TRUE(look(name).still) << name;
    EXPECT_DOUBLE_EQ(look("fast.mp4").video->frameRate, 100);
    EXPECT_DOUBLE_EQ(look("film.mp4").video->frameRate, 25);
    EXPECT_EQ(look("film.webm").video->codec, "vp9");
    EXPECT_EQ(look("film.webm").audio->codec, "opus");
    EXPECT_TRUE(look("sound.mp3").tagged);
}

TEST(MediaLook, RefusesWhatIsNoRegularFileUnopened) {
    EXPECT_EQ(failureOf(samplePath("")), kNotMedia);
    EXPECT_EQ(failureOf("/dev/zero"), kNotMedia);
    EXPECT_EQ(failureOf("/dev/tty"), kNotMedia);
    EXPECT_EQ(failureOf(""), kNotFound);
    EXPECT_EQ(failureOf(samplePath("no such file.mp4")), kNotFound);
    EXPECT_EQ(failureOf(samplePath("film.mp4/inside.mp4")), kNotFound);
}
