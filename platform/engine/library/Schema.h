// SPDX-License-Identifier: MIT
#pragma once

#include <array>

namespace library {

/** Marks the file as a media library, for file(1) and for us. */
inline constexpr int kApplicationId = 0x514e534d;

/**
 * How a database comes from one version (`user_version`) to the next. The first begins an empty
 * one; what has been delivered is never changed, a new version appends a text.
 */
inline constexpr std::array<const char*, 2> kMigrations = {
    R"sql(
CREATE TABLE media (
    id INTEGER PRIMARY KEY,
    path TEXT NOT NULL UNIQUE,
    source TEXT NOT NULL,
    size INTEGER NOT NULL,
    modified INTEGER NOT NULL,
    imported INTEGER NOT NULL,
    media_type TEXT NOT NULL,
    duration INTEGER NOT NULL,
    seekable INTEGER NOT NULL,
    title TEXT NOT NULL,
    artist TEXT NOT NULL,
    album TEXT NOT NULL,
    thumbnail_tries INTEGER NOT NULL
);
CREATE INDEX media_by_source ON media (source);
CREATE INDEX media_by_artist ON media (artist, album, title);
CREATE INDEX media_without_thumbnail ON media (thumbnail_tries) WHERE thumbnail_tries > 0;

CREATE TABLE video_stream (
    media_id INTEGER NOT NULL REFERENCES media ON DELETE CASCADE,
    number INTEGER NOT NULL,
    media_type TEXT NOT NULL,
    description TEXT NOT NULL,
    width INTEGER NOT NULL,
    height INTEGER NOT NULL,
    depth INTEGER NOT NULL,
    frame_rate_numerator INTEGER NOT NULL,
    frame_rate_denominator INTEGER NOT NULL,
    pixel_aspect_numerator INTEGER NOT NULL,
    pixel_aspect_denominator INTEGER NOT NULL,
    interlaced INTEGER NOT NULL,
    bit_rate INTEGER NOT NULL,
    max_bit_rate INTEGER NOT NULL,
    still_picture INTEGER NOT NULL,
    PRIMARY KEY (media_id, number)
) WITHOUT ROWID;

CREATE TABLE audio_stream (
    media_id INTEGER NOT NULL REFERENCES media ON DELETE CASCADE,
    number INTEGER NOT NULL,
    media_type TEXT NOT NULL,
    description TEXT NOT NULL,
    channels INTEGER NOT NULL,
    sample_rate INTEGER NOT NULL,
    depth INTEGER NOT NULL,
    bit_rate INTEGER NOT NULL,
    max_bit_rate INTEGER NOT NULL,
    PRIMARY KEY (media_id, number)
) WITHOUT ROWID;

CREATE TABLE tag (
    media_id INTEGER NOT NULL REFERENCES media ON DELETE CASCADE,
    number INTEGER NOT NULL,
    key TEXT NOT NULL,
    value TEXT NOT NULL,
    PRIMARY KEY (media_id, number)
) WITHOUT ROWID;
CREATE INDEX tag_by_value ON tag (key, value);

CREATE TABLE thumbnail (
    media_id INTEGER PRIMARY KEY REFERENCES media ON DELETE CASCADE,
    image BLOB NOT NULL
);

-- A file that is about to get its final name in the library, and has no row yet.
CREATE TABLE copying (
    path TEXT PRIMARY KEY,
    inode INTEGER NOT NULL
) WITHOUT ROWID;

CREATE VIRTUAL TABLE media_search USING fts5 (
    title, artist, album, path,
    content = 'media', content_rowid = 'id',
    tokenize = 'unicode61 remove_diacritics 2', prefix = '2 3'
);
CREATE TRIGGER media_added AFTER INSERT ON media BEGIN
    INSERT INTO media_search (rowid, title, artist, album, path)
        VALUES (new.id, new.title, new.artist, new.album, new.path);
END;
CREATE TRIGGER media_removed AFTER DELETE ON media BEGIN
    INSERT INTO media_search (media_search, rowid, title, artist, album, path)
        VALUES ('delete', old.id, old.title, old.artist, old.album, old.path);
END;
CREATE TRIGGER media_changed AFTER UPDATE OF title, artist, album, path ON media BEGIN
    INSERT INTO media_search (media_search, rowid, title, artist, album, path)
        VALUES ('delete', old.id, old.title, old.artist, old.album, old.path);
    INSERT INTO media_search (rowid, title, artist, album, path)
        VALUES (new.id, new.title, new.artist, new.album, new.path);
END;
)sql",
    // Each statement that writes rows makes the index write out what it has gathered, so that an
    // index entry a row costs more than the row. New rows are indexed together, by whoever adds
    // them; changes only where there are some.
    R"sql(
DROP TRIGGER media_added;
DROP TRIGGER media_changed;
CREATE TRIGGER media_changed AFTER UPDATE OF title, artist, album, path ON media
    WHEN (new.title, new.artist, new.album, new.path)
        IS NOT (old.title, old.artist, old.album, old.path) BEGIN
    INSERT INTO media_search (media_search, rowid, title, artist, album, path)
        VALUES ('delete', old.id, old.title, old.artist, old.album, old.path);
    INSERT INTO media_search (rowid, title, artist, album, path)
        VALUES (new.id, new.title, new.artist, new.album, new.path);
END;
)sql"};

} // namespace library
