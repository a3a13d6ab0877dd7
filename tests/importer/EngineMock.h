// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>

#include <gmock/gmock.h>

#include "LibMediaPlayer/IMediaImporter.h"
#include "tests/support/DiscovererMock.h"

/** The engine's importer, linked into the test. Operations that are not expected return 0. */
class ImporterMock : public LibMediaPlayer::IMediaImporter {
public:
    MOCK_METHOD(int, import, (const std::wstring& path, const std::wstring& folder), (override));
    MOCK_METHOD(int, cancel, (), (override));
    MOCK_METHOD(int, status, (LibMediaPlayer::MediaImporterStatus & status), (override));
    MOCK_METHOD(int, dumpGraph, (const std::wstring& path), (override));

    ~ImporterMock() override { died(); }
    MOCK_METHOD(void, died, ());

    void setNotify(std::function<void(LibMediaPlayer::MediaImporterNotify&)> function) override {
        notify = std::move(function);
    }

    std::function<void(LibMediaPlayer::MediaImporterNotify&)> notify;
};

/** What the engine's factory gives next; the caller owns it. */
struct EngineFactory {
    LibMediaPlayer::IMediaImporter* importer = nullptr;
    LibMediaPlayer::IMediaDiscoverer* discoverer = nullptr;
};
EngineFactory& engineFactory();
