// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <optional>
#include <string>

#include "base/UniqueFd.h"
#include "importer/Failure.h"
#include "importer/LibraryFolder.h"
#include "importer/Probe.h"
#include "library/Database.h"
#include "library/Error.h"

namespace importer {

/**
 * The data directory: the library's database and its folder, for one importer at a time. Both
 * are opened when they are first needed, and again after a failure. For one thread.
 */
class Catalogue {
public:
    Catalogue(std::string dataFolder, Probe probe);

    /** Puts right at once what an earlier run left; what fails is told by the first use. */
    void start();

    /** The database, after what an interrupted run left has been put right. Throws Failure. */
    library::Database& database();

    /** Throws Failure. */
    LibraryFolder& folder();

    /**
     * Closes the database after an operation of it has failed, sets it aside when it is damaged,
     * and returns what to tell.
     */
    Failure giveUp(const library::Error& error);

private:
    [[nodiscard]] bool exists() const;
    void lock();
    void open();
    void close();
    void sweep();
    void recover();
    void recover(const library::PendingCopy& copy);

    const std::string mDataFolder;
    const std::string mLibraryPath;
    const std::string mDatabaseFolder;
    const std::string mDatabasePath;
    const Probe mProbe;
    qns::UniqueFd mLock; ///< the database's folder; locked while open
    std::optional<library::Database> mDatabase;
    std::optional<LibraryFolder> mFolder;
    std::optional<Failure> mUntold; ///< the database was set aside, and nobody has heard of it
    bool mSwept = false;
};

} // namespace importer
