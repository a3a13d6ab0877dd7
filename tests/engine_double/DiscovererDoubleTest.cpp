// SPDX-License-Identifier: MIT
#include "tests/engine_double/MetadataText.h"
#include "tests/engine_double/ScriptText.h"

#include <memory>

#include <gmock/gmock.h>

#include "LibMediaPlayer/InterfaceFactory.h"

using LibMediaPlayer::MediaMetaInfo;

TEST(MetadataText, WhatIsWrittenIsReadAgain) {
    MediaMetaInfo info;
    info.system = {"video/x", L"TITLE=\u00fc \"a\"\nARTIST=b", true, false, 1234567890123};
    info.videoCount = 1;
    info.video = {"v", L"words", -1, 2, 3, 4, 5, 6, 7, true, 8, 9, false};
    info.audioCount = 8;
    for (int i = 0; i < 8; ++i)
        info.audio[static_cast<std::size_t>(i)] = {"a", L"", i, 1, 2, 3, 4};
    const std::string answer = script::metadataAnswer(7, info);
    EXPECT_THAT(answer, testing::StartsWith("return 7 \"video/x\" "));
    const MediaMetaInfo read = script::metadataIn(script::words(answer));
    EXPECT_EQ(script::metadataAnswer(7, read), answer);
    EXPECT_EQ(read.system.tags, info.system.tags);
    EXPECT_EQ(read.system.duration, info.system.duration);
    EXPECT_EQ(read.video.width, -1);
    EXPECT_FALSE(read.video.stillPicture);
    EXPECT_EQ(read.audioCount, 8);
    EXPECT_EQ(read.audio[7].channels, 7);
}

TEST(MetadataText, AnAnswerWithoutARecordMakesANewOne) {
    const MediaMetaInfo read = script::metadataIn(script::words("return 3"));
    EXPECT_EQ(script::metadataAnswer(0, read), script::metadataAnswer(0, {}));
    EXPECT_EQ(read.videoCount, 0);
}

TEST(QuietDiscoverer, EveryCallSucceedsAndTellsNothing) {
    const std::unique_ptr<LibMediaPlayer::IMediaDiscoverer> discoverer(
        LibMediaPlayer::InterfaceFactory::createDiscoverer());
    ASSERT_NE(discoverer, nullptr);
    MediaMetaInfo info;
    info.videoCount = 1;
    LibMediaPlayer::SupportedExtensions extensions;
    EXPECT_EQ(discoverer->open(L"/a"), 0);
    EXPECT_EQ(discoverer->metadata(info), 0);
    EXPECT_EQ(info.videoCount, 0);
    EXPECT_EQ(discoverer->makeImage(0, 1, 1, L"/b"), 0);
    EXPECT_EQ(discoverer->supportedExtensions(extensions), 0);
    EXPECT_EQ(extensions.extensions, L"");
    EXPECT_EQ(discoverer->close(), 0);
}
