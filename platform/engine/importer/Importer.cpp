// SPDX-License-Identifier: MIT
#include "importer/Importer.h"

#include <chrono>
#include <optional>
#include <sys/stat.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "handle/Barrier.h"
#include "importer/Batch.h"
#include "importer/Graph.h"
#include "importer/Source.h"
#include "text/Text.h"

namespace importer {

using namespace LibMediaPlayer;

namespace {

/** Who imports many files asks for one after another: the next comes within this, as a rule. */
constexpr std::chrono::milliseconds kLinger{3};

std::int64_t sizeOf(const std::wstring& text) {
    struct stat status {};
    const bool isFile = ::stat(pathOf(text).c_str(), &status) == 0 && S_ISREG(status.st_mode);
    return isFile ? status.st_size : 0;
}

} // namespace

Importer::Importer(Options options)
    : mOptions(std::move(options)),
      mOutlet(mOptions.notifyGap),
      mCatalogue(mOptions.dataFolder, mOptions.probe),
      mThumbnails(mOptions, mQueue, mCatalogue),
      mThread([this] { run(); }) {}

Importer::~Importer() {
    mQueue.close();
    mThread.join();
}

int Importer::import(const std::wstring& path, const std::wstring& folder) {
    return handle::guarded<int>(
        kInternal, [&] { return mQueue.add(path, folder, sizeOf(path)) ? kOk : kNotAvailable; });
}

int Importer::cancel() {
    mQueue.cancel();
    return kOk;
}

int Importer::status(MediaImporterStatus& status) {
    return mQueue.status(status);
}

void Importer::setNotify(std::function<void(MediaImporterNotify&)> notify) {
    mOutlet.setFunction(std::move(notify));
}

int Importer::dumpGraph(const std::wstring& path) {
    if (path.empty())
        return kWrongState;
    return handle::guarded<int>(kInternal,
                                [&] { return writeGraph(engine::toBytes(path), mQueue); });
}

void Importer::run() {
    handle::guarded([this] { mCatalogue.start(); });
    while (!mQueue.isClosed()) {
        handle::guarded([this] { mThumbnails.tend(); });
        if (auto job = mQueue.take())
            handle::guarded([&] { runBatch(*std::move(job)); });
        else
            mQueue.wait();
    }
    handle::guarded([this] { mThumbnails.stop(); });
}

void Importer::runBatch(Job first) {
    Batch batch(mOptions, mQueue, mOutlet, mCatalogue);
    batch.add(std::move(first));
    const auto hasRoom = [&](const Job& job) { return batch.hasRoomFor(job); };
    while (auto job = mQueue.takeIf(hasRoom, kLinger))
        batch.add(*std::move(job));
    batch.finish();
}

} // namespace importer
