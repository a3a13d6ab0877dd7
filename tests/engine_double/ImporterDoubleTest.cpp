// SPDX-License-Identifier: MIT
#include "tests/engine_double/EngineScript.h"

#include <cstdlib>
#include <future>
#include <memory>
#include <mutex>
#include <set>
#include <thread>

#include <gmock/gmock.h>

#include "LibMediaPlayer/InterfaceFactory.h"

using LibMediaPlayer::IMediaImporter;
using LibMediaPlayer::MediaImporterNotify;
using LibMediaPlayer::MediaImporterStatus;

namespace {

std::unique_ptr<IMediaImporter> createImporter() {
    return std::unique_ptr<IMediaImporter>(LibMediaPlayer::InterfaceFactory::createImporter());
}

/** A call to the importer, on a thread of its own because it blocks. */
template<typename Call>
auto start(Call call) {
    return std::async(std::launch::async, call);
}

class ImporterDouble : public testing::Test {
protected:
    ImporterDouble() { ::setenv("QNS_IMPORTER_DOUBLE", mScript.address().c_str(), 1); }
    ~ImporterDouble() override { ::unsetenv("QNS_IMPORTER_DOUBLE"); }

    std::unique_ptr<IMediaImporter> create() {
        auto created = start(createImporter);
        mScript.expectCall("importer create");
        return created.get();
    }

    void destroy(std::unique_ptr<IMediaImporter> importer) {
        auto destroyed = start([&] { importer.reset(); });
        mScript.expectCall("importer destroy");
        destroyed.get();
    }

    EngineScript mScript;
};

} // namespace

TEST(QuietImporter, EveryCallSucceedsWithoutAScript) {
    ::unsetenv("QNS_IMPORTER_DOUBLE");
    const auto importer = createImporter();
    ASSERT_NE(importer, nullptr);
    MediaImporterStatus status{5, 5};
    EXPECT_EQ(importer->import(L"/a", L""), 0);
    EXPECT_EQ(importer->cancel(), 0);
    EXPECT_EQ(importer->status(status), 0);
    EXPECT_EQ(status.done, 0);
    EXPECT_EQ(status.total, 0);
    EXPECT_EQ(importer->dumpGraph(L"/a"), 0);
}

TEST_F(ImporterDouble, ReportsEachCallAndReturnsWhatItIsTold) {
    auto importer = create();
    const auto expect = [&](auto call, const char* line, const char* answer, int result) {
        auto called = start(call);
        mScript.expectCall(line, answer);
        EXPECT_EQ(called.get(), result) << line;
    };
    expect([&] { return importer->import(L"/a b\u00fc", L""); },
           R"(importer import "/a b\x{fc}" "")", "return 3", 3);
    expect([&] { return importer->cancel(); }, "importer cancel", "return -1", -1);
    expect([&] { return importer->dumpGraph(L"/d"); }, "importer dumpGraph \"/d\"", "return 2", 2);
    MediaImporterStatus status;
    expect([&] { return importer->status(status); }, "importer status",
           "return 1 -7 9223372036854775807", 1);
    EXPECT_EQ(status.done, -7);
    EXPECT_EQ(status.total, 9223372036854775807);
    destroy(std::move(importer));
}

TEST_F(ImporterDouble, CanBeMissing) {
    auto created = start(createImporter);
    mScript.expectCall("importer create", "null");
    EXPECT_EQ(created.get(), nullptr);
    destroy(create());
}

TEST_F(ImporterDouble, NotifiesAtOnceOnDifferentThreads) {
    auto importer = create();
    std::mutex mutex;
    std::set<std::wstring> texts;
    std::set<std::thread::id> threads;
    importer->setNotify([&](MediaImporterNotify& notify) {
        const std::lock_guard lock(mutex);
        EXPECT_EQ(notify.kind, 2);
        EXPECT_EQ(notify.result, -3);
        texts.insert(notify.text);
        threads.insert(std::this_thread::get_id());
    });
    mScript.notifyImportsAtOnce({{2, -3, L"a \"\u00fc"}, {2, -3, L""}});
    EXPECT_THAT(texts, testing::ElementsAre(L"", L"a \"\u00fc"));
    EXPECT_EQ(threads.size(), 2U);
    destroy(std::move(importer));
}

TEST_F(ImporterDouble, NotifiesWhileACallAndTheDestructionAreBlocked) {
    auto importer = create();
    int count = 0;
    importer->setNotify([&](MediaImporterNotify&) { ++count; });
    auto called = start([&] { return importer->cancel(); });
    EXPECT_EQ(mScript.nextCall(), "importer cancel");
    mScript.notifyImport({});
    mScript.answer("return 0");
    called.get();
    auto destroyed = start([&] { importer.reset(); });
    EXPECT_EQ(mScript.nextCall(), "importer destroy");
    mScript.notifyImport({});
    mScript.answer("return 0");
    destroyed.get();
    EXPECT_EQ(count, 2);
}
