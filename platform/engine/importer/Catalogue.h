// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
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

    /** True when the database has been begun; no other use should begin it than an import. */
    [[nodiscard]] bool exists() const;

    /** The database, after what an interrupted run left has been put right. Throws Failure. */
    library::Database& database();

    /** Throws Failure. */
    LibraryFolder& folder();

    /**
     * Runs what nobody waits for. That the database had to be set aside is told by the next use;
     * any other failure meets that itself.
     */
    void useQuietly(const std::function<void()>& use);

    /**
     * Closes the database after an operation of it has failed, sets it aside when it is damaged,
     * and returns what to tell.
     */
    Failure giveUp(const library::Error& error);

private:
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
