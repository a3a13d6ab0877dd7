// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <gmock/gmock.h>

#include "LibMediaPlayer/IMediaDiscoverer.h"

/** The engine's discoverer. Operations that are not expected return 0. */
class DiscovererMock : public LibMediaPlayer::IMediaDiscoverer {
public:
    MOCK_METHOD(int, open, (const std::wstring& path), (override));
    MOCK_METHOD(int, close, (), (override));
    MOCK_METHOD(int, metadata, (LibMediaPlayer::MediaMetaInfo & info), (override));
    MOCK_METHOD(int, reserved5, (), (override));
    MOCK_METHOD(int, makeImage,
                (int64_t position, int32_t width, int32_t height, const std::wstring& path),
                (override));
    MOCK_METHOD(int, reserved7, (), (override));
    MOCK_METHOD(int, supportedExtensions, (LibMediaPlayer::SupportedExtensions & extensions),
                (override));

    ~DiscovererMock() override { died(); }
    MOCK_METHOD(void, died, ());
};
