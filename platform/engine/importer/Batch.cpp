// SPDX-License-Identifier: MIT
#include "importer/Batch.h"

#include <algorithm>
#include <ctime>
#include <set>
#include <unistd.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "importer/FileCopy.h"
#include "importer/Folders.h"
#include "text/Text.h"

namespace importer {

using namespace LibMediaPlayer;

namespace {

constexpr std::size_t kMostItems = 128;
constexpr std::chrono::milliseconds kLongest{250};

/** A copy that takes so long that nobody should wait for it. */
constexpr std::int64_t kLarge = 16 * 1024 * 1024;

constexpr int kMostNames = 10'000;

const char* meaningOf(int result) {
    switch (result) {
    case kNotMedia:
        return "This is not a medium that can be played";
    case kDamaged:
        return "The file is damaged or incomplete";
    case kTimedOut:
        return "The file could not be read in time";
    case kNotFound:
        return "The file does not exist";
    case kAccessDenied:
        return "The file may not be read";
    default:
        return "The file's details cannot be read";
    }
}

Failure cancelled(const Job& job) {
    return {kCancelled, "Cancelled: " + engine::toBytes(job.text)};
}

} // namespace

Batch::Batch(const Options& options, JobQueue& queue, Outlet& outlet, Catalogue& catalogue)
    : mOptions(options), mQueue(queue), mOutlet(outlet), mCatalogue(catalogue) {}

bool Batch::hasRoomFor(const Job& job) const {
    const auto isSame = [&](const Item& item) { return item.job.text == job.text; };
    return mItems.size() < kMostItems && (job.folder.empty() || job.size < kLarge) &&
           std::chrono::steady_clock::now() - mBegin < kLongest &&
           std::none_of(mItems.begin(), mItems.end(), isSame);
}

void Batch::fail(Item& item, int result, const std::string& message) {
    item.result = result;
    item.message = message;
    item.staged.reset();
    item.unwritten.reset();
}

template<typename Step>
void Batch::attempt(Item& item, Step&& step) {
    try {
        step();
    } catch (const Failure& failure) {
        fail(item, failure.result(), failure.what());
    } catch (const library::Error& error) {
        const Failure failure = mCatalogue.giveUp(error);
        fail(item, failure.result(), failure.what());
    } catch (const std::exception& exception) {
        fail(item, kInternal, exception.what());
    }
}

void Batch::add(Job job) {
    Item& item = mItems.emplace_back();
    item.job = std::move(job);
    if (mQueue.isCancelled(item.job))
        return;
    mOutlet.tell(kImportStarted, kOk, item.job.text);
    attempt(item, [&] { prepare(item); });
    mBytes += item.job.size;
    mQueue.setProgress(mBytes);
}

void Batch::prepare(Item& item) {
    Source source(item.job.text);
    item.record = describe(source);
    library::Database& database = mCatalogue.database();
    if (!item.job.folder.empty()) {
        Folder folder = mCatalogue.folder().enter(engine::toBytes(item.job.folder));
        if (folder.path != folderOf(source.path()))
            return prepareCopy(item, source, std::move(folder));
    }
    // A copy that is imported again where it lies still is a copy of what it was.
    item.record.source = database.sourceOf(source.path()).value_or(source.path());
    if (source.mayBeUnwritten())
        item.unwritten = std::move(source);
}

library::MediaRecord Batch::describe(const Source& source) const {
    Probed probed = mOptions.probe(source.path());
    if (probed.result != kOk)
        throw Failure(probed.result, meaningOf(probed.result) + (": " + source.path()));
    return {source.path(),      source.path(),          source.size(),    source.modified(),
            std::time(nullptr), std::move(probed.info), probed.hasPicture};
}

/** A file that was copied into that folder before keeps the name that it has there. */
void Batch::prepareCopy(Item& item, const Source& source, Folder folder) {
    item.target = {std::move(folder), source.name(), false};
    for (const library::KnownCopy& copy : mCatalogue.database().copiesOf(source.path())) {
        if (folderOf(copy.path) != item.target.folder.path)
            continue;
        if (isUnchanged(copy, source)) {
            item.record.path = copy.path;
            return;
        }
        item.target.name = copy.path.substr(copy.path.rfind('/') + 1);
        item.target.replace = true;
        break;
    }
    stage(item, source);
}

bool Batch::isUnchanged(const library::KnownCopy& copy, const Source& source) {
    struct stat status {};
    return copy.size == source.size() && copy.modified == source.modified() &&
           ::lstat(copy.path.c_str(), &status) == 0 && S_ISREG(status.st_mode) &&
           status.st_size == copy.size;
}

void Batch::stage(Item& item, const Source& source) {
    auto staged = mCatalogue.folder().stage();
    copyFile(source.file(), staged->file(), source.size(), source.path(),
             [&](std::int64_t bytes) { showProgress(item, bytes); });
    source.checkUnchanged();
    item.staged = std::move(staged);
}

void Batch::showProgress(const Item& item, std::int64_t bytes) {
    if (mQueue.isCancelled(item.job))
        throw cancelled(item.job);
    mQueue.setProgress(mBytes + bytes);
    const auto now = std::chrono::steady_clock::now();
    if (now - mShown < mOptions.progressInterval)
        return;
    mShown = now;
    mOutlet.tell(kImportProgress, kOk, item.job.text);
}

void Batch::finish() {
    dropCancelled();
    try {
        complete();
    } catch (const Failure& failure) {
        failAll(failure);
    } catch (const library::Error& error) {
        failAll(mCatalogue.giveUp(error));
    } catch (const std::exception& exception) {
        failAll({kInternal, exception.what()});
    }
    answer();
}

void Batch::dropCancelled() {
    for (Item& item : mItems) {
        if (mQueue.isCancelled(item.job))
            fail(item, kCancelled, cancelled(item.job).what());
    }
}

void Batch::complete() {
    if (std::none_of(mItems.begin(), mItems.end(), [](const Item& item) { return item.isAlive(); }))
        return;
    syncContents();
    forEachCopy([this](Item& item) { chooseName(item); });
    announceCopies();
    publishCopies();
    syncTargets();
    writeRows();
}

void Batch::syncContents() {
    forEachCopy([](Item& item) { item.staged->setModified(item.record.modified); });
    std::vector<int> files;
    for (const Item& item : mItems) {
        if (item.staged || item.unwritten)
            files.push_back(item.staged ? item.staged->file() : item.unwritten->file());
    }
    const SyncedDevices synced = syncShared(files);
    forEachCopy([&](Item& item) { syncFile(item.staged->file(), item.record.path, synced); });
    for (Item& item : mItems) {
        if (item.unwritten)
            attempt(item, [&] { syncUnwritten(*item.unwritten, synced); });
    }
}

void Batch::syncUnwritten(const Source& source, const SyncedDevices& synced) {
    syncFile(source.file(), source.path(), synced);
    syncEntry(source.file(), source.path(), synced);
}

template<typename Step>
void Batch::forEachCopy(Step&& step) {
    for (Item& item : mItems) {
        if (item.isAlive() && item.staged)
            attempt(item, [&] { step(item); });
    }
}

void Batch::chooseName(Item& item) const {
    const std::string wanted = item.target.name;
    for (int number = 1; !item.target.replace && isTaken(item.target, item.target.name);) {
        if (++number > kMostNames)
            throw Failure(kNotAvailable, "Too many files of that name: " + wanted);
        item.target.name = numberedName(wanted, number);
    }
    item.record.path = item.target.folder.path + "/" + item.target.name;
}

bool Batch::isTaken(const Target& target, const std::string& name) const {
    const std::string path = target.folder.path + "/" + name;
    return target.folder.has(name) ||
           std::any_of(mItems.begin(), mItems.end(), [&](const Item& other) {
               return other.isAlive() && other.staged && other.record.path == path;
           });
}

void Batch::announceCopies() {
    const auto isCopy = [](const Item& item) { return item.isAlive() && item.staged; };
    if (std::none_of(mItems.begin(), mItems.end(), isCopy))
        return;
    library::Database& database = mCatalogue.database();
    library::Database::Transaction transaction(database);
    for (Item& item : mItems) {
        if (!isCopy(item))
            continue;
        database.beginCopy({item.record.path, item.staged->inode()});
        item.announced = true;
    }
    transaction.commit();
}

void Batch::publishCopies() {
    forEachCopy([](Item& item) {
        item.staged->publish(item.target.folder, item.target.name, item.target.replace);
        item.published = true;
    });
}

void Batch::syncTargets() {
    std::set<std::string> synced;
    for (const Item& item : mItems) {
        if (item.published && synced.insert(item.target.folder.path).second)
            syncFolder(item.target.folder.fd(), item.target.folder.path);
    }
}

void Batch::writeRows() {
    library::Database& database = mCatalogue.database();
    library::Database::Transaction transaction(database);
    for (const Item& item : mItems) {
        if (item.isAlive())
            database.put(item.record);
        if (item.announced)
            database.endCopy(item.record.path);
    }
    transaction.commit();
}

/** What has its name but no row is removed; what replaced an older copy gets its row later. */
void Batch::failAll(const Failure& failure) {
    for (Item& item : mItems) {
        if (!item.isAlive())
            continue;
        if (item.published && !item.target.replace)
            ::unlinkat(item.target.folder.fd(), item.target.name.c_str(), 0);
        fail(item, failure.result(), failure.what());
    }
}

void Batch::answer() {
    for (const Item& item : mItems) {
        if (mQueue.isClosed())
            return;
        mQueue.answer(item.job);
        const std::string& text = item.isAlive() ? item.record.path : item.message;
        mOutlet.tell(kImportFinished, item.result, engine::toWide(text));
    }
}

} // namespace importer
