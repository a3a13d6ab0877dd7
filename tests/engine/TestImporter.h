// SPDX-License-Identifier: MIT
#pragma once

#include <condition_variable>
#include <deque>
#include <filesystem>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "LibMediaPlayer/IMediaImporter.h"
#include "LibMediaPlayer/Result.h"
#include "importer/Options.h"

/** A folder that goes with the object. */
class TestFolder {
public:
    TestFolder();
    ~TestFolder();
    TestFolder(const TestFolder&) = delete;
    TestFolder& operator=(const TestFolder&) = delete;

    [[nodiscard]] const std::filesystem::path& path() const { return mPath; }
    [[nodiscard]] std::filesystem::path operator/(const std::string& name) const {
        return mPath / name;
    }

private:
    std::filesystem::path mPath;
};

/** Fills a file; its folders are made. */
void writeFile(const std::filesystem::path& path, const std::string& content);
std::string readFile(const std::filesystem::path& path);

/** Names of all that is below, folders with a slash at their end, sorted. */
std::vector<std::string> listFolder(const std::filesystem::path& folder);

/** What the sqlite3 command prints, without the last line's end. */
std::string askDatabase(const std::filesystem::path& database, const std::string& query);

/** A probe that takes every file for a medium with these tags and looks at none. */
importer::Probe anyMedium(const std::wstring& tags = L"");

/** An importer over a data directory of its own, and what it has notified. */
class TestImporter {
public:
    using Notification = LibMediaPlayer::MediaImporterNotify;
    using Handler = std::function<void(const Notification&)>;

    /** `onNotify` runs on the importer's thread, before the notification is recorded. */
    TestImporter(const std::filesystem::path& data, importer::Probe probe,
                 Handler onNotify = nullptr, importer::DrawThumbnail drawThumbnail = nullptr);
    ~TestImporter();
    TestImporter(const TestImporter&) = delete;
    TestImporter& operator=(const TestImporter&) = delete;

    LibMediaPlayer::IMediaImporter* operator->() const { return mpImporter.get(); }

    /** Imports and waits for the answer. */
    Notification import(const std::filesystem::path& file, const std::string& folder = "");

    /** Only asks. */
    void queue(const std::filesystem::path& file, const std::string& folder = "");

    /** The next answer. */
    Notification awaitFinished();
    [[nodiscard]] std::vector<Notification> notifications() const;

    void destroy();

private:
    mutable std::mutex mMutex; ///< guards the next two
    std::condition_variable mArrived;
    std::vector<Notification> mNotifications;
    std::size_t mSeen = 0;
    std::unique_ptr<LibMediaPlayer::IMediaImporter> mpImporter;
};

std::wstring wide(const std::filesystem::path& path);
