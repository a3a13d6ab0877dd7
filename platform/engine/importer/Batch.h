// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "importer/Catalogue.h"
#include "importer/JobQueue.h"
#include "importer/Options.h"
#include "importer/Outlet.h"
#include "importer/Source.h"
#include "importer/Syncs.h"
#include "library/MediaRecord.h"

namespace importer {

/**
 * Imports that share their syncs and commits, so that many small ones are not bound by one each.
 * A batch goes from taking the first job to answering the last one, in this order:
 *
 *   copy under temporary names - sync the copies - commit which names they will get - give them
 *   those names - sync the folders - commit the rows - notify
 *
 * Wherever that is cut off, what is left is either undone or complete the next time the database
 * is opened. For one thread.
 */
class Batch {
public:
    Batch(const Options& options, JobQueue& queue, Outlet& outlet, Catalogue& catalogue);

    /** False when the job should not make the others wait, or builds on what one of them does. */
    [[nodiscard]] bool hasRoomFor(const Job& job) const;

    /** Does all that can be done for one alone. */
    void add(Job job);

    /** Does the rest for all of them, and answers. */
    void finish();

private:
    /** Where a copy goes. */
    struct Target {
        Folder folder;
        std::string name;
        bool replace = false; ///< it takes the place of an earlier copy of the same file
    };

    struct Item {
        Job job;
        int result = 0;
        std::string message;                ///< when result is not 0
        library::MediaRecord record;        ///< when result is 0
        std::unique_ptr<StagedFile> staged; ///< the copy, if it is one
        std::optional<Source> unwritten; ///< the file itself, if it is catalogued and may need it
        Target target;
        bool announced = false; ///< the database knows that the copy is to get its name
        bool published = false; ///< the copy has its name

        [[nodiscard]] bool isAlive() const { return result == 0; }
    };

    template<typename Step>
    void attempt(Item& item, Step&& step);
    template<typename Step>
    void forEachCopy(Step&& step);
    static void fail(Item& item, int result, const std::string& message);

    void prepare(Item& item);
    [[nodiscard]] library::MediaRecord describe(const Source& source) const;
    void prepareCopy(Item& item, const Source& source, Folder folder);
    static bool isUnchanged(const library::KnownCopy& copy, const Source& source);
    void stage(Item& item, const Source& source);
    void showProgress(const Item& item, std::int64_t bytes);

    void dropCancelled();
    void complete();
    void syncContents();
    static void syncUnwritten(const Source& source, const SyncedDevices& synced);
    void chooseName(Item& item) const;
    [[nodiscard]] bool isTaken(const Target& target, const std::string& name) const;
    void announceCopies();
    void publishCopies();
    void syncTargets();
    void writeRows();
    void failAll(const Failure& failure);
    void answer();

    const Options& mOptions;
    JobQueue& mQueue;
    Outlet& mOutlet;
    Catalogue& mCatalogue;
    std::vector<Item> mItems;
    std::int64_t mBytes = 0; ///< of the items that are prepared
    const std::chrono::steady_clock::time_point mBegin = std::chrono::steady_clock::now();
    std::chrono::steady_clock::time_point mShown = mBegin;
};

} // namespace importer
