// SPDX-License-Identifier: MIT
#include "cli/LibraryReader.h"

#include <cstdlib>
#include <sstream>

using qnsmedia::Metadata;
using qnsmedia::Nanoseconds;
using qnsmedia::VideoStream;

namespace {

/** The daemon holds its locks for moments only. */
constexpr int kBusyMilliseconds = 5000;

/** "QNSM". Whatever the version: later ones only add to what is read here. */
constexpr int kApplicationId = 0x514e534d;

const std::string kColumns = "media.id, media.path, media.source, media.size, media.imported,"
                             " media.duration, media.title, media.artist, media.album";

LibraryRow rowOf(SQLite::Statement& query) {
    return {query.getColumn(0).getInt64(),  query.getColumn(1).getString(),
            query.getColumn(2).getString(), query.getColumn(3).getInt64(),
            query.getColumn(4).getInt64(),  Nanoseconds(query.getColumn(5).getInt64()),
            query.getColumn(6).getString(), query.getColumn(7).getString(),
            query.getColumn(8).getString()};
}

/** Every word as the beginning of one, none of them as an operator. */
std::string searchExpression(const std::string& words) {
    std::istringstream input(words);
    std::string expression;
    for (std::string word; input >> word;) {
        for (std::size_t at = 0; (at = word.find('"', at)) != std::string::npos; at += 2)
            word.insert(at, 1, '"');
        expression += "\"" + word + "\"* ";
    }
    return expression;
}

} // namespace

LibraryReader::LibraryReader(const std::string& file) try
    : mDatabase(file, SQLite::OPEN_READONLY, kBusyMilliseconds) {
    if (mDatabase.execAndGet("PRAGMA application_id").getInt() != kApplicationId)
        throw SQLite::Exception("it is no media library");
} catch (const SQLite::Exception& exception) {
    throw SQLite::Exception("the media library cannot be read: " + file + ": " + exception.what());
}

void LibraryReader::visitAll(SQLite::Statement& query, const Visitor& visit) {
    while (query.executeStep())
        visit(rowOf(query));
}

void LibraryReader::list(const Visitor& visit) {
    SQLite::Statement query(mDatabase, "SELECT " + kColumns +
                                           " FROM media ORDER BY artist, album, title, path");
    visitAll(query, visit);
}

void LibraryReader::search(const std::string& words, const Visitor& visit) {
    const std::string expression = searchExpression(words);
    if (expression.empty())
        return;
    SQLite::Statement query(mDatabase,
                            "SELECT " + kColumns +
                                " FROM media_search JOIN media ON media.id = media_search.rowid"
                                " WHERE media_search MATCH ?1 ORDER BY rank");
    query.bind(1, expression);
    visitAll(query, visit);
}

std::optional<LibraryRow> LibraryReader::find(const std::string& key) {
    SQLite::Statement query(mDatabase, "SELECT " + kColumns +
                                           " FROM media WHERE id = ?1 OR path = ?2 OR source = ?2"
                                           " ORDER BY path <> ?2 LIMIT 1");
    char* end = nullptr;
    const long long id = std::strtoll(key.c_str(), &end, 10);
    query.bind(1, static_cast<std::int64_t>(key.empty() || *end != '\0' ? -1 : id));
    query.bind(2, key);
    if (!query.executeStep())
        return std::nullopt;
    return rowOf(query);
}

Metadata LibraryReader::metadata(const LibraryRow& row) {
    Metadata metadata;
    SQLite::Statement query(mDatabase,
                            "SELECT media_type, seekable, duration FROM media WHERE id = ?1");
    query.bind(1, row.id);
    if (query.executeStep()) {
        metadata.mediaType = query.getColumn(0).getString();
        metadata.seekable = query.getColumn(1).getInt() != 0;
        metadata.duration = Nanoseconds(query.getColumn(2).getInt64());
    }
    readVideo(row.id, metadata);
    readAudio(row.id, metadata);
    readTags(row.id, metadata);
    return metadata;
}

void LibraryReader::readVideo(std::int64_t id, Metadata& metadata) {
    SQLite::Statement query(
        mDatabase, "SELECT media_type, description, width, height, depth, frame_rate_numerator,"
                   " frame_rate_denominator, pixel_aspect_numerator, pixel_aspect_denominator,"
                   " interlaced, bit_rate, max_bit_rate, still_picture"
                   " FROM video_stream WHERE media_id = ?1 ORDER BY number");
    query.bind(1, id);
    while (query.executeStep()) {
        const auto number = [&](int column) { return query.getColumn(column).getInt(); };
        VideoStream& video = metadata.video.emplace_back();
        video.mediaType = query.getColumn(0).getString();
        video.description = query.getColumn(1).getString();
        video.width = number(2);
        video.height = number(3);
        video.depth = number(4);
        video.frameRate = {number(5), number(6)};
        video.pixelAspect = {number(7), number(8)};
        video.interlaced = number(9) != 0;
        video.bitRate = number(10);
        video.maxBitRate = number(11);
        video.stillPicture = number(12) != 0;
    }
}

void LibraryReader::readAudio(std::int64_t id, Metadata& metadata) {
    SQLite::Statement query(mDatabase,
                            "SELECT media_type, description, channels, sample_rate, depth,"
                            " bit_rate, max_bit_rate FROM audio_stream WHERE media_id = ?1"
                            " ORDER BY number");
    query.bind(1, id);
    while (query.executeStep()) {
        const auto number = [&](int column) { return query.getColumn(column).getInt(); };
        metadata.audio.push_back({query.getColumn(0).getString(), query.getColumn(1).getString(),
                                  number(2), number(3), number(4), number(5), number(6)});
    }
}

void LibraryReader::readTags(std::int64_t id, Metadata& metadata) {
    SQLite::Statement query(mDatabase,
                            "SELECT key, value FROM tag WHERE media_id = ?1 ORDER BY number");
    query.bind(1, id);
    while (query.executeStep())
        metadata.tags.emplace_back(query.getColumn(0).getString(), query.getColumn(1).getString());
}

std::string libraryFile() {
    const char* const folder = std::getenv("QNS_HV_DATA");
    return std::string(folder != nullptr && *folder != '\0' ? folder : "/var/lib/qnsmedia") +
           "/mediaplayer/media.db";
}
