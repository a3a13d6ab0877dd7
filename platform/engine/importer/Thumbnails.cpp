// SPDX-License-Identifier: MIT
#include "importer/Thumbnails.h"

#include <utility>

#include "LibMediaPlayer/Result.h"

namespace importer {

using namespace LibMediaPlayer;
using library::Database;

namespace {

/** Few, for all of them lose a try when the process ends. */
constexpr int kPortion = 8;

} // namespace

Thumbnails::Thumbnails(const Options& options, JobQueue& queue, Catalogue& catalogue)
    : mStopDrawing(options.stopDrawing), mCatalogue(catalogue) {
    if (options.drawThumbnail)
        mThread.emplace(options.drawThumbnail, [&queue] { queue.wake(); });
}

void Thumbnails::tend() {
    if (!mThread || !mCatalogue.exists())
        return;
    auto drawn = mThread->take();
    if (!drawn)
        return;
    if (mDrawn.empty())
        mDrawn = std::move(*drawn);
    mCatalogue.useQuietly([this] {
        keepDrawn();
        drawNext();
    });
}

void Thumbnails::stop() {
    if (!mThread)
        return;
    if (mStopDrawing)
        mStopDrawing();
    for (Drawn& drawn : mThread->stop())
        mDrawn.push_back(std::move(drawn));
    if (mCatalogue.exists())
        mCatalogue.useQuietly([this] { keepDrawn(); });
}

/** What cannot be kept now is kept the next time: none are drawn before. */
void Thumbnails::keepDrawn() {
    if (mDrawn.empty())
        return;
    Database& database = mCatalogue.database();
    Database::Transaction transaction(database, Database::Durability::kUnsure);
    for (const Drawn& drawn : mDrawn)
        keep(database, drawn);
    transaction.commit();
    mDrawn.clear();
}

/** A failure has cost its try already. */
void Thumbnails::keep(Database& database, const Drawn& drawn) {
    if (!drawn.thumbnail)
        database.setThumbnailTries(drawn.missing, drawn.missing.tries);
    else if (drawn.thumbnail->result == kOk)
        database.putThumbnail(drawn.missing, drawn.thumbnail->jpeg);
    else if (drawn.thumbnail->result == kNotAvailable)
        database.setThumbnailTries(drawn.missing, 0);
}

/** The try counts before it is made: a file that ends the process must not do so for ever. */
void Thumbnails::drawNext() {
    Database& database = mCatalogue.database();
    auto portion = database.missingThumbnails(kPortion);
    if (portion.empty())
        return;
    Database::Transaction transaction(database, Database::Durability::kUnsure);
    for (const library::MissingThumbnail& missing : portion)
        database.setThumbnailTries(missing, missing.tries - 1);
    transaction.commit();
    mThread->draw(std::move(portion));
}

} // namespace importer
