// SPDX-License-Identifier: MIT
#include <condition_variable>
#include <csignal>
#include <filesystem>
#include <functional>
#include <future>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "qnsmedia/Error.h"
#include "qnsmedia/Importer.h"
#include "tests/daemon/support/DiscovererDaemonTest.h"
#include "tests/daemon/support/ImporterDaemonTest.h"
#include "tests/daemon/support/Patience.h"
#include "tests/daemon/support/SampleMedia.h"
#include "tests/engine_double/MetadataText.h"
#include "tests/support/TestFolder.h"

using namespace std::chrono_literals;
using qnsmedia::Importer;
using qnsmedia::ImporterState;
using qnsmedia::ImportNotification;
using qnsmedia::ImportNotificationKind;

namespace {

/** Notifications as they come, on the library's thread, for the test to wait for. */
class Told {
public:
    void listenTo(Importer& importer) {
        importer.onNotification([this](const ImportNotification& notification) {
            const std::lock_guard lock(mMutex);
            mTold.push_back(notification);
            mChanged.notify_all();
        });
        importer.initialize().get(); // and the daemon knows the notify object
    }

    using Condition = std::function<bool(const ImportNotification&)>;

    /** Waits for the next one that fulfils the condition; others before it are dropped. */
    ImportNotification waitFor(const Condition& condition) {
        std::unique_lock lock(mMutex);
        std::optional<ImportNotification> found;
        EXPECT_TRUE(mChanged.wait_until(lock, patience::deadline(), [&] {
            while (!found && !mTold.empty()) {
                if (condition(mTold.front()))
                    found = mTold.front();
                mTold.erase(mTold.begin());
            }
            return found.has_value();
        })) << "Not told";
        return found.value_or(ImportNotification{});
    }

    ImportNotification next() {
        return waitFor([](const ImportNotification&) { return true; });
    }

    ImportNotification finished() {
        return waitFor([](const ImportNotification& notification) {
            return notification.kind == ImportNotificationKind::finished;
        });
    }

private:
    std::mutex mMutex; ///< guards all below
    std::condition_variable mChanged;
    std::vector<ImportNotification> mTold;
};

/** The library and the daemon, with an importer that the test plays. */
class LibraryAndImporter : public ImporterDaemonTest {
protected:
    void SetUp() override {
        ImporterDaemonTest::SetUp();
        if (!HasFatalFailure())
            connect({});
    }

    void TearDown() override {
        mClient.reset();
        mConnection.reset();
        ImporterDaemonTest::TearDown();
    }

    void connect(const qnsmedia::Connection::Options& options) {
        mConnection.emplace(options);
        mClient.emplace(*mConnection);
        mTold.listenTo(*mClient);
    }

    /** As another process: the daemon connects to each only once. */
    void connectWithShortDeadline() {
        mClient.reset();
        qnsmedia::Connection::Options options;
        options.identity = 1001;
        options.deadline = patience::stretched(1500ms);
        connect(options);
    }

    /** Starts an import that gets as far as the engine's queue. */
    std::future<void> import(const std::string& file) {
        auto imported = mClient->importFile(file);
        expectImport(file);
        return imported;
    }

    void answerStatus(const std::string& answer = "return 1 0 9") {
        mImporter.expectCall("importer status", answer);
    }

    static bool isReady(const std::future<void>& future) {
        return future.wait_for(0s) == std::future_status::ready;
    }

    std::optional<qnsmedia::Connection> mConnection;
    Told mTold; ///< before the client that tells
    std::optional<Importer> mClient;
};

TEST_F(LibraryAndImporter, ImportAndCancel) {
    EXPECT_EQ(mClient->clientId(), 1);
    auto imported = mClient->importFile("/a \xC3\xBC.mp4", "Films");
    mDiscoverers.expectCall(R"(discoverer 10 open "/a \x{fc}.mp4")");
    mDiscoverers.expectCall("discoverer 10 metadata");
    mDiscoverers.expectCall("discoverer 10 close");
    mImporter.expectCall(R"(importer import "/a \x{fc}.mp4" "Films")");
    answerStatus();
    imported.get();
    mClient->cancel().get();
    mImporter.expectCall("importer cancel");
}

TEST_F(LibraryAndImporter, AreDoneWithAnImportWhenTheEngineHasIt) {
    auto imported = mClient->importFile("/a");
    expectLook("/a");
    EXPECT_EQ(mImporter.nextCall(), "importer import \"/a\" \"\"");
    EXPECT_FALSE(isReady(imported));
    mImporter.answer("return 0");
    EXPECT_EQ(mImporter.nextCall(), "importer status");
    EXPECT_FALSE(isReady(imported));
    mImporter.answer("return 1 0 9");
    imported.get();
}

TEST_F(LibraryAndImporter, TellWhyAFileCannotBeRead) {
    auto imported = mClient->importFile("/a");
    expectLook("/a", "return 1", "return 1");
    answerStatus("return 0 0 0");
    imported.get();
    const ImportNotification told = mTold.next();
    EXPECT_EQ(told.kind, ImportNotificationKind::finished);
    EXPECT_EQ(told.result, 1);
    EXPECT_EQ(told.text, "");
}

TEST_F(LibraryAndImporter, TellWhatTheEngineTells) {
    LibMediaPlayer::MediaMetaInfo film;
    film.videoCount = 1;
    film.video = {"", L"H.264", 320, 180, 24, 25, 2, 1, 1, false, 0, 0, false};
    film.audioCount = 1;
    film.audio[0] = {"", L"\u00fc", 2, 44100, 0, 0, 0};
    auto imported = mClient->importFile("/a");
    expectLook("/a", "return 0", script::metadataAnswer(0, film));
    mImporter.expectCall("importer import \"/a\" \"\"");
    answerStatus();
    imported.get();
    mImporter.notifyImport({1, 0, L"/\u00fc"});
    const ImportNotification told = mTold.next();
    EXPECT_EQ(told.kind, ImportNotificationKind::progress);
    EXPECT_EQ(told.result, 0);
    EXPECT_EQ(told.text, "/\xC3\xBC");
    EXPECT_EQ(told.video, "H.264");
    EXPECT_EQ(told.audio, "\xC3\xBC");
    EXPECT_EQ(told.width, 320);
    EXPECT_EQ(told.height, 180);
    EXPECT_EQ(told.frameRateNumerator, 25);
    EXPECT_EQ(told.frameRateDenominator, 2);
    EXPECT_EQ(told.sampleRate, 44100);
}

TEST_F(LibraryAndImporter, TellTheStatus) {
    auto asked = mClient->status();
    answerStatus("return 2 7 9");
    const auto status = asked.get();
    EXPECT_EQ(status.state, ImporterState::cancelling);
    EXPECT_EQ(status.bytesDone, 7);
    EXPECT_EQ(status.bytesTotal, 9);
}

TEST_F(LibraryAndImporter, TellAllClientsOfAllProcesses) {
    Told second;
    Told other;
    Importer sameProcess(*mConnection);
    second.listenTo(sameProcess);
    qnsmedia::Connection connection;
    EXPECT_EQ(connection.identity(), 1001);
    Importer otherProcess(connection);
    other.listenTo(otherProcess);
    mImporter.notifyImport({2, 6, L"cancelled"});
    for (Told* told : {&mTold, &second, &other}) {
        const ImportNotification notification = told->next();
        EXPECT_EQ(notification.result, 6);
        EXPECT_EQ(notification.text, "cancelled");
    }
}

TEST_F(LibraryAndImporter, TellNothingToAnImporterThatHasGone) {
    Told second;
    Importer other(*mConnection);
    second.listenTo(other);
    mClient.reset();
    other.initialize().get(); // the daemon has taken the other's leave
    mImporter.notifyImport({2, 0, L"/a"});
    EXPECT_EQ(second.next().text, "/a");
    mClient.emplace(*mConnection);
    mTold.listenTo(*mClient);
    mImporter.notifyImport({2, 0, L"/b"});
    EXPECT_EQ(mTold.next().text, "/b");
}

TEST_F(LibraryAndImporter, GiveUpABusyEngineAtTheDeadlineAndGoOnLater) {
    connectWithShortDeadline();
    auto imported = mClient->importFile("/a");
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 10 open \"/a\"");
    EXPECT_THROW(imported.get(), qnsmedia::TimedOut);
    EXPECT_THROW((void)mClient->status().get(), qnsmedia::TimedOut);
    mDiscoverers.answer("return 0");
    mDiscoverers.expectCall("discoverer 10 metadata");
    mDiscoverers.expectCall("discoverer 10 close");
    mImporter.expectCall("importer import \"/a\" \"\"");
    answerStatus();
    answerStatus();
    imported = import("/b");
    answerStatus();
    imported.get();
}

TEST_F(LibraryAndImporter, GoOnAfterAnotherClientGotTheAnswer) {
    connectWithShortDeadline();
    qnsmedia::Connection::Options options;
    options.identity = 1002;
    qnsmedia::Connection connection(options);
    Importer other(connection);
    auto imported = mClient->importFile("/a");
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 10 open \"/a\"");
    EXPECT_THROW(imported.get(), qnsmedia::TimedOut);
    auto asked = other.status();
    other.initialize().get(); // the daemon knows of the question
    mDiscoverers.answer("return 0");
    mDiscoverers.expectCall("discoverer 10 metadata");
    mDiscoverers.expectCall("discoverer 10 close");
    mImporter.expectCall("importer import \"/a\" \"\"");
    answerStatus("return 1 3 9");
    EXPECT_EQ(asked.get().bytesDone, 3);
    answerStatus();
    for (const char* file : {"/b", "/c"}) {
        imported = import(file);
        answerStatus();
        imported.get();
    }
}

TEST_F(LibraryAndImporter, NoticeThatTheDaemonWasKilled) {
    auto imported = mClient->importFile("/a");
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 10 open \"/a\"");
    mpDaemon->signal(SIGKILL);
    EXPECT_THROW(imported.get(), qnsmedia::ConnectionLost);
    EXPECT_THROW(mClient->cancel().get(), qnsmedia::ConnectionLost);
    EXPECT_EQ(mpDaemon->waitForExit(), 128 + SIGKILL);
}

TEST_F(LibraryAndImporter, EndWhileAnImportIsOnItsWay) {
    auto imported = mClient->importFile("/a");
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 10 open \"/a\"");
    mClient.reset();
    EXPECT_THROW(imported.get(), qnsmedia::ConnectionLost);
    mDiscoverers.answer("return 0");
    mDiscoverers.expectCall("discoverer 10 metadata");
    mDiscoverers.expectCall("discoverer 10 close");
    mImporter.expectCall("importer import \"/a\" \"\"");
}

/** The library and the daemon, with an importer that takes everything at once. */
class LibraryAndQuietImporter : public DiscovererDaemonTest {};

TEST_F(LibraryAndQuietImporter, LoseNoImportThatFollowsAnotherWhateverIsAskedMeanwhile) {
    qnsmedia::Connection connection;
    Importer importer(connection);
    for (int number = 0; number < 100; ++number) {
        const std::string file = '/' + std::to_string(number);
        auto before = importer.status();
        auto imported = importer.importFile(file);
        auto during = importer.status();
        mDiscoverers.expectCall("discoverer 10 open \"" + file + '"');
        auto late = importer.status();
        mDiscoverers.expectCall("discoverer 10 metadata");
        mDiscoverers.expectCall("discoverer 10 close");
        imported.get();
        for (auto* asked : {&before, &during, &late})
            EXPECT_EQ(asked->get().state, ImporterState::idle);
    }
}

/** The library, the daemon and the engine that imports. */
class LibraryAndImportEngine : public DaemonTest {
protected:
    void SetUp() override {
        DaemonOptions options;
        options.environment["QNS_HV_DATA"] = mFolder.path("data");
        start(options);
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
        mConnection.emplace();
        mClient.emplace(*mConnection);
        mTold.listenTo(*mClient);
    }

    void TearDown() override {
        mClient.reset();
        mConnection.reset();
        DaemonTest::TearDown();
    }

    TestFolder mFolder;
    std::optional<qnsmedia::Connection> mConnection;
    Told mTold; ///< before the client that tells
    std::optional<Importer> mClient;
};

TEST_F(LibraryAndImportEngine, ImportFilesAndTellWhatTheyAre) {
    mClient->importFile(sample::film()).get();
    const ImportNotification film = mTold.finished();
    EXPECT_EQ(film.result, 0);
    EXPECT_EQ(film.text, sample::film());
    EXPECT_EQ(film.width, 320);
    EXPECT_EQ(film.height, 180);
    EXPECT_EQ(film.sampleRate, 44100);
    mClient->importFile(sample::shortSound(), "Music").get();
    const std::string copy = mFolder.path("data/media/Music/short.wav");
    const ImportNotification sound = mTold.waitFor(
        [&](const ImportNotification& notification) { return notification.text == copy; });
    EXPECT_EQ(sound.kind, ImportNotificationKind::finished);
    EXPECT_EQ(sound.video, "");
    EXPECT_TRUE(std::filesystem::exists(copy));
    const auto status = mClient->status().get();
    EXPECT_EQ(status.state, ImporterState::idle);
    EXPECT_EQ(status.bytesDone, status.bytesTotal);
}

TEST_F(LibraryAndImportEngine, CancelACopy) {
    const std::string file = mFolder.path("large.wav");
    std::filesystem::copy_file(sample::shortSound(), file);
    std::filesystem::resize_file(file, 2'000'000'000);
    mClient->importFile(file, "Music").get();
    mTold.waitFor([](const ImportNotification& notification) {
        return notification.kind == ImportNotificationKind::progress;
    });
    const auto status = mClient->status().get();
    EXPECT_EQ(status.state, ImporterState::running);
    EXPECT_EQ(status.bytesTotal, 2'000'000'000);
    mClient->cancel().get();
    EXPECT_EQ(mTold.finished().result, 6);
    EXPECT_TRUE(std::filesystem::is_empty(mFolder.path("data/media/Music")));
}

TEST_F(LibraryAndImportEngine, ImportAgainAfterFilesThatAreNone) {
    for (const auto& file : {mFolder.path("missing"), sample::text(), sample::truncatedFilm()}) {
        mClient->importFile(file, "Films").get();
        EXPECT_NE(mTold.finished().result, 0) << file;
    }
    mClient->importFile(sample::shortSound(), "Films").get();
    mTold.waitFor([](const ImportNotification& notification) { return notification.result == 0; });
}

} // namespace
