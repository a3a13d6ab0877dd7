// SPDX-License-Identifier: MIT
#include "reader/Description.h"

#include <memory>
#include <string>
#include <sys/mman.h>
#include <unistd.h>
#include <utility>

#include <gtest/gtest.h>

#include "reader/OpenMedia.h"
#include "tests/engine/Matroska.h"

namespace {

LibMediaPlayer::MediaMetaInfo described(const std::string& content) {
    qns::UniqueFd memory(::memfd_create("media", MFD_CLOEXEC));
    EXPECT_EQ(::write(memory.get(), content.data(), content.size()),
              static_cast<ssize_t>(content.size()));
    probe::RegularFile file;
    EXPECT_EQ(file.adopt(std::move(memory)), 0);
    std::unique_ptr<probe::MediaFile> pFile;
    EXPECT_EQ(reader::openMedia(std::move(file), probe::MediaFile::kLook, pFile), 0);
    return pFile ? reader::readDetails(*pFile).info : LibMediaPlayer::MediaMetaInfo{};
}

constexpr std::uint32_t kNonsense = 0xfffffff0; // negative where it is kept as an int

} // namespace

TEST(Description, TellsOfNoNegativeNumberOfChannels) {
    const auto info = described(matroska::file(matroska::soundTrack(kNonsense)));
    EXPECT_EQ(info.audioCount, 1);
    EXPECT_EQ(info.audio.front().channels, 0);
    EXPECT_EQ(described(matroska::file(matroska::soundTrack(2))).audio.front().channels, 2);
}

TEST(Description, TellsOfNoNegativeSize) {
    const auto info = described(matroska::file(matroska::filmTrack(kNonsense, kNonsense)));
    EXPECT_EQ(info.videoCount, 1);
    EXPECT_EQ(info.video.width, 0);
    EXPECT_EQ(info.video.height, 0);
    EXPECT_EQ(described(matroska::file(matroska::filmTrack(640, 360))).video.width, 640);
}
