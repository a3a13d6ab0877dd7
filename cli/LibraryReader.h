// SPDX-License-Identifier: MIT
#pragma once

#include <SQLiteCpp/SQLiteCpp.h>
#include <cstdint>
#include <functional>
#include <optional>
#include <string>

#include "qnsmedia/DiscovererTypes.h"

/** A medium of the library, as lists show it. */
struct LibraryRow {
    std::int64_t id = 0;
    std::string path;
    std::string source;        ///< the file it was copied from; the path when it lies where it was
    std::int64_t size = 0;     ///< bytes
    std::int64_t imported = 0; ///< seconds since 1970
    qnsmedia::Nanoseconds duration{0};
    std::string title;
    std::string artist;
    std::string album;
};

/**
 * Reads the media library's database while the daemon may be writing it. For one thread; throws
 * SQLite::Exception, also when there is no database.
 */
class LibraryReader {
public:
    using Visitor = std::function<void(const LibraryRow& row)>;

    explicit LibraryReader(const std::string& file);

    /** By artist, album and title. */
    void list(const Visitor& visit);

    /** Those with words that begin with every one of `words`, the best first. */
    void search(const std::string& words, const Visitor& visit);

    /** By id or path, or by the path it was copied from. */
    std::optional<LibraryRow> find(const std::string& key);

    /** Streams and tags. */
    qnsmedia::Metadata metadata(const LibraryRow& row);

private:
    void visitAll(SQLite::Statement& query, const Visitor& visit);
    void readVideo(std::int64_t id, qnsmedia::Metadata& metadata);
    void readAudio(std::int64_t id, qnsmedia::Metadata& metadata);
    void readTags(std::int64_t id, qnsmedia::Metadata& metadata);

    SQLite::Database mDatabase;
};

/** Where the daemon of this machine has its library's database. */
std::string libraryFile();
