// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <optional>
#include <vector>

#include "importer/Catalogue.h"
#include "importer/JobQueue.h"
#include "importer/Options.h"
#include "importer/ThumbnailThread.h"

namespace importer {

/**
 * Gives the database's media their thumbnails, while imports go on. What is to be drawn stands in
 * the database alone, so that another run goes on where this one ends. For the importer's thread.
 */
class Thumbnails {
public:
    /** `queue` is woken when there is something to tend. */
    Thumbnails(const Options& options, JobQueue& queue, Catalogue& catalogue);

    /** Keeps what has been drawn, and has the next ones drawn. Does not wait for them. */
    void tend();

    /** Keeps what has been drawn so far; what was not begun stays as it was. */
    void stop();

private:
    void keepDrawn();
    static void keep(library::Database& database, const Drawn& drawn);
    void drawNext();

    const std::function<void()> mStopDrawing; ///< may be empty
    Catalogue& mCatalogue;
    std::optional<ThumbnailThread> mThread; ///< none when nobody wants thumbnails
    std::vector<Drawn> mDrawn;              ///< not yet in the database
};

} // namespace importer
