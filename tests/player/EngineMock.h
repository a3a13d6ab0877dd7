// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>

#include <gmock/gmock.h>

#include "LibMediaPlayer/IMediaPlayer.h"

/** The engine's player, linked into the test. Operations that are not expected return 0. */
class PlayerMock : public LibMediaPlayer::IMediaPlayer {
public:
    ~PlayerMock() override {
        if (atDestruction)
            atDestruction();
    }

    MOCK_METHOD(int, open, (const std::wstring& path, int format), (override));
    MOCK_METHOD(int, close, (), (override));
    MOCK_METHOD(int, play, (), (override));
    MOCK_METHOD(int, pause, (), (override));
    MOCK_METHOD(int, seek, (long position, int mode), (override));
    MOCK_METHOD(int, status, (long& position, long& duration), (override));
    MOCK_METHOD(int, dumpGraph, (const std::wstring& path), (override));
    MOCK_METHOD(int, repeat, (LibMediaPlayer::RepeatParam & param), (override));

    void setNotify(std::function<void(LibMediaPlayer::MediaPlayerNotify&)> function) override {
        notify = std::move(function);
    }

    std::function<void(LibMediaPlayer::MediaPlayerNotify&)> notify;
    std::function<void()> atDestruction;
};

/** What the engine's factory was asked for last, and what it gives next. */
struct EngineFactory {
    LibMediaPlayer::IMediaPlayer* next = nullptr; ///< the caller of createPlayer() owns it
    void* window = this;
    unsigned int flags = 0;
};
EngineFactory& engineFactory();
