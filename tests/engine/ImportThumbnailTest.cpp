// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <condition_variable>
#include <mutex>

#include "importer/LookProbe.h"
#include "tests/engine/Samples.h"
#include "tests/engine/TestImporter.h"
#include "worker/Media.h"

using namespace LibMediaPlayer;
using discoverer::Thumbnail;
namespace fs = std::filesystem;

namespace {

/** Draws what the test wants, and when. Outlives the importer. */
class Artist {
public:
    using Style = std::function<Thumbnail(const std::string& path)>;

    explicit Artist(Style style) : mStyle(std::move(style)) {}

    [[nodiscard]] importer::DrawThumbnail draw() {
        return [this](const std::string& path) {
            begin(path);
            return mStyle(path);
        };
    }

    /** Lets only so many begin; the next one waits. */
    void allow(std::size_t count) {
        const std::lock_guard lock(mMutex);
        mAllowed = count;
        mChanged.notify_all();
    }

    /** Until so many have been asked for. */
    void awaitAsked(std::size_t count) {
        std::unique_lock lock(mMutex);
        mChanged.wait(lock, [&] { return mPaths.size() >= count; });
    }

    [[nodiscard]] std::ptrdiff_t countOf(const fs::path& path) const {
        const std::lock_guard lock(mMutex);
        return std::count(mPaths.begin(), mPaths.end(), path.string());
    }

private:
    void begin(const std::string& path) {
        std::unique_lock lock(mMutex);
        mPaths.push_back(path);
        mChanged.notify_all();
        mChanged.wait(lock, [this] { return mPaths.size() <= mAllowed; });
    }

    const Style mStyle;
    mutable std::mutex mMutex; ///< guards all below
    std::condition_variable mChanged;
    std::vector<std::string> mPaths;
    std::size_t mAllowed = 1'000'000;
};

/** The file's content stands for its picture. */
Thumbnail drawContent(const std::string& path) {
    return {kOk, readFile(path)};
}

class ImportThumbnails : public testing::Test {
protected:
    fs::path source(const std::string& name, const std::string& content) const {
        writeFile(mFolder / name, content);
        return mFolder / name;
    }
    [[nodiscard]] TestImporter importer(Artist& artist) const {
        return TestImporter(mFolder / "data", anyMedium(), nullptr, artist.draw());
    }
    [[nodiscard]] TestImporter importerWithoutArtist() const {
        return TestImporter(mFolder / "data", anyMedium());
    }
    [[nodiscard]] std::string ask(const std::string& query) const {
        return askDatabase(mFolder / "data/mediaplayer/media.db", query);
    }
    [[nodiscard]] std::string pictures() const {
        return ask("SELECT CAST(image AS TEXT) FROM thumbnail ORDER BY media_id");
    }
    [[nodiscard]] std::string triesLeft() const {
        return ask("SELECT thumbnail_tries FROM media ORDER BY id");
    }

    TestFolder mFolder;
};

} // namespace

TEST_F(ImportThumbnails, EveryImportedFileGetsOne) {
    Artist artist(drawContent);
    TestImporter importer = this->importer(artist);
    importer.import(source("a.mp4", "A"), "Films");
    importer.import(source("b.mp4", "B"));
    artist.awaitAsked(2);
    importer.destroy();
    EXPECT_EQ(pictures(), "A\nB");
    EXPECT_EQ(triesLeft(), "0\n0");
}

TEST_F(ImportThumbnails, AnImportDoesNotWaitForOneThatIsBeingDrawn) {
    Artist artist(drawContent);
    artist.allow(0);
    TestImporter importer = this->importer(artist);
    EXPECT_EQ(importer.import(source("a.mp4", "A")).result, kOk);
    artist.awaitAsked(1);
    EXPECT_EQ(importer.import(source("b.mp4", "B"), "Films").result, kOk);
    EXPECT_EQ(importer.import(source("c.mp4", "C")).result, kOk);
    EXPECT_EQ(pictures(), "");
    artist.allow(3);
    artist.awaitAsked(3);
    importer.destroy();
    EXPECT_EQ(pictures(), "A\nB\nC");
}

TEST_F(ImportThumbnails, TheNextRunDrawsWhatIsMissing) {
    constexpr int kCount = 30;
    {
        TestImporter importer = importerWithoutArtist();
        for (int number = 10; number < 10 + kCount; ++number)
            importer.queue(source(std::to_string(number) + ".mp4", "content"));
        for (int number = 0; number < kCount; ++number)
            importer.awaitFinished();
    }
    EXPECT_EQ(ask("SELECT count(*) FROM thumbnail"), "0");
    Artist artist(drawContent);
    TestImporter importer = this->importer(artist);
    artist.awaitAsked(kCount);
    importer.destroy();
    EXPECT_EQ(ask("SELECT count(*) FROM thumbnail"), std::to_string(kCount));
}

TEST_F(ImportThumbnails, AFileOfWhichNoneCanBeDrawnIsGivenUpInTheEnd) {
    Artist artist([](const std::string& path) {
        return readFile(path) == "bad" ? Thumbnail{kDamaged, ""} : drawContent(path);
    });
    const fs::path bad = source("bad.mp4", "bad");
    {
        TestImporter importer = this->importer(artist);
        importer.import(bad);
        artist.awaitAsked(3);
    }
    EXPECT_EQ(triesLeft(), "0");
    TestImporter importer = this->importer(artist);
    importer.import(source("good.mp4", "good"));
    artist.awaitAsked(4);
    importer.destroy();
    EXPECT_EQ(artist.countOf(bad), 3);
    EXPECT_EQ(pictures(), "good");
}

TEST_F(ImportThumbnails, AFileWithoutAPictureIsTriedOnce) {
    Artist artist([](const std::string&) { return Thumbnail{kNotAvailable, ""}; });
    TestImporter importer = this->importer(artist);
    importer.import(source("a.mp3", "sound"));
    artist.awaitAsked(1);
    importer.destroy();
    EXPECT_EQ(triesLeft(), "0");
    EXPECT_EQ(artist.countOf(mFolder / "a.mp3"), 1);
}

TEST_F(ImportThumbnails, ATryCountsBeforeItIsMade) {
    std::string duringTheTry;
    Artist artist([&](const std::string& path) {
        duringTheTry = triesLeft();
        return drawContent(path);
    });
    TestImporter importer = this->importer(artist);
    importer.import(source("a.mp4", "A"));
    artist.awaitAsked(1);
    importer.destroy();
    EXPECT_EQ(duringTheTry, "2");
}

TEST_F(ImportThumbnails, WhatWasNotBegunWhenTheImporterEndsHasAllItsTries) {
    constexpr int kCount = 8;
    {
        TestImporter importer = importerWithoutArtist();
        for (int number = 0; number < kCount; ++number)
            importer.import(source(std::to_string(number) + ".mp4", "content"));
    }
    Artist artist([this](const std::string&) -> Thumbnail {
        EXPECT_NE(triesLeft(), ""); // takes its time
        throw std::runtime_error("cannot be drawn");
    });
    TestImporter importer = this->importer(artist);
    artist.awaitAsked(1);
    importer.destroy();
    std::string expected;
    for (int number = 0; number < kCount; ++number)
        expected +=
            std::to_string(3 - artist.countOf(mFolder / (std::to_string(number) + ".mp4"))) + "\n";
    EXPECT_EQ(triesLeft() + "\n", expected);
}

TEST_F(ImportThumbnails, AFileThatChangedWhileItWasDrawnIsDrawnAgain) {
    Artist artist(drawContent);
    artist.allow(0);
    TestImporter importer = this->importer(artist);
    const fs::path file = source("a.mp4", "old");
    importer.import(file);
    artist.awaitAsked(1);
    source("a.mp4", "newer");
    importer.import(file);
    artist.allow(1);
    artist.awaitAsked(2);
    EXPECT_EQ(pictures(), "");
    artist.allow(2);
    importer.destroy();
    EXPECT_EQ(pictures(), "newer");
}

TEST_F(ImportThumbnails, AKnownFileKeepsItsOwnUntilItChanges) {
    Artist artist(drawContent);
    const fs::path file = source("a.mp4", "old");
    {
        TestImporter importer = this->importer(artist);
        importer.import(file);
        artist.awaitAsked(1);
    }
    TestImporter importer = this->importer(artist);
    importer.import(file);
    EXPECT_EQ(pictures(), "old");
    source("a.mp4", "newer");
    importer.import(file);
    artist.awaitAsked(2);
    importer.destroy();
    EXPECT_EQ(pictures(), "newer");
    EXPECT_EQ(artist.countOf(file), 2);
}

TEST_F(ImportThumbnails, ADatabaseThatIsLockedGetsThemLater) {
    Artist artist(drawContent);
    artist.allow(0);
    TestImporter importer = this->importer(artist);
    importer.import(source("a.mp4", "A"));
    artist.awaitAsked(1);
    {
        SQLite::Database other((mFolder / "data/mediaplayer/media.db").string(),
                               SQLite::OPEN_READWRITE);
        other.exec("BEGIN IMMEDIATE");
        artist.allow(1);
        EXPECT_EQ(importer.import(source("b.mp4", "B")).result, kNotAvailable);
    }
    artist.allow(2);
    EXPECT_EQ(importer.import(source("b.mp4", "B")).result, kOk);
    artist.awaitAsked(2);
    importer.destroy();
    EXPECT_EQ(pictures(), "A\nB");
}

TEST(ImportOfMediaWithPictures, DrawsThemAndAsksForNoneOfSoundAlone) {
    const TestFolder folder;
    Artist artist([](const std::string& path) { return worker::drawThumbnail(path); });
    TestImporter importer(folder / "data", importer::probeByLook, nullptr, artist.draw());
    importer.import(samplePath("sound.mp3"));
    importer.import(samplePath("film.mp4"));
    importer.import(samplePath("cover.mp3"));
    artist.awaitAsked(2);
    importer.destroy();
    EXPECT_EQ(artist.countOf(samplePath("sound.mp3")), 0);
    EXPECT_EQ(askDatabase(folder / "data/mediaplayer/media.db",
                          "SELECT count(*) FROM thumbnail WHERE hex(image) LIKE 'FFD8%'"),
              "2");
}
