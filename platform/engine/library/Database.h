// SPDX-License-Identifier: MIT
#pragma once

#include <SQLiteCpp/SQLiteCpp.h>
#include <cstdint>
#include <optional>
#include <string>
#include <sys/types.h>
#include <vector>

#include "library/MediaRecord.h"
#include "library/Tags.h"

namespace library {

/** A file of the library that was copied from somewhere else. */
struct KnownCopy {
    std::string path;
    std::int64_t size = 0;
    std::int64_t modified = 0;
};

/** A file that was about to get its final name. The inode tells it from one that others put there.
 */
struct PendingCopy {
    std::string path;
    ino_t inode = 0;
};

/** The tags that every list of media shows. */
struct Headline {
    std::string title;
    std::string artist;
    std::string album;
};

/** A medium that has no thumbnail yet, and the content that it is to be drawn from. */
struct MissingThumbnail {
    std::int64_t id = 0;
    std::string path;
    std::int64_t size = 0;
    std::int64_t modified = 0;
    int tries = 0; ///< how often it may still be tried
};

/**
 * The media library's database. Writes survive a power cut once their transaction
 * is committed, unless it says otherwise.
 *
 * For one thread; other programs may read and write the file at the same time. Every operation
 * throws Error.
 */
class Database {
public:
    /** Opens the file, or begins a new one, and brings it to the present version. */
    explicit Database(const std::string& file);
    Database(const Database&) = delete;
    Database& operator=(const Database&) = delete;

    /** What becomes of a commit when the power fails at once. */
    enum class Durability {
        kKept,   ///< it survives
        kUnsure, ///< it may be undone; the next kept one makes it survive. Takes no time
    };

    /** All writes happen inside one. Rolled back unless committed. */
    class Transaction {
    public:
        explicit Transaction(Database& database, Durability durability = Durability::kKept);
        ~Transaction();
        Transaction(const Transaction&) = delete;
        Transaction& operator=(const Transaction&) = delete;
        void commit();

    private:
        Database& mOwner;
        SQLite::Transaction mTransaction;
    };

    /** False when the file has been removed, or another one put in its place. */
    [[nodiscard]] bool isInPlace() const;

    /** Closing leaves the files as they are: for one that is damaged. */
    void abandon();

    /** Adds a medium, or brings the row of its path up to date. */
    void put(const MediaRecord& record);

    /** The source of the medium with this path; nothing when there is none. */
    std::optional<std::string> sourceOf(const std::string& path);

    std::vector<KnownCopy> copiesOf(const std::string& source);

    void beginCopy(const PendingCopy& copy);
    void endCopy(const std::string& path);
    std::vector<PendingCopy> pendingCopies();

    /** Those with more tries left come first, then those that were added last. */
    std::vector<MissingThumbnail> missingThumbnails(int limit);

    /** The next two do nothing when the medium is another one by now, or has changed. */
    void setThumbnailTries(const MissingThumbnail& missing, int tries);
    void putThumbnail(const MissingThumbnail& missing, const std::string& jpeg);

private:
    class Use;

    /** What a row has for the search index. */
    struct Added {
        std::int64_t id;
        Headline headline;
        std::string path;
    };

    void setDurability(Durability durability);
    void migrate();
    void prepare();
    template<typename... Values>
    void useWithFields(std::size_t query, const MediaRecord& record, const Headline& headline,
                       const Values&... others);
    void addMedia(const MediaRecord& record, const std::vector<Tag>& tags);
    void changeMedia(std::int64_t id, const MediaRecord& record, const std::vector<Tag>& tags);
    void indexAdded();
    void putStreams(std::int64_t id, const LibMediaPlayer::MediaMetaInfo& info);
    void putVideo(std::int64_t id, const LibMediaPlayer::VideoMetaInfo& video);
    void putAudio(std::int64_t id, int number, const LibMediaPlayer::AudioMetaInfo& audio);
    void putTags(std::int64_t id, const std::vector<Tag>& tags);

    const std::string mFile;
    SQLite::Database mDatabase;
    std::vector<SQLite::Statement> mStatements; ///< after the database, so that they go first
    Durability mDurability = Durability::kKept;
    std::vector<Added> mAdded; ///< by this transaction, and not yet in the search index
    dev_t mDevice = 0;
    ino_t mInode = 0;
};

} // namespace library
