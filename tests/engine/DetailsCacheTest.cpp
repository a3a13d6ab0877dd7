// SPDX-License-Identifier: MIT
#include "discoverer/DetailsCache.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <sys/inotify.h>
#include <thread>
#include <unistd.h>

#include "LibMediaPlayer/Result.h"
#include "base/UniqueFd.h"
#include "discoverer/Discoverer.h"
#include "importer/LookProbe.h"
#include "tests/engine/Samples.h"

using namespace LibMediaPlayer;
using discoverer::Details;
using discoverer::DetailsCache;
using discoverer::FileIdentity;
using importer::probeByLook;
namespace fs = std::filesystem;
using namespace std::chrono_literals;

namespace {

/** Sees when a file is opened. */
class OpenWatch {
public:
    explicit OpenWatch(const fs::path& file) : mNotices(::inotify_init1(IN_NONBLOCK | IN_CLOEXEC)) {
        EXPECT_GE(::inotify_add_watch(mNotices.get(), file.c_str(), IN_OPEN), 0);
    }

    /** Since it was asked last. */
    bool wasOpened() {
        std::array<char, 4096> notices{};
        return ::read(mNotices.get(), notices.data(), notices.size()) > 0;
    }

private:
    qns::UniqueFd mNotices;
};

/** A film of its own, which nobody has read. */
class KnownFile : public testing::Test {
protected:
    void SetUp() override {
        std::string pattern = testing::TempDir() + "/details-XXXXXX";
        mFolder = ::mkdtemp(pattern.data());
        fs::copy_file(samplePath("film.mp4"), mFile = mFolder / "film");
    }
    void TearDown() override { fs::remove_all(mFolder); }

    /** Looks until a look is not needed: only what changed some time ago is remembered. */
    void awaitKnown() {
        OpenWatch watch(mFile);
        const auto deadline = std::chrono::steady_clock::now() + 10s;
        do {
            EXPECT_EQ(probeByLook(mFile).result, kOk);
        } while (watch.wasOpened() && std::chrono::steady_clock::now() < deadline);
    }

    fs::path mFolder;
    fs::path mFile;
};

std::shared_ptr<const Details> detailsOf(std::int64_t duration) {
    Details details;
    details.info.system.duration = duration;
    return std::make_shared<Details>(details);
}

FileIdentity identity(int inode) {
    FileIdentity file;
    file.inode = static_cast<ino_t>(inode);
    return file;
}

int widthTold(discoverer::Discoverer& discoverer, const fs::path& file) {
    MediaMetaInfo info;
    EXPECT_EQ(discoverer.open(file.wstring()), kOk);
    EXPECT_EQ(discoverer.metadata(info), kOk);
    EXPECT_EQ(discoverer.close(), kOk);
    return info.video.width;
}

} // namespace

TEST(DetailsCache, KnowsTheLastOnesThatWerePut) {
    DetailsCache cache(3);
    EXPECT_EQ(cache.find(identity(1)), nullptr);
    for (const int inode : {1, 2, 3, 4, 5})
        cache.put(identity(inode), detailsOf(inode));
    EXPECT_EQ(cache.find(identity(1)), nullptr);
    EXPECT_EQ(cache.find(identity(2)), nullptr);
    for (const int inode : {3, 4, 5})
        EXPECT_EQ(cache.find(identity(inode))->info.system.duration, inode);
}

TEST(DetailsCache, TellsFilesApartByEachOfTheirProperties) {
    DetailsCache cache(10);
    cache.put(FileIdentity(), detailsOf(1));
    EXPECT_NE(cache.find(FileIdentity()), nullptr);
    std::array<FileIdentity, 5> others;
    others[0].device = 1;
    others[1].inode = 1;
    others[2].size = 1;
    others[3].modified = 1;
    others[4].changed = 1;
    for (const FileIdentity& other : others)
        EXPECT_EQ(cache.find(other), nullptr);
}

TEST(DetailsCache, LeavesOutWhatIsLarge) {
    DetailsCache cache(10);
    Details details;
    details.info.system.tags.assign(10'000, L'x');
    cache.put(identity(1), std::make_shared<Details>(details));
    EXPECT_EQ(cache.find(identity(1)), nullptr);
}

TEST(DetailsCache, ServesSeveralThreads) {
    DetailsCache cache(4);
    std::array<std::thread, 4> threads;
    for (std::thread& thread : threads)
        thread = std::thread([&cache] {
            for (int inode = 0; inode < 1000; ++inode) {
                cache.put(identity(inode % 7), detailsOf(inode % 7));
                const auto found = cache.find(identity(inode % 5));
                EXPECT_TRUE(!found || found->info.system.duration == inode % 5);
            }
        });
    for (std::thread& thread : threads)
        thread.join();
}

TEST(FileIdentity, IsSettledOnceAnotherChangeWouldShow) {
    const auto changed = [](std::chrono::nanoseconds ago) {
        FileIdentity file;
        file.changed = (std::chrono::system_clock::now().time_since_epoch() - ago).count();
        return file;
    };
    EXPECT_TRUE(changed(1s).isSettled());
    EXPECT_FALSE(changed(0s).isSettled());
    EXPECT_FALSE(changed(-1h).isSettled());
}

TEST_F(KnownFile, IsNotOpenedAgainByWhoeverAsks) {
    awaitKnown();
    OpenWatch watch(mFile);
    EXPECT_EQ(probeByLook(mFile).info.video.width, 192);
    discoverer::Discoverer discoverer;
    EXPECT_EQ(widthTold(discoverer, mFile), 192);
    EXPECT_FALSE(watch.wasOpened());
    EXPECT_EQ(discoverer.open(mFile.wstring()), kOk);
    EXPECT_EQ(discoverer.makeImage(0, 0, 0, (mFolder / "picture.png").wstring()), kOk);
    EXPECT_TRUE(watch.wasOpened());
}

TEST_F(KnownFile, IsReadAgainWhenItsContentHasChanged) {
    awaitKnown();
    const auto before = fs::last_write_time(mFile);
    const auto size = fs::file_size(mFile);
    fs::copy_file(samplePath("picture.jpg"), mFile, fs::copy_options::overwrite_existing);
    // As if nothing had happened.
    fs::resize_file(mFile, size);
    fs::last_write_time(mFile, before);
    EXPECT_EQ(probeByLook(mFile).info.system.mediaType, "image/jpeg");
    discoverer::Discoverer discoverer;
    MediaMetaInfo info;
    EXPECT_EQ(discoverer.open(mFile.wstring()), kOk);
    EXPECT_EQ(discoverer.metadata(info), kOk);
    EXPECT_EQ(info.system.mediaType, "image/jpeg");
}

TEST_F(KnownFile, IsReadAgainWhenAnotherTookItsPlace) {
    awaitKnown();
    fs::copy_file(samplePath("sound.ogg"), mFolder / "other");
    fs::rename(mFolder / "other", mFile);
    EXPECT_EQ(probeByLook(mFile).info.system.mediaType, "audio/ogg");
}

TEST_F(KnownFile, IsNoLongerThereWhenItWasRemoved) {
    awaitKnown();
    fs::remove(mFile);
    EXPECT_EQ(probeByLook(mFile).result, kNotFound);
}

TEST_F(KnownFile, KeepsItsPictureInMind) {
    awaitKnown();
    EXPECT_TRUE(probeByLook(mFile).hasPicture);
    EXPECT_TRUE(probeByLook(samplePath("cover.mp3")).hasPicture);
    EXPECT_FALSE(probeByLook(samplePath("sound.mp3")).hasPicture);
}
