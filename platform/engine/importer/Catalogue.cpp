// SPDX-License-Identifier: MIT
#include "importer/Catalogue.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <syslog.h>
#include <unistd.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "importer/Folders.h"
#include "importer/Source.h"
#include "library/SetAside.h"
#include "qnsys.h"

namespace importer {

using namespace LibMediaPlayer;

namespace {

void removeDurably(const std::string& path) {
    ::unlink(path.c_str());
    const std::string folder = folderOf(path);
    const qns::UniqueFd file(::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (file)
        syncFolder(file.get(), folder);
}

} // namespace

Catalogue::Catalogue(std::string dataFolder, Probe probe)
    : mDataFolder(std::move(dataFolder)),
      mLibraryPath(mDataFolder + "/media"),
      mDatabaseFolder(mDataFolder + "/mediaplayer"),
      mDatabasePath(mDatabaseFolder + "/media.db"),
      mProbe(std::move(probe)) {}

bool Catalogue::exists() const {
    return !mDataFolder.empty() && ::access(mDatabasePath.c_str(), F_OK) == 0;
}

void Catalogue::start() {
    if (exists())
        useQuietly([this] { database(); });
}

void Catalogue::useQuietly(const std::function<void()>& use) {
    const auto keepUntold = [this](const Failure& failure) {
        if (failure.result() == kDamaged)
            mUntold = failure;
    };
    try {
        use();
    } catch (const library::Error& error) {
        keepUntold(giveUp(error));
    } catch (const Failure& failure) {
        keepUntold(failure);
    }
}

library::Database& Catalogue::database() {
    if (const auto untold = std::exchange(mUntold, std::nullopt))
        throw *untold;
    if (mDatabase && !mDatabase->isInPlace())
        close();
    if (!mDatabase) {
        try {
            open();
        } catch (const library::Error& error) {
            throw giveUp(error);
        }
    }
    return *mDatabase;
}

LibraryFolder& Catalogue::folder() {
    database();
    if (!mFolder || !mFolder->isInPlace())
        mFolder.emplace(mLibraryPath);
    return *mFolder;
}

Failure Catalogue::giveUp(const library::Error& error) {
    if (mDatabase && error.isDamaged())
        mDatabase->abandon();
    mDatabase.reset();
    std::string message = error.what();
    if (error.isDamaged()) {
        try {
            message += "; it was set aside as " + library::setAside(mDatabasePath) +
                       ", and the next import begins a new one";
        } catch (const library::Error& second) {
            message = second.what();
        }
        qnsys_syslog(LOG_ERR, "%s", message.c_str());
    }
    return {error.result(), message};
}

/** Two importers would take each other's copies for leftovers. */
void Catalogue::lock() {
    if (mLock)
        return;
    if (mDataFolder.empty())
        throw Failure(kNotAvailable, "The data directory is not known");
    makeFolders(mDatabaseFolder);
    qns::UniqueFd folder(::open(mDatabaseFolder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (!folder)
        throw systemFailure("The folder of the media database cannot be used", mDatabaseFolder);
    if (::flock(folder.get(), LOCK_EX | LOCK_NB) != 0)
        throw Failure(kNotAvailable, "Another process imports into " + mDataFolder);
    mLock = std::move(folder);
}

void Catalogue::open() {
    lock();
    const bool isNew = !exists();
    mDatabase.emplace(mDatabasePath);
    try {
        if (isNew)
            syncFolder(mLock.get(), mDatabaseFolder);
        recover();
        sweep();
    } catch (const Failure&) {
        mDatabase.reset();
        throw;
    }
}

void Catalogue::close() {
    mFolder.reset();
    mDatabase.reset();
    mLock.reset();
}

void Catalogue::recover() {
    const auto pending = mDatabase->pendingCopies();
    if (pending.empty())
        return;
    library::Database::Transaction transaction(*mDatabase);
    for (const library::PendingCopy& copy : pending)
        recover(copy);
    transaction.commit();
}

/**
 * Only once, for later there may be copies under way; and after the recovery, for as long as the
 * staged copies are there no other file can have their inodes.
 */
void Catalogue::sweep() {
    if (!mSwept && LibraryFolder::hasStaging(mLibraryPath))
        mFolder.emplace(mLibraryPath).sweep();
    mSwept = true;
}

void Catalogue::recover(const library::PendingCopy& copy) {
    mDatabase->endCopy(copy.path);
    struct stat status {};
    if (::lstat(copy.path.c_str(), &status) != 0 || status.st_ino != copy.inode)
        return;
    const auto source = mDatabase->sourceOf(copy.path);
    if (!source) {
        removeDurably(copy.path);
        return;
    }
    // It has taken the place of an older copy, which the row still describes.
    const Probed probed = mProbe(copy.path);
    if (probed.result == kOk)
        mDatabase->put({copy.path, *source, status.st_size, modifiedTime(status),
                        status.st_ctim.tv_sec, probed.info, probed.hasPicture});
}

} // namespace importer
