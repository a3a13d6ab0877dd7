// SPDX-License-Identifier: MIT
#include <filesystem>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/ImporterClient.h"
#include "tests/daemon/support/ItemReader.h"
#include "tests/daemon/support/Patience.h"
#include "tests/daemon/support/SampleMedia.h"
#include "tests/support/TestFolder.h"

using namespace importer;
using namespace std::chrono_literals;
using testing::ElementsAre;
using testing::HasSubstr;
namespace fs = std::filesystem;

namespace {

/** Kinds of notifications. */
enum : std::int64_t { kProgress = 1, kFinished = 2, kStarted = 3 };

/** Results. */
enum : std::int64_t {
    kNotFound = 1,
    kAccessDenied = 2,
    kNotMedia = 3,
    kDamaged = 4,
    kCancelled = 6
};

/** Status codes. */
enum : std::int64_t { kIdle = 0, kRunning = 1 };

struct ImportEvent {
    std::int64_t kind = 0;
    std::int64_t result = 0;
    std::string text;
    std::string video;
    std::string audio;
    std::vector<std::int64_t> values;
};

ImportEvent decodeEvent(const wire::Bytes& payload) {
    ItemReader items(payload);
    ImportEvent event;
    event.kind = items.integer();
    event.result = items.integer();
    for (auto* text : {&event.text, &event.video, &event.audio})
        *text = items.text();
    for (int i = 0; i < 5; ++i)
        event.values.push_back(items.integer());
    return event;
}

struct ImporterStatus {
    std::int64_t code = -1;
    std::int64_t done = -1;
    std::int64_t total = -1;
};

/** The daemon with the engine that imports, and a data directory of its own. */
class ImporterEngine : public DaemonTest {
protected:
    void SetUp() override {
        ASSERT_NO_FATAL_FAILURE(startEngine());
        mId = registerBoth(mClient);
    }

    void startEngine() {
        DaemonOptions options;
        options.environment["QNS_HV_DATA"] = mFolder.path("data");
        start(options);
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
    }

    static std::int32_t registerBoth(ImporterClient& client) {
        const auto id = client.registerCallBack(kObject);
        client.registerNotify(kNotifyObject, id);
        return id;
    }

    using Condition = std::function<bool(const ImportEvent&)>;

    /**
     * The next notification that fulfils the condition. Others are passed over: the daemon tells
     * the same one twice, or one not at all, when it is slower than the engine.
     */
    static ImportEvent waitForEvent(ImporterClient& client, const Condition& condition) {
        while (const auto packet = client.receive()) {
            if (packet->object != kNotifyObject)
                continue;
            if (auto event = decodeEvent(packet->payload); condition(event))
                return event;
        }
        ADD_FAILURE() << "Not told";
        return {};
    }

    static Condition isFinished() {
        return [](const ImportEvent& event) { return event.kind == kFinished; };
    }

    /** Imports one file and waits for its end. */
    ImportEvent import(const std::string& file, const std::string& folder = "") {
        awaitTurn();
        mClient.import(mId, file, folder);
        return waitForEvent(mClient, isFinished());
    }

    /** A notification that comes twice is over. */
    void awaitTurn() { (void)status(); }

    ImporterStatus status() {
        mClient.request(kGetStatus, mId);
        auto packet = mClient.receive();
        while (packet && (packet->object != kObject || packet->method != kStatusCallBack))
            packet = mClient.receive();
        if (!packet)
            return {};
        ItemReader items(packet->payload);
        ImporterStatus status;
        status.code = items.integer();
        EXPECT_EQ(items.integer(), 0);
        status.done = items.integer();
        status.total = items.integer();
        return status;
    }

    std::vector<std::string> controllerLog(const std::string& file) {
        return mSyslog.messages(file + " iRet: ");
    }

    [[nodiscard]] std::string inLibrary(const std::string& name) const {
        return mFolder.path("data/media/" + name);
    }

    /** A sound file that takes long to copy. */
    [[nodiscard]] std::string largeFile() const {
        auto path = mFolder.path("large.wav");
        fs::copy_file(sample::shortSound(), path);
        fs::resize_file(path, 2'000'000'000);
        return path;
    }

    static constexpr long kObject = 100;
    static constexpr long kNotifyObject = 200;

    TestFolder mFolder;
    ImporterClient mClient{1000};
    std::int32_t mId = -1;
};

TEST_F(ImporterEngine, CataloguesAFilmWhereItLiesAndTellsWhatItIs) {
    const auto event = import(sample::film());
    EXPECT_EQ(event.result, 0);
    EXPECT_EQ(event.text, sample::film());
    EXPECT_THAT(event.video, HasSubstr("H.264"));
    EXPECT_THAT(event.audio, HasSubstr("AAC"));
    EXPECT_THAT(event.values, ElementsAre(320, 180, 25, 1, 44100));
    EXPECT_TRUE(mFolder.has("data/mediaplayer/media.db"));
    EXPECT_THAT(controllerLog(""), testing::IsEmpty());
}

TEST_F(ImporterEngine, CopiesAFileIntoAFolderOfTheLibrary) {
    const auto event = import(sample::filmWithUnicodeName(), "Films/\xE6\x98\xA0\xE7\x94\xBB");
    EXPECT_EQ(event.result, 0) << event.text;
    const fs::path copy = inLibrary("Films/\xE6\x98\xA0\xE7\x94\xBB") /
                          fs::path(sample::filmWithUnicodeName()).filename();
    EXPECT_EQ(event.text, copy.string());
    EXPECT_EQ(fs::file_size(copy), fs::file_size(sample::film()));
}

TEST_F(ImporterEngine, TellsTheStatusOfAllThatWasAskedFor) {
    EXPECT_EQ(status().code, kIdle);
    EXPECT_EQ(import(sample::film(), "Films").result, 0);
    const auto size = static_cast<std::int64_t>(fs::file_size(sample::film()));
    const auto after = status();
    EXPECT_EQ(after.code, kIdle);
    EXPECT_EQ(after.done, size);
    EXPECT_EQ(after.total, size);
}

TEST_F(ImporterEngine, TellsWhyAFileCannotBeImportedAndGoesOn) {
    const std::vector<std::pair<std::string, std::int64_t>> files{
        {mFolder.path("missing.mp4"), kNotFound},
        {mFolder.path(""), kNotMedia},
        {sample::text(), kNotMedia},
        {sample::noise(), kNotMedia},
        {sample::truncatedFilm(), kDamaged}};
    for (const auto& [file, result] : files) {
        const auto event = import(file, "Films");
        EXPECT_EQ(event.result, result) << file;
        EXPECT_EQ(event.text, "") << file;
        const std::string line = file + " iRet: " + std::to_string(result);
        EXPECT_TRUE(mSyslog.waitForLine("MediaImporterController 312: importNotify " + line));
        EXPECT_TRUE(mSyslog.waitForLine("MediaImporterController 310: import " + line));
    }
    EXPECT_FALSE(fs::exists(inLibrary("Films")));
    EXPECT_EQ(import(sample::shortSound(), "Films").result, 0);
}

TEST_F(ImporterEngine, TellsThatAFolderLeadsOutOfTheLibrary) {
    for (const std::string folder : {"../out", "/out", "a/../../out"}) {
        const auto event = import(sample::shortSound(), folder);
        EXPECT_EQ(event.result, kAccessDenied);
        EXPECT_THAT(event.text, HasSubstr("leads out of the library"));
        EXPECT_THAT(controllerLog(sample::shortSound()),
                    testing::Each("MediaImporterController 312: importNotify " +
                                  sample::shortSound() + " iRet: 2"));
    }
    EXPECT_FALSE(fs::exists(mFolder.path("data/out")));
    EXPECT_FALSE(fs::exists("/out"));
}

TEST_F(ImporterEngine, KnowsAFileAfterARestart) {
    const auto first = import(sample::shortSound(), "Music").text;
    EXPECT_EQ(first, inLibrary("Music/short.wav"));
    mClient.request(kUnregister, mId);
    EXPECT_EQ(mpDaemon->terminate(), 0);
    ASSERT_NO_FATAL_FAILURE(startEngine());
    ImporterClient client(1001);
    const auto id = registerBoth(client);
    client.import(id, sample::shortSound(), "Music");
    const auto again = waitForEvent(client, isFinished());
    EXPECT_EQ(again.result, 0);
    EXPECT_EQ(again.text, first);
    EXPECT_FALSE(fs::exists(inLibrary("Music/short (2).wav")));
}

/** A large file is being copied. */
class ImporterEngineAtWork : public ImporterEngine {
protected:
    void SetUp() override {
        ImporterEngine::SetUp();
        if (HasFatalFailure())
            return;
        const std::string file = largeFile();
        mClient.import(mId, file, "Music");
        const auto progress =
            waitForEvent(mClient, [](const ImportEvent& event) { return event.kind != kStarted; });
        EXPECT_EQ(progress.kind, kProgress);
        EXPECT_EQ(progress.text, file);
    }

    void expectNothingCopied() const { EXPECT_TRUE(fs::is_empty(inLibrary("Music"))); }
};

TEST_F(ImporterEngineAtWork, EndsWithTheCancelOfAnyClient) {
    const auto during = status();
    EXPECT_EQ(during.code, kRunning);
    EXPECT_GT(during.done, 0);
    EXPECT_LT(during.done, during.total);
    EXPECT_EQ(during.total, 2'000'000'000);
    ImporterClient other(1001);
    const auto id = registerBoth(other);
    other.request(kCancel, id);
    for (auto* client : {&mClient, &other}) {
        const auto event = waitForEvent(*client, isFinished());
        EXPECT_EQ(event.result, kCancelled);
        EXPECT_THAT(event.text, HasSubstr("large.wav"));
    }
    EXPECT_EQ(status().code, kIdle);
    expectNothingCopied();
    EXPECT_TRUE(mSyslog.waitForLine("large.wav iRet: 6"));
    EXPECT_EQ(import(sample::shortSound(), "Music").result, 0);
}

TEST_F(ImporterEngineAtWork, DoesNotHoldUpThePowerOff) {
    PlayerClient player(1002);
    player.registerCallBack();
    const auto start = patience::Clock::now();
    player.request(request::kPowerOffMediaPlayer);
    EXPECT_EQ(mpDaemon->waitForExit(), 0) << mpDaemon->output().joined();
    EXPECT_LT(patience::Clock::now() - start, patience::stretched(2s));
    expectNothingCopied();
}

} // namespace
