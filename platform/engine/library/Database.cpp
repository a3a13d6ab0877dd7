// SPDX-License-Identifier: MIT
#include "library/Database.h"

#include <sqlite3.h>
#include <sys/stat.h>

#include "LibMediaPlayer/Result.h"
#include "handle/Barrier.h"
#include "library/Failure.h"
#include "library/Schema.h"
#include "text/Text.h"

namespace library {

using namespace LibMediaPlayer;

namespace {

/** Long enough for a reader's checkpoint, short enough to be told about. */
constexpr int kBusyMilliseconds = 2000;

/** A process that ends while it draws costs one too. */
constexpr int kThumbnailTries = 3;

enum Query : std::size_t {
    kFindMedia,
    kAddMedia,
    kChangeMedia,
    kIndexMedia,
    kDropThumbnail,
    kDropVideo,
    kDropAudio,
    kDropTags,
    kPutVideo,
    kPutAudio,
    kPutTag,
    kSourceOf,
    kCopiesOf,
    kBeginCopy,
    kEndCopy,
    kPendingCopies,
    kMissingThumbnails,
    kSetThumbnailTries,
    kPutThumbnail,
    kQueryCount
};

constexpr std::array<const char*, kQueryCount> kQueries = {
    // kFindMedia
    "SELECT id, size, modified FROM media WHERE path = ?1",
    // kAddMedia
    "INSERT INTO media (path, source, size, modified, imported, media_type, duration, seekable,"
    " title, artist, album, thumbnail_tries)"
    " VALUES (?1, ?2, ?3, ?4, ?5, ?6, ?7, ?8, ?9, ?10, ?11, ?12)",
    // kChangeMedia
    "UPDATE media SET path = ?1, source = ?2, size = ?3, modified = ?4, imported = ?5,"
    " media_type = ?6, duration = ?7, seekable = ?8, title = ?9, artist = ?10, album = ?11,"
    " thumbnail_tries = CASE WHEN EXISTS (SELECT 1 FROM thumbnail WHERE media_id = ?13)"
    " THEN 0 ELSE ?12 END WHERE id = ?13",
    // kIndexMedia
    "INSERT INTO media_search (rowid, title, artist, album, path) VALUES (?1, ?2, ?3, ?4, ?5)",
    // kDropThumbnail
    "DELETE FROM thumbnail WHERE media_id = ?1",
    // kDropVideo, kDropAudio, kDropTags
    "DELETE FROM video_stream WHERE media_id = ?1", "DELETE FROM audio_stream WHERE media_id = ?1",
    "DELETE FROM tag WHERE media_id = ?1",
    // kPutVideo
    "INSERT INTO video_stream VALUES"
    " (?1, ?2, ?3, ?4, ?5, ?6, ?7, ?8, ?9, ?10, ?11, ?12, ?13, ?14, ?15)",
    // kPutAudio
    "INSERT INTO audio_stream VALUES (?1, ?2, ?3, ?4, ?5, ?6, ?7, ?8, ?9)",
    // kPutTag
    "INSERT INTO tag VALUES (?1, ?2, ?3, ?4)",
    // kSourceOf
    "SELECT source FROM media WHERE path = ?1",
    // kCopiesOf
    "SELECT path, size, modified FROM media WHERE source = ?1 AND path <> source",
    // kBeginCopy
    "INSERT OR REPLACE INTO copying VALUES (?1, ?2)",
    // kEndCopy
    "DELETE FROM copying WHERE path = ?1",
    // kPendingCopies
    "SELECT path, inode FROM copying",
    // kMissingThumbnails
    "SELECT id, path, size, modified, thumbnail_tries FROM media WHERE thumbnail_tries > 0"
    " ORDER BY thumbnail_tries DESC, id DESC LIMIT ?1",
    // kSetThumbnailTries
    "UPDATE media SET thumbnail_tries = ?5"
    " WHERE id = ?1 AND path = ?2 AND size = ?3 AND modified = ?4",
    // kPutThumbnail
    "INSERT OR REPLACE INTO thumbnail SELECT id, ?5 FROM media"
    " WHERE id = ?1 AND path = ?2 AND size = ?3 AND modified = ?4"};

Headline headlineOf(const std::vector<Tag>& tags) {
    return {firstValue(tags, "TITLE"), firstValue(tags, "ARTIST"), firstValue(tags, "ALBUM")};
}

void bindAll(SQLite::Statement&, int) {}

template<typename Value, typename... Values>
void bindAll(SQLite::Statement& statement, int index, const Value& value, const Values&... rest) {
    statement.bind(index, value);
    bindAll(statement, index + 1, rest...);
}

} // namespace

/** One use of a prepared statement: values in, rows out, and it is ready for the next. */
class Database::Use {
public:
    template<typename... Values>
    Use(Database& database, Query query, const Values&... values)
        : mStatement(database.mStatements[query]) {
        bindAll(mStatement, 1, values...);
    }
    ~Use() {
        mStatement.tryReset();
        handle::guarded([this] { mStatement.clearBindings(); });
    }
    Use(const Use&) = delete;
    Use& operator=(const Use&) = delete;

    void run() {
        while (mStatement.executeStep()) {
        }
    }
    bool next() { return mStatement.executeStep(); }
    void bindBlob(int index, const std::string& bytes) {
        mStatement.bind(index, bytes.data(), static_cast<int>(bytes.size()));
    }
    [[nodiscard]] std::string text(int column) const {
        return mStatement.getColumn(column).getString();
    }
    [[nodiscard]] std::int64_t number(int column) const {
        return mStatement.getColumn(column).getInt64();
    }

private:
    SQLite::Statement& mStatement;
};

Database::Transaction::Transaction(Database& database, Durability durability)
    : mOwner(database), mTransaction(checked(database.mFile, [&] {
          database.setDurability(durability);
          return SQLite::Transaction(database.mDatabase, SQLite::TransactionBehavior::IMMEDIATE);
      })) {}

Database::Transaction::~Transaction() {
    mOwner.mAdded.clear();
}

void Database::Transaction::commit() {
    checked(mOwner.mFile, [this] {
        mOwner.indexAdded();
        mTransaction.commit();
    });
}

Database::Database(const std::string& file)
    : mFile(file), mDatabase(checked(file, [&] {
          return SQLite::Database(file, SQLite::OPEN_READWRITE | SQLite::OPEN_CREATE,
                                  kBusyMilliseconds);
      })) {
    checked(mFile, [this] {
        // What is damaged stays as it is: closing must not carry anything into it.
        sqlite3_db_config(mDatabase.getHandle(), SQLITE_DBCONFIG_NO_CKPT_ON_CLOSE, 1, nullptr);
        mDatabase.exec("PRAGMA journal_mode = WAL; PRAGMA synchronous = FULL;"
                       "PRAGMA foreign_keys = ON; PRAGMA journal_size_limit = 4194304");
        migrate();
        prepare();
        sqlite3_db_config(mDatabase.getHandle(), SQLITE_DBCONFIG_NO_CKPT_ON_CLOSE, 0, nullptr);
    });
    struct stat status {};
    ::stat(mFile.c_str(), &status);
    mDevice = status.st_dev;
    mInode = status.st_ino;
}

/** Cannot be changed inside a transaction, and need not be when it is the same as before. */
void Database::setDurability(Durability durability) {
    if (durability == mDurability)
        return;
    mDatabase.exec(durability == Durability::kKept ? "PRAGMA synchronous = FULL"
                                                   : "PRAGMA synchronous = NORMAL");
    mDurability = durability;
}

void Database::migrate() {
    const auto version = [this] { return mDatabase.execAndGet("PRAGMA user_version").getInt(); };
    constexpr int kVersion = static_cast<int>(kMigrations.size());
    if (version() == kVersion)
        return;
    // Another program may be doing the same: look again once it is our turn.
    SQLite::Transaction transaction(mDatabase, SQLite::TransactionBehavior::IMMEDIATE);
    const int from = version();
    if (from > kVersion || from < 0)
        throw Error(kNotAvailable, "The media database was made by a newer version: " + mFile);
    for (auto step = static_cast<std::size_t>(from); step < kMigrations.size(); ++step)
        mDatabase.exec(kMigrations[step]);
    mDatabase.exec("PRAGMA application_id = " + std::to_string(kApplicationId));
    mDatabase.exec("PRAGMA user_version = " + std::to_string(kVersion));
    transaction.commit();
}

void Database::prepare() {
    mStatements.reserve(kQueries.size());
    for (const char* const query : kQueries)
        mStatements.emplace_back(mDatabase, query);
}

bool Database::isInPlace() const {
    struct stat status {};
    return ::stat(mFile.c_str(), &status) == 0 && status.st_dev == mDevice &&
           status.st_ino == mInode;
}

void Database::abandon() {
    sqlite3_db_config(mDatabase.getHandle(), SQLITE_DBCONFIG_NO_CKPT_ON_CLOSE, 1, nullptr);
}

template<typename... Values>
void Database::useWithFields(std::size_t query, const MediaRecord& record, const Headline& headline,
                             const Values&... others) {
    const auto& system = record.info.system;
    Use(*this, static_cast<Query>(query), record.path, record.source, record.size, record.modified,
        record.imported, system.mediaType, system.duration, system.seekable ? 1 : 0, headline.title,
        headline.artist, headline.album, record.hasPicture ? kThumbnailTries : 0, others...)
        .run();
}

void Database::put(const MediaRecord& record) {
    checked(mFile, [&] {
        const std::vector<Tag> tags = parseTags(record.info.system.tags);
        std::int64_t id = 0;
        bool isSame = false;
        if (Use known(*this, kFindMedia, record.path); known.next()) {
            id = known.number(0);
            isSame = known.number(1) == record.size && known.number(2) == record.modified;
        }
        if (id == 0)
            return addMedia(record, tags);
        if (!isSame)
            Use(*this, kDropThumbnail, id).run();
        changeMedia(id, record, tags);
    });
}

void Database::addMedia(const MediaRecord& record, const std::vector<Tag>& tags) {
    const Headline headline = headlineOf(tags);
    useWithFields(kAddMedia, record, headline);
    const std::int64_t id = mDatabase.getLastInsertRowid();
    mAdded.push_back({id, headline, record.path});
    putStreams(id, record.info);
    putTags(id, tags);
}

void Database::changeMedia(std::int64_t id, const MediaRecord& record,
                           const std::vector<Tag>& tags) {
    indexAdded(); // it may be among them
    useWithFields(kChangeMedia, record, headlineOf(tags), id);
    for (const Query drop : {kDropVideo, kDropAudio, kDropTags})
        Use(*this, drop, id).run();
    putStreams(id, record.info);
    putTags(id, tags);
}

/** All at once and one statement each, or the index would write them out one by one. */
void Database::indexAdded() {
    for (const Added& added : mAdded)
        Use(*this, kIndexMedia, added.id, added.headline.title, added.headline.artist,
            added.headline.album, added.path)
            .run();
    mAdded.clear();
}

void Database::putStreams(std::int64_t id, const MediaMetaInfo& info) {
    if (info.videoCount > 0)
        putVideo(id, info.video);
    for (int number = 0; number < info.audioCount; ++number)
        putAudio(id, number, info.audio.at(static_cast<std::size_t>(number)));
}

void Database::putVideo(std::int64_t id, const VideoMetaInfo& video) {
    Use(*this, kPutVideo, id, 0, video.mediaType, engine::toUtf8(video.description), video.width,
        video.height, video.depth, video.frameRateNumerator, video.frameRateDenominator,
        video.pixelAspectNumerator, video.pixelAspectDenominator, video.interlaced ? 1 : 0,
        video.bitRate, video.maxBitRate, video.stillPicture ? 1 : 0)
        .run();
}

void Database::putAudio(std::int64_t id, int number, const AudioMetaInfo& audio) {
    Use(*this, kPutAudio, id, number, audio.mediaType, engine::toUtf8(audio.description),
        audio.channels, audio.sampleRate, audio.depth, audio.bitRate, audio.maxBitRate)
        .run();
}

void Database::putTags(std::int64_t id, const std::vector<Tag>& tags) {
    int number = 0;
    for (const Tag& tag : tags)
        Use(*this, kPutTag, id, number++, tag.key, tag.value).run();
}

std::optional<std::string> Database::sourceOf(const std::string& path) {
    return checked(mFile, [&] {
        Use row(*this, kSourceOf, path);
        return row.next() ? std::optional(row.text(0)) : std::nullopt;
    });
}

std::vector<KnownCopy> Database::copiesOf(const std::string& source) {
    return checked(mFile, [&] {
        std::vector<KnownCopy> copies;
        Use row(*this, kCopiesOf, source);
        while (row.next())
            copies.push_back({row.text(0), row.number(1), row.number(2)});
        return copies;
    });
}

void Database::beginCopy(const PendingCopy& copy) {
    checked(mFile, [&] {
        Use(*this, kBeginCopy, copy.path, static_cast<std::int64_t>(copy.inode)).run();
    });
}

void Database::endCopy(const std::string& path) {
    checked(mFile, [&] { Use(*this, kEndCopy, path).run(); });
}

std::vector<PendingCopy> Database::pendingCopies() {
    return checked(mFile, [&] {
        std::vector<PendingCopy> copies;
        Use row(*this, kPendingCopies);
        while (row.next())
            copies.push_back({row.text(0), static_cast<ino_t>(row.number(1))});
        return copies;
    });
}

std::vector<MissingThumbnail> Database::missingThumbnails(int limit) {
    return checked(mFile, [&] {
        std::vector<MissingThumbnail> missing;
        Use row(*this, kMissingThumbnails, limit);
        while (row.next())
            missing.push_back({row.number(0), row.text(1), row.number(2), row.number(3),
                               static_cast<int>(row.number(4))});
        return missing;
    });
}

void Database::setThumbnailTries(const MissingThumbnail& missing, int tries) {
    checked(mFile, [&] {
        Use(*this, kSetThumbnailTries, missing.id, missing.path, missing.size, missing.modified,
            tries)
            .run();
    });
}

void Database::putThumbnail(const MissingThumbnail& missing, const std::string& jpeg) {
    checked(mFile, [&] {
        Use row(*this, kPutThumbnail, missing.id, missing.path, missing.size, missing.modified);
        row.bindBlob(5, jpeg);
        row.run();
    });
    setThumbnailTries(missing, 0);
}

} // namespace library
