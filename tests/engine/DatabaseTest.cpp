// SPDX-License-Identifier: MIT
#include "library/Database.h"

#include <gtest/gtest.h>

#include "library/Schema.h"
#include "tests/engine/TestImporter.h"

using library::Database;
using library::MediaRecord;

namespace {

MediaRecord record(const std::string& path, const std::wstring& title) {
    MediaRecord made;
    made.path = made.source = path;
    made.info.system.tags = L"TITLE=" + title + L"\nARTIST=Somebody\n";
    return made;
}

class LibraryDatabase : public testing::Test {
protected:
    void put(Database& database, const MediaRecord& media) const {
        Database::Transaction transaction(database);
        database.put(media);
        transaction.commit();
    }
    [[nodiscard]] std::string ask(const std::string& query) const {
        return askDatabase(mFile, query);
    }
    [[nodiscard]] std::string found(const std::string& words) const {
        return ask("SELECT path FROM media_search('" + words + "') ORDER BY rowid");
    }
    /** Empty when the search index agrees with the table, else the complaint. */
    [[nodiscard]] std::string indexFaults() const {
        return ask("INSERT INTO media_search (media_search, rank) VALUES ('integrity-check', 1)");
    }

    TestFolder mFolder;
    const std::string mFile = mFolder / "media.db";
};

} // namespace

TEST_F(LibraryDatabase, FindsWhatIsAddedChangedAndRemoved) {
    Database database(mFile);
    put(database, record("/a", L"Morning Song"));
    put(database, record("/b", L"Evening Song"));
    EXPECT_EQ(found("song"), "/a\n/b");
    put(database, record("/a", L"Noon"));
    EXPECT_EQ(found("song"), "/b");
    EXPECT_EQ(found("noon"), "/a");
    put(database, record("/a", L"Noon"));
    EXPECT_EQ(found("noon"), "/a");
    EXPECT_EQ(indexFaults(), "");
    EXPECT_EQ(ask("DELETE FROM media WHERE path = '/a'"), "");
    EXPECT_EQ(found("noon"), "");
    EXPECT_EQ(indexFaults(), "");
}

TEST_F(LibraryDatabase, WhatIsRolledBackIsNotFound) {
    Database database(mFile);
    {
        Database::Transaction transaction(database);
        database.put(record("/a", L"Morning Song"));
    }
    put(database, record("/b", L"Evening Song"));
    EXPECT_EQ(found("song"), "/b");
    EXPECT_EQ(indexFaults(), "");
}

TEST_F(LibraryDatabase, AMediumTwiceInOneTransactionIsOne) {
    Database database(mFile);
    {
        Database::Transaction transaction(database);
        database.put(record("/a", L"Morning Song"));
        database.put(record("/a", L"Evening Song"));
        transaction.commit();
    }
    EXPECT_EQ(ask("SELECT title FROM media"), "Evening Song");
    EXPECT_EQ(found("evening"), "/a");
    EXPECT_EQ(found("morning"), "");
    EXPECT_EQ(indexFaults(), "");
}

TEST_F(LibraryDatabase, OfEveryOlderVersionIsBroughtUpToDateWithAllThatItHolds) {
    for (std::size_t version = 1; version < library::kMigrations.size(); ++version) {
        std::filesystem::remove(mFile);
        {
            SQLite::Database old(mFile, SQLite::OPEN_READWRITE | SQLite::OPEN_CREATE);
            for (std::size_t step = 0; step < version; ++step)
                old.exec(library::kMigrations[step]);
            old.exec("PRAGMA user_version = " + std::to_string(version));
            old.exec("INSERT INTO media VALUES"
                     " (7, '/old', '/old', 1, 2, 3, 'audio/x', 4, 1, 'Old Song', '', '', 2)");
            if (ask("SELECT count(*) FROM media_search('old')") == "0")
                old.exec("INSERT INTO media_search (rowid, title, path)"
                         " VALUES (7, 'Old Song', '/old')");
        }
        Database database(mFile);
        put(database, record("/new", L"New Song"));
        EXPECT_EQ(ask("PRAGMA user_version"), std::to_string(library::kMigrations.size()));
        EXPECT_EQ(found("song"), "/old\n/new");
        put(database, record("/old", L"Old Air"));
        EXPECT_EQ(found("song"), "/new");
        EXPECT_EQ(ask("SELECT id, title FROM media WHERE path = '/old'"), "7|Old Air");
        EXPECT_EQ(indexFaults(), "");
    }
}
